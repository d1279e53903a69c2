// SPDX-License-Identifier: MIT
// The widgets of the main window and nothing else.

#ifndef BENCH_FLOOR_WINDOW_H
#define BENCH_FLOOR_WINDOW_H

#include <gtk/gtk.h>

struct floor_window {
    GtkWidget *window; // not shown yet; destroying it ends the main loop
    GtkListStore *rows;
};

// The command line may give the size of the window (WIDTH HEIGHT), so that the floor covers as many
// pixels as the program.
floor_window make_floor_window(int argc, char **argv);

#endif
