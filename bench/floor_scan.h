// SPDX-License-Identifier: MIT
// The least work of a refresh: read the two pipes, fill in the rows.

#ifndef BENCH_FLOOR_SCAN_H
#define BENCH_FLOOR_SCAN_H

#include <gtk/gtk.h>

constexpr int FLOOR_ROWS = 128;

struct floor_row {
    char texts[5][64]; // as shown, one a column
};

// Reads "cat /proc/net/wireless" and stores the name of the first interface in `name`. FALSE when
// there is none.
gboolean read_interface_name(char (&name)[16]);

// Reads "iwlist NAME scan" into `rows` and returns their number.
int read_scan(const char *name, floor_row (&rows)[FLOOR_ROWS]);

// Replaces the rows of the list.
void fill_rows(GtkListStore *store, const floor_row *rows, int count);

#endif
