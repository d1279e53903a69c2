// SPDX-License-Identifier: MIT
// The two halves of the main window.

#ifndef WIFI_WINDOW_MAIN_WINDOW_H
#define WIFI_WINDOW_MAIN_WINDOW_H

#include <gtk/gtk.h>

// The left half: the four buttons. The configuration is loaded while it is built.
GtkWidget *create_left_text();

// The right half: status label, network list, Connect button.
GtkWidget *create_list();

// Makes the window, when it is first shown, as wide as the five columns with a connected row in
// them need, where the screen has room. Both halves must be in it and shown.
void set_default_width(GtkWindow *window);

#endif
