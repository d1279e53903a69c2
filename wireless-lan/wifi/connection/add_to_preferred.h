// SPDX-License-Identifier: MIT
// Offering to keep a network with a new key as a preferred one.

#ifndef WIFI_CONNECTION_ADD_TO_PREFERRED_H
#define WIFI_CONNECTION_ADD_TO_PREFERRED_H

#include <gtk/gtk.h>

// Hides `parent` and asks whether to keep the network at connect_index. On Yes the network is
// appended to the preferred ones and the file is written.
void Add2Preferred(GtkWidget *parent);

#endif
