// SPDX-License-Identifier: MIT
// The dialog for the addressing of the interface and for hosting an Ad-Hoc network.

#ifndef WIFI_SETTINGS_WLAN_DIALOG_H
#define WIFI_SETTINGS_WLAN_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the main window's "WLAN Setting" button; runs the dialog, applies on OK.
void cb_wifi_settings(GtkWidget *widget, gpointer data);

#endif
