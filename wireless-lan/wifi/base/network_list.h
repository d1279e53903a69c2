// SPDX-License-Identifier: MIT
// The rows of the main window's network list.

#ifndef WIFI_BASE_NETWORK_LIST_H
#define WIFI_BASE_NETWORK_LIST_H

#include <gtk/gtk.h>

// Appends one row; the five texts are shown as they are, made valid UTF-8.
void model_data_new(GtkListStore *store, const gchar *ESSID, const gchar *Mode, const gchar *Key,
                    const gchar *Quality, const gchar *State);

// The state of the connected network while the interface has `address`. g_free it.
gchar *connected_state(const char *address);

// Removes all rows.
void clear_network_list();

// Fills the list afresh from the scanned networks: `data` (up to 127 bytes) is the state of the
// network at connect_index, every other one is disconnected. The chosen network is highlighted
// again. While a refresh is under way the list stays empty: the records are about to be replaced.
void review_tree_vanpro(const gchar *data);

#endif
