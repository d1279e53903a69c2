// SPDX-License-Identifier: MIT
// Switching a built-in wireless module on.

#ifndef WIFI_WINDOW_ACTIVATION_H
#define WIFI_WINDOW_ACTIVATION_H

#include <gtk/gtk.h>

// "clicked" of "Active WIFI", also called once after the start: switches a built-in module on when
// there is no interface, otherwise refreshes the list.
void cb_active_device(GtkWidget *widget, gpointer data);

#endif
