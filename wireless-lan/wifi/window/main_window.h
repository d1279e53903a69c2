// SPDX-License-Identifier: MIT
// The two halves of the main window.

#ifndef WIFI_WINDOW_MAIN_WINDOW_H
#define WIFI_WINDOW_MAIN_WINDOW_H

#include <gtk/gtk.h>

// The left half: the four buttons. Loads the configuration on the way.
GtkWidget *create_left_text();

// The right half: status label, network list, Connect button.
GtkWidget *create_list();

// Sets the default width so that the five columns fit with a connected row in them, as far as the
// screen allows. Both halves must be packed and shown.
void set_default_width(GtkWindow *window);

#endif
