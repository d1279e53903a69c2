// The dialog with the preferred networks in their order of trial.

#ifndef WIFI_PREFERRED_LIST_DIALOG_H
#define WIFI_PREFERRED_LIST_DIALOG_H

#include <gtk/gtk.h>

// "clicked" of the main window's "Preferred Network" button; runs the dialog, saves on OK.
void cb_preferred_network_setting(GtkWidget *widget, gpointer data);

#endif
