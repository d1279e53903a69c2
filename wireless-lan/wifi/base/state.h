// SPDX-License-Identifier: MIT
// The variables that the modules of the window share. Only the GTK+ main thread uses them.

#ifndef WIFI_BASE_STATE_H
#define WIFI_BASE_STATE_H

#include <gtk/gtk.h>

#include "wifi.h"

extern GtkWidget *mainwindow; // set by main; NULL before and after its life
extern gint connect_index; // network the interface is with, -1: none; refresh, flow, chosen_network
extern gint pid_dhclient;  // part of the state model, nothing sets it
extern gboolean linkconnect;         // written by the link poller
extern gboolean addressvalid;        // part of the state model, nothing sets it
extern gboolean doubleclick;         // a double click may connect; written by flow and the pollers
extern gint user_wifi_count;         // rows of the preferred lists; written by the preferred rooms
extern GtkWidget *global_build_list; // the front list of start-up; written by start_up, store
extern gint boxspacing;              // padding of the settings' address rows, pixels

// Creates the state record: zeroed, nothing selected. FALSE when there is no memory.
gboolean my_wifi_init();

// The first interface record, NULL when there is none yet.
WIFI_INTERFACE *first_interface();

// The scanned network at `index`, NULL when there is none. Look it up again after anything that ran
// a main loop.
WIFI_CELL *scanned_cell(int index);

#endif
