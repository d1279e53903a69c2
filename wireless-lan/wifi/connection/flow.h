// SPDX-License-Identifier: MIT
// Selecting a network, connecting to it, disconnecting from it.

#ifndef WIFI_CONNECTION_FLOW_H
#define WIFI_CONNECTION_FLOW_H

#include <gtk/gtk.h>

// "clicked" of the Connect button; a double click on a row calls it with two NULLs.
void cb_connect(GtkWidget *widget, gpointer data);

// "button-press-event" of the network list: follows the selection. Always FALSE, so that the list
// handles the press too.
gboolean cb_view_sel(GtkWidget *widget, GdkEventButton *event, void *date);

#endif
