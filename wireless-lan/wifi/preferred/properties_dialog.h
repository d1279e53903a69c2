// SPDX-License-Identifier: MIT
// The dialog that edits a preferred network.

#ifndef WIFI_PREFERRED_PROPERTIES_DIALOG_H
#define WIFI_PREFERRED_PROPERTIES_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the Properties button; `data` is the list dialog.
void cb_configuration_properties(GtkWidget *widget, gpointer data);

#endif
