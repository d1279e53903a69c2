// SPDX-License-Identifier: MIT
// Switching a built-in wireless module on.

#ifndef WIFI_WINDOW_ACTIVATION_H
#define WIFI_WINDOW_ACTIVATION_H

#include <gtk/gtk.h>

// "clicked" of "Active WIFI", and the first job after start: switches a built-in module on where no
// interface is found, otherwise refreshes the list at once.
void cb_active_device(GtkWidget *widget, gpointer data);

#endif
