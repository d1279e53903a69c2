// SPDX-License-Identifier: MIT
// The offer to keep a network with a new key among the preferred ones.

#ifndef WIFI_CONNECTION_ADD_TO_PREFERRED_H
#define WIFI_CONNECTION_ADD_TO_PREFERRED_H

#include <gtk/gtk.h>

// Asks whether the network at connect_index is to be kept, hiding `parent`; on Yes it becomes the
// last preferred network and the file is written.
void Add2Preferred(GtkWidget *parent);

#endif
