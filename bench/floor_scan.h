// SPDX-License-Identifier: MIT
// The least that a refresh can do: read the two pipes, put the rows in.

#ifndef BENCH_FLOOR_SCAN_H
#define BENCH_FLOOR_SCAN_H

#include <gtk/gtk.h>

constexpr int FLOOR_ROWS = 128;

struct floor_row {
    char texts[5][64]; // as shown, column by column
};

// Reads "cat /proc/net/wireless"; the first interface's name goes to `name`. FALSE: none.
gboolean read_interface_name(char (&name)[16]);

// Reads "iwlist NAME scan" into `rows` and returns how many there are.
int read_scan(const char *name, floor_row (&rows)[FLOOR_ROWS]);

// Replaces what the list shows.
void fill_rows(GtkListStore *store, const floor_row *rows, int count);

#endif
