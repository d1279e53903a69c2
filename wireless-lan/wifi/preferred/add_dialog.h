// SPDX-License-Identifier: MIT
// The dialog that adds a preferred network.

#ifndef WIFI_PREFERRED_ADD_DIALOG_H
#define WIFI_PREFERRED_ADD_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the Add button; `data` is the list dialog.
void cb_configuration_add(GtkWidget *widget, gpointer data);

#endif
