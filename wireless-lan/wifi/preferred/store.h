// SPDX-License-Identifier: MIT
// The preferred networks as rows of two column lists, which the dialogs edit and which are written
// back to the records and the file. Row i of both lists and record i are the same network.

#ifndef WIFI_PREFERRED_STORE_H
#define WIFI_PREFERRED_STORE_H

#include <gtk/gtk.h>

constexpr char FRONT_KEY[] = "user_cell_list_front";
constexpr char BACKEND_KEY[] = "user_cell_list_backend";

// Columns of the backend list. It is never drawn, so its texts are bytes, as in the records.
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

// Reads the records from the file and remembers whether that was all of it.
void load_user_cells();

// Builds both lists from the records, registers them and returns the front list. Its only column
// shows the alias, or the name where the alias is empty, as valid UTF-8. No row is selected. The
// store owns both lists and destroys the previous ones.
GtkWidget *build_user_cell_clist();

// The same without output on standard output: discards edits that were not saved.
void rebuild_user_cell_clist();

// TRUE while both lists are registered. The functions below need both unless they say otherwise.
gboolean user_cell_lists_exist();

// Copies the backend rows to the records and writes the file. It asks first when the file could not
// be read whole, and shows a message when it could not be written. Without both lists it does
// nothing.
void save_user_cell_clist();

// Appends a network to both lists; its row becomes user_cell_index. FALSE, with nothing changed,
// when there are 64 networks already or a list is missing.
gboolean append_user_cell_row(const gchar *const ftext[LIST_COLUMNS]);

// A cell's text in a column list, "" when it has none. The list owns it.
const gchar *clist_text(GtkWidget *clist, gint row, gint column);

// The text of a backend column; the list owns it until the column is set.
const gchar *user_cell_text(gint row, list_column column);

// Sets a backend column.
void set_user_cell_text(gint row, list_column column, const gchar *text);

// Removes a row from both lists. Nothing is selected afterwards.
void remove_user_cell_row(gint row);

// Swaps the selected row with its neighbour `row` in both lists. The selection moves with the
// network.
void move_user_cell_row(gint row);

// The text of a row of the front list.
const gchar *front_text(gint row);

// Sets the text of a row of the front list to the alias, or to the name where the alias is empty.
void set_front_text(gint row, const gchar *alias, const gchar *essid);

// Selects a row of the front list as a click does.
void select_user_cell_row(gint row);

// Shows over `parent` the message that the list is full.
void show_store_full(GtkWidget *parent);

#endif
