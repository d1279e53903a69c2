// SPDX-License-Identifier: MIT
// The look of the network list's columns.

#ifndef WIFI_WINDOW_COLUMNS_H
#define WIFI_WINDOW_COLUMNS_H

#include <gtk/gtk.h>

// Lets the columns of `view`, which share `renderer`, be resized by the pointer, keeps a long name
// from pushing the state out of sight, and the rows readable on a dark theme. The view must be in
// its scrolled window.
void fit_columns(GtkWidget *view, GtkCellRenderer *renderer);

#endif
