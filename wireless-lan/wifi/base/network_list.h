// SPDX-License-Identifier: MIT
// The rows of the main window's network list.

#ifndef WIFI_BASE_NETWORK_LIST_H
#define WIFI_BASE_NETWORK_LIST_H

#include <gtk/gtk.h>

// Appends one row. Each text is shown as it is, made valid UTF-8.
void model_data_new(GtkListStore *store, const gchar *ESSID, const gchar *Mode, const gchar *Key,
                    const gchar *Quality, const gchar *State);

// The text of the "State" column for the network that the interface is connected to with `address`.
// g_free it.
gchar *connected_state(const char *address);

// Removes all rows.
void clear_network_list();

// Fills the list afresh from the scanned networks: `data` (up to 127 bytes) is the state of the
// network at connect_index, every other one is disconnected. The chosen network is highlighted
// again. While a refresh is under way the list stays empty: the records are about to be replaced.
void review_tree_vanpro(const gchar *data);

#endif
