// SPDX-License-Identifier: MIT
// The dialog that deletes a preferred network.

#ifndef WIFI_PREFERRED_DELETE_DIALOG_H
#define WIFI_PREFERRED_DELETE_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the Delete button; `data` is the list dialog.
void cb_configuration_delete(GtkWidget *widget, gpointer data);

#endif
