// The preferred networks as rows of two column lists, which the dialogs edit, and their way back
// into records and file.

#ifndef WIFI_PREFERRED_STORE_H
#define WIFI_PREFERRED_STORE_H

#include <gtk/gtk.h>

constexpr char USER_FILE[] = "/etc/wireless-user.conf";
constexpr char FRONT_KEY[] = "user_cell_list_front";
constexpr char BACKEND_KEY[] = "user_cell_list_backend";

// Columns of the backend list.
enum list_column {
    LIST_ALIAS,
    LIST_ESSID,
    LIST_MODE,
    LIST_ENC,
    LIST_KEY,
    LIST_KEY_MGMT,
    LIST_KEY_INDEX,
    LIST_COLUMNS
};

// Builds both lists from the records, registers them and returns the front list (one column: the
// alias, or the name where it is empty). Nothing is selected.
GtkWidget *build_user_cell_clist();

// Copies the backend rows into the records and writes the file; tells the user when it could not be
// written. Does nothing while a list is missing.
void save_user_cell_clist();

// Rebuilds both lists from the records in place, so that edits that were not saved are gone.
void rebuild_user_cell_clist();

// Appends one network to both lists and counts it; its row becomes user_cell_index. FALSE, with
// nothing added, when 64 networks are there or a list is missing.
gboolean append_user_cell_row(const gchar *const ftext[LIST_COLUMNS]);

// Shows the message for a list that is full over `parent`.
void show_store_full(GtkWidget *parent);

// "select-row" of the front list: follows the selection.
void clist_select_row(GtkWidget *clist, gint row, gint column, GdkEventButton *event,
                      gpointer data);

#endif
