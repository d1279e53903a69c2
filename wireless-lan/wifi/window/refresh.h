// SPDX-License-Identifier: MIT
// Scanning, matching the access point, filling the list.

#ifndef WIFI_WINDOW_REFRESH_H
#define WIFI_WINDOW_REFRESH_H

#include <gtk/gtk.h>

// "clicked" of the Refresh button; also called with two NULLs. Always FALSE.
gboolean cb_refresh_network(GtkWidget *cb_widget, gpointer data);

#endif
