// SPDX-License-Identifier: MIT
#include "preferred/store.h"

#include <cstdio>
#include <cstring>

#include <glib/gi18n.h>

#include "base/dialogs.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/unread_file.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"
#include "wifi_info/preferred_file.h"
#include "wifi_info/text.h"

// The store holds a reference to both lists, because the offer to keep a network appends to them
// while no dialog shows them.
static GtkWidget *front_list = nullptr;
static GtkWidget *backend_list = nullptr;
static gboolean file_is_unread = FALSE; // it could not be read whole and has not been replaced yet

static guint32 number_value(const char *text)
{
    return static_cast<guint32>(decimal(text));
}

static gchar *shown_name(const gchar *alias, const gchar *essid)
{
    return displayable(alias[0] != '\0' ? alias : essid);
}

// In a viewport a list that has its full width does not ask for more height by itself, and new rows
// would be out of reach.
static void front_changed_size()
{
    gtk_widget_queue_resize(front_list);
}

static void append_row(const gchar *const ftext[LIST_COLUMNS])
{
    g_autofree gchar *front = shown_name(ftext[LIST_ALIAS], ftext[LIST_ESSID]);

    gtk_clist_append(GTK_CLIST(front_list), &front);
    gtk_clist_append(GTK_CLIST(backend_list), const_cast<gchar **>(ftext));
    front_changed_size();
}

static void append_record(const WIFI_CELL *cell, gboolean say)
{
    g_autofree gchar *key_mgmt_text = g_strdup_printf("%d", static_cast<int>(cell->key_mgmt));
    g_autofree gchar *key_index_text = g_strdup_printf("%d", static_cast<int>(cell->key_index));
    const gchar *const ftext[LIST_COLUMNS] = {
        cell->alias,   cell->essid,   cell->mode,     encryption_word(cell->encmode, LIST_WORDS),
        cell->userkey, key_mgmt_text, key_index_text,
    };

    if (say)
        printf("build_user_cell_clist, ftext[LIST_KEY_INDEX] = %s\n", ftext[LIST_KEY_INDEX]);
    append_row(ftext);
}

const gchar *clist_text(GtkWidget *clist, gint row, gint column)
{
    gchar *text = nullptr;

    if (!gtk_clist_get_text(GTK_CLIST(clist), row, column, &text) || text == nullptr)
        return "";
    return text;
}

const gchar *user_cell_text(gint row, list_column column)
{
    return clist_text(backend_list, row, column);
}

void set_user_cell_text(gint row, list_column column, const gchar *text)
{
    gtk_clist_set_text(GTK_CLIST(backend_list), row, column, text);
}

static void row_into_record(gint row, WIFI_CELL *cell)
{
    copy_field(cell->alias, sizeof cell->alias, user_cell_text(row, LIST_ALIAS));
    copy_field(cell->essid, sizeof cell->essid, user_cell_text(row, LIST_ESSID));
    copy_field(cell->mode, sizeof cell->mode, user_cell_text(row, LIST_MODE));
    cell->key_mgmt = number_value(user_cell_text(row, LIST_KEY_MGMT));
    cell->key_index = number_value(user_cell_text(row, LIST_KEY_INDEX));
    cell->encmode = encryption_of(user_cell_text(row, LIST_ENC), LIST_WORDS, ENC_RESTRICTED);
    copy_field(cell->userkey, sizeof cell->userkey, user_cell_text(row, LIST_KEY));
}

gboolean user_cell_lists_exist()
{
    return find_widget(FRONT_KEY) != nullptr && find_widget(BACKEND_KEY) != nullptr;
}

// "select-row" of the front list: follows the selection.
static void clist_select_row(GtkWidget *, gint row, gint column, GdkEventButton *, gpointer)
{
    my_wifi->user_cell_index = row;
    debug_line("select row [%d],column [%d]", row, column);
}

static gboolean restore_highlight(gpointer)
{
    if (!user_cell_lists_exist() || my_wifi->user_cell_index < 0 ||
        GTK_CLIST(front_list)->selection != nullptr)
        return FALSE;

    const auto handler = reinterpret_cast<gpointer>(clist_select_row);

    g_signal_handlers_block_by_func(front_list, handler, nullptr);
    gtk_clist_select_row(GTK_CLIST(front_list), my_wifi->user_cell_index, 0);
    g_signal_handlers_unblock_by_func(front_list, handler, nullptr);
    return FALSE;
}

// Clicking the selected row removes its highlight, but the buttons still act on that row. The
// signal comes in the middle of the change, which may be one to another row, so an idle callback
// restores a missing highlight.
static void cb_unselect_row(GtkWidget *, gint, gint, GdkEventButton *, gpointer)
{
    g_idle_add_full(G_PRIORITY_HIGH_IDLE, restore_highlight, nullptr, nullptr);
}

