// SPDX-License-Identifier: MIT
// The dialog with the preferred networks, in the order in which they are tried.

#ifndef WIFI_PREFERRED_LIST_DIALOG_H
#define WIFI_PREFERRED_LIST_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the main window's "Preferred Network" button; runs the dialog, saves on OK and
// discards every edit otherwise.
void cb_preferred_network_setting(GtkWidget *widget, gpointer data);

// "clicked" of the Up and Down buttons: move the selected network one row.
void cb_user_list_up(GtkWidget *widget, gpointer data);
void cb_user_list_down(GtkWidget *widget, gpointer data);

#endif
