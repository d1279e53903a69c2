// SPDX-License-Identifier: MIT
// The dialog for the network that the device hosts.

#ifndef WIFI_SETTINGS_ADHOC_DIALOG_H
#define WIFI_SETTINGS_ADHOC_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the preferences button; `user_data` is the WIFI_CELL of the hosted network.
void cb_adhoc_setup(GtkWidget *widget, gpointer user_data);

// "toggled" of "Ad-Hoc Host"; `user_data` is the preferences button that it enables.
void cb_active_wifi_group(GtkToggleButton *togglebutton, gpointer user_data);

// "toggled" of the hidden radio "off"; `user_data` is the key entry.
void active_key_entry(GtkToggleButton *togglebutton, gpointer user_data);

#endif
