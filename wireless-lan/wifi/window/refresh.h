// SPDX-License-Identifier: MIT
// The refresh: scan, match the access point, fill the list.

#ifndef WIFI_WINDOW_REFRESH_H
#define WIFI_WINDOW_REFRESH_H

#include <gtk/gtk.h>

// "clicked" of the Refresh button; also called with two NULLs. Always FALSE.
gboolean cb_refresh_network(GtkWidget *cb_widget, gpointer data);

#endif
