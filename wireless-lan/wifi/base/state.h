// SPDX-License-Identifier: MIT
// The variables that the modules of the window share. Only the GTK+ main
// thread uses them. Each line ends with the files that write the variable.

#ifndef WIFI_BASE_STATE_H
#define WIFI_BASE_STATE_H

#include <gtk/gtk.h>

#include "wifi.h"

extern GtkWidget *mainwindow;        // NULL before it is created and after it is destroyed; main
extern gint connect_index;           // the network joined, -1: none; refresh, flow, chosen_network
extern gint pid_dhclient;            // part of the state model, nothing sets it
extern gboolean linkconnect;         // an access point was found; monitor
extern gboolean addressvalid;        // part of the state model, nothing sets it
extern gboolean doubleclick;         // a double click connects; flow, monitor
extern gint user_wifi_count;         // rows of the preferred lists; store
extern GtkWidget *global_build_list; // the front list built at start-up; start_up, store
extern gint boxspacing;              // around the address rows of the settings, in pixels; nobody

// Creates the state record: zeroed, nothing selected. FALSE when there is no memory.
gboolean my_wifi_init();

// The first interface record, NULL when there is none yet.
WIFI_INTERFACE *first_interface();

// The scanned network at `index`, NULL when there is none. Look it up again after anything that ran
// a main loop.
WIFI_CELL *scanned_cell(int index);

#endif
