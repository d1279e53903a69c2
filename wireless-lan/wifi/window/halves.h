// SPDX-License-Identifier: MIT
// How the two halves of the main window share its space.

#ifndef WIFI_WINDOW_HALVES_H
#define WIFI_WINDOW_HALVES_H

#include <gtk/gtk.h>

// What the frame of the left half asks for at least, in pixels.
constexpr gint SETTINGS_WIDTH = 220;
constexpr gint SETTINGS_HEIGHT = 300;

// How wide the left half starts: as its request says, or as its texts need where that is more.
// Both halves must be in `pane`, shown and asked for their sizes.
gint left_half_width(GtkWidget *pane);

// Shares the space of a window that opens at its default size, and again whenever its size changes.
// On one that is too small for both halves the list's half, with the Connect button, gets its width
// first; where it is higher than wide the halves are stacked.
void share_room(GtkWidget *window, GtkWidget *pane);

#endif