static void drop_list(GtkWidget *&list)
{
    if (list == nullptr)
        return;
    if (global_build_list == list)
        global_build_list = nullptr;
    gtk_widget_destroy(list);
    g_object_unref(list);
    list = nullptr;
}

static GtkWidget *create_registered_list(gint columns, const char *key)
{
    GtkWidget *list = gtk_clist_new(columns);

    g_object_ref_sink(list);
    register_named_widget(list, key);
    return list;
}

static void create_lists(gboolean say)
{
    drop_list(front_list);
    drop_list(backend_list);
    my_wifi->user_cell_index = -1;
    front_list = create_registered_list(1, FRONT_KEY);
    g_signal_connect(front_list, "select-row", G_CALLBACK(clist_select_row), nullptr);
    g_signal_connect(front_list, "unselect-row", G_CALLBACK(cb_unselect_row), nullptr);
    backend_list = create_registered_list(LIST_COLUMNS, BACKEND_KEY);
    user_wifi_count = my_wifi->user_cell_count;
    for (gint i = 0; i < user_wifi_count; i++)
        append_record(my_wifi->user_wifi_cell[i], say);
}

void load_user_cells()
{
    file_is_unread = !get_preferred_network_setting_from_file(USER_FILE);
}

GtkWidget *build_user_cell_clist()
{
    create_lists(TRUE);
    return front_list;
}

void rebuild_user_cell_clist()
{
    create_lists(FALSE);
}

// Writes the file. A file that could not be read whole holds networks that are not in memory, so
// the user decides; after a No the next save asks again.
static void write_records(GtkWidget *window)
{
    const unread_answer answer =
        file_is_unread ? ask_to_replace(window, USER_FILE) : UNREAD_REPLACE;

    if (answer == UNREAD_LEAVE)
        return;
    if (answer == UNREAD_REPLACE) {
        file_is_unread = FALSE;
        if (save_preferred_network_to_file(USER_FILE))
            return;
    }
    show_message_box(window, _("The preferred networks could not be saved."));
}

void save_user_cell_clist()
{
    if (!user_cell_lists_exist())
        return;
    for (gint i = 0; i < user_wifi_count; i++) {
        if (my_wifi->user_wifi_cell[i] == nullptr)
            my_wifi->user_wifi_cell[i] = g_new0(WIFI_CELL, 1);
        row_into_record(i, my_wifi->user_wifi_cell[i]);
    }
    my_wifi->user_cell_count = user_wifi_count;

    GtkWidget *window = gtk_widget_get_toplevel(front_list);

    write_records(GTK_IS_WINDOW(window) ? window : mainwindow);
}

gboolean append_user_cell_row(const gchar *const ftext[LIST_COLUMNS])
{
    if (!user_cell_lists_exist() || user_wifi_count >= MAX_USER_CELLS)
        return FALSE;
    append_row(ftext);
    my_wifi->user_cell_index = user_wifi_count;
    user_wifi_count++;
    return TRUE;
}

void remove_user_cell_row(gint row)
{
    gtk_clist_remove(GTK_CLIST(front_list), row);
    gtk_clist_remove(GTK_CLIST(backend_list), row);
    user_wifi_count--;
    front_changed_size();
}

void move_user_cell_row(gint row)
{
    GtkCList *front = GTK_CLIST(front_list);

    gtk_clist_freeze(front);
    gtk_clist_swap_rows(front, my_wifi->user_cell_index, row);
    // GTK+ miscounts the focus row when it is below both swapped rows, and may move it past the
    // last one.
    front->focus_row = row;
    gtk_clist_thaw(front);
    gtk_clist_swap_rows(GTK_CLIST(backend_list), my_wifi->user_cell_index, row);
    my_wifi->user_cell_index = row;
}

const gchar *front_text(gint row)
{
    return clist_text(front_list, row, 0);
}

void set_front_text(gint row, const gchar *alias, const gchar *essid)
{
    g_autofree gchar *text = shown_name(alias, essid);

    gtk_clist_set_text(GTK_CLIST(front_list), row, 0, text);
    front_changed_size();
}

void select_user_cell_row(gint row)
{
    // Keyboard navigation continues from the selected row.
    GTK_CLIST(front_list)->focus_row = row;
    gtk_clist_select_row(GTK_CLIST(front_list), row, 0);
}

void show_store_full(GtkWidget *parent)
{
    g_autofree gchar *message =
        g_strdup_printf(_("The list is full: it holds %d networks."), MAX_USER_CELLS);

    show_warring_dialog(parent, message);
}
