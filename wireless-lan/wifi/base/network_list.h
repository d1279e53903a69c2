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

// Refills the list from the scanned networks. The network at connect_index gets the state `data`
// (127 bytes at most), all others are disconnected. The chosen network is highlighted again. During
// a refresh the list stays empty, because its scan is about to replace the records.
void review_tree_vanpro(const gchar *data);

#endif
