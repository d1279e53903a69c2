// SPDX-License-Identifier: MIT
// The preferred networks as rows of two column lists, which the dialogs edit, and their way back
// into records and file. Row i of both lists and record i are the same network.

#ifndef WIFI_PREFERRED_STORE_H
#define WIFI_PREFERRED_STORE_H

#include <gtk/gtk.h>

constexpr char FRONT_KEY[] = "user_cell_list_front";
constexpr char BACKEND_KEY[] = "user_cell_list_backend";

// Columns of the backend list, which is never drawn: its texts are bytes, as in the records.
enum list_column {
    LIST_ALIAS,
    LIST_ESSID,
    LIST_MODE, // "Managed" or "Ad-Hoc"
    LIST_ENC,  // one of LIST_WORDS
    LIST_KEY,
    LIST_KEY_MGMT,  // "0": WEP, "1": WPA
    LIST_KEY_INDEX, // from "0"
    LIST_COLUMNS
};

// Reads the records from the file, and remembers whether that was all of it.
void load_user_cells();

// Builds both lists from the records, registers them and returns the front list (one column: the
// alias, or the name where it is empty, as valid UTF-8). Nothing is selected. The store owns both
// lists; the former pair is destroyed.
GtkWidget *build_user_cell_clist();

// The same without a line on standard output: edits that were not saved are gone.
void rebuild_user_cell_clist();

// TRUE while both lists are registered; what follows works on lists that are.
gboolean user_cell_lists_exist();

// Copies the backend rows into the records and writes the file; asks the user first when it could
// not be read whole, and tells when it could not be written. Does nothing while a list is missing.
void save_user_cell_clist();

// Appends one network to both lists and counts it; its row becomes user_cell_index. FALSE, with
// nothing added, when 64 networks are there or a list is missing.
gboolean append_user_cell_row(const gchar *const ftext[LIST_COLUMNS]);

// A row's text of a column list, "" when the cell has none. The list owns it.
const gchar *clist_text(GtkWidget *clist, gint row, gint column);

// The text of a backend column; the list owns it until the column is set.
const gchar *user_cell_text(gint row, list_column column);

// Sets a backend column.
void set_user_cell_text(gint row, list_column column, const gchar *text);

// Removes row `row` of both lists and counts it out; selects nothing.
void remove_user_cell_row(gint row);

// Swaps the selected row with its neighbour `row` in both lists; the selection and its highlight go
// with the network.
void move_user_cell_row(gint row);

// What the front list shows of a row.
const gchar *front_text(gint row);

// Shows a network's alias, or its name where that is empty, in front row `row`.
void set_front_text(gint row, const gchar *alias, const gchar *essid);

// Selects and highlights row `row` of the front list as a click does.
void select_user_cell_row(gint row);

// Shows the message for a list that is full over `parent`.
void show_store_full(GtkWidget *parent);

#endif
