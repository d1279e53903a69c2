// SPDX-License-Identifier: MIT
// The widgets of the main window and nothing else, written straight down.

#ifndef BENCH_FLOOR_WINDOW_H
#define BENCH_FLOOR_WINDOW_H

#include <gtk/gtk.h>

struct floor_window {
    GtkWidget *window; // not yet shown; destroying it leaves the main loop
    GtkListStore *rows;
};

// The window's size comes from the command line (WIDTH HEIGHT, optional), so that the floor covers
// as many pixels as the program.
floor_window make_floor_window(int argc, char **argv);

#endif
