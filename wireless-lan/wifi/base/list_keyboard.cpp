// SPDX-License-Identifier: MIT
#include "base/list_keyboard.h"

#include <initializer_list>

#include "base/registry.h"
#include "base/state.h"
#include "wifi.h"
#include "wifi_info/debug.h"

// The selection is changed by the program's own hand.
static gboolean own_change = FALSE;

// The control of the main window that had the focus last.
static GtkWidget *last_focus = nullptr;

static gboolean pointer_at_work()
{
    GdkEvent *event = gtk_get_current_event();
    const gboolean pressed =
        event != nullptr && (event->type == GDK_BUTTON_PRESS || event->type == GDK_2BUTTON_PRESS ||
                             event->type == GDK_3BUTTON_PRESS);

    if (event != nullptr)
        gdk_event_free(event);
    return pressed;
}

static gint row_count(GtkTreeView *view)
{
    return gtk_tree_model_iter_n_children(gtk_tree_view_get_model(view), nullptr);
}

static void set_cursor(GtkTreeView *view, gint row)
{
    GtkTreePath *path = gtk_tree_path_new_from_indices(row, -1);

    gtk_tree_view_set_cursor(view, path, nullptr, FALSE);
    gtk_tree_path_free(path);
}

// The row of the cursor, -1 when there is none.
static gint cursor_row(GtkTreeView *view)
{
    GtkTreePath *path = nullptr;

    gtk_tree_view_get_cursor(view, &path, nullptr);
    if (path == nullptr)
        return -1;

    const gint row = gtk_tree_path_get_indices(path)[0];

    gtk_tree_path_free(path);
    return row;
}

// Where a row is in the view, which is as high as all its rows, in a viewport.
static GdkRectangle row_area(GtkTreeView *view, gint row)
{
    GtkTreePath *path = gtk_tree_path_new_from_indices(row, -1);
    GdkRectangle area;

    gtk_tree_view_get_background_area(view, path, gtk_tree_view_get_column(view, 0), &area);
    gtk_tree_view_convert_bin_window_to_widget_coords(view, area.x, area.y, &area.x, &area.y);
    gtk_tree_path_free(path);
    return area;
}

static GtkAdjustment *scrolling(GtkTreeView *view)
{
    GtkWidget *viewport = gtk_widget_get_parent(GTK_WIDGET(view));

    return gtk_viewport_get_vadjustment(GTK_VIEWPORT(viewport));
}

static gboolean reveal_cursor(gpointer data)
{
    GtkTreeView *view = GTK_TREE_VIEW(data);
    const gint row = cursor_row(view);

    if (row < 0)
        return FALSE;

    const GdkRectangle area = row_area(view, row);

    // The first row brings the titles of the columns with it.
    gtk_adjustment_clamp_page(scrolling(view), row == 0 ? 0 : area.y, area.y + area.height);
    return FALSE;
}

void highlight_chosen_row()
{
    GtkWidget *view = find_widget(NETWORK_VIEW);

    if (view == nullptr)
        return;
    own_change = TRUE;
    gtk_tree_selection_unselect_all(gtk_tree_view_get_selection(GTK_TREE_VIEW(view)));
    if (my_wifi->cell_index >= 0 && my_wifi->cell_index < row_count(GTK_TREE_VIEW(view))) {
        set_cursor(GTK_TREE_VIEW(view), my_wifi->cell_index);
        // The new rows have their places once all is laid out.
        g_idle_add_full(G_PRIORITY_DEFAULT_IDLE, reveal_cursor, g_object_ref(view), g_object_unref);
    }
    own_change = FALSE;
}

// As a press on the row does. A press has set cell_index by the time the selection follows it.
static void cb_selection_changed(GtkTreeSelection *selection, gpointer)
{
    GtkTreeModel *model;
    GtkTreeIter row;

    if (own_change || !gtk_tree_selection_get_selected(selection, &model, &row))
        return;

    GtkTreePath *path = gtk_tree_model_get_path(model, &row);
    const gint index = gtk_tree_path_get_indices(path)[0];
    const WIFI_CELL *cell = scanned_cell(index);

    gtk_tree_path_free(path);
    if (index == my_wifi->cell_index)
        return;
    if (my_wifi->cell_count < 1 || my_wifi->interface_count < 1 || cell == nullptr) {
        highlight_chosen_row();
        return;
    }
    debug_line("Cell count %d index %d interface count %d", my_wifi->cell_count,
               my_wifi->cell_index, my_wifi->interface_count);
    my_wifi->cell_index = index;
    debug_line("connect_index=%d,my_wifi->cell_index=[%d]", connect_index, my_wifi->cell_index);
    set_connect_label(cell->linkstate == 1 ? GTK_STOCK_DISCONNECT : GTK_STOCK_CONNECT);
}

// A double press has a handler of its own.
static void cb_row_activated(GtkTreeView *view, GtkTreePath *path, GtkTreeViewColumn *, gpointer)
{
    GtkWidget *button = find_widget(CONNECT_BUTTON);
    const gint row = gtk_tree_path_get_indices(path)[0];

    if (pointer_at_work() || button == nullptr || !gtk_widget_is_sensitive(button))
        return;
    if (row != my_wifi->cell_index)
        set_cursor(view, row);
    if (row == my_wifi->cell_index)
        gtk_button_clicked(GTK_BUTTON(button));
}

static void cb_cursor_changed(GtkTreeView *view, gpointer)
{
    if (!own_change && !pointer_at_work())
        reveal_cursor(view);
}

// A page is what is in sight; the view itself takes its whole height for one. And without a cursor
// the view would not move at all at first.
static gboolean cb_move_cursor(GtkTreeView *view, GtkMovementStep step, gint count, gpointer)
{
    const gint rows = row_count(view);
    gint row = cursor_row(view);

    if (rows < 1 || (row >= 0 && step != GTK_MOVEMENT_PAGES))
        return FALSE;
    if (row < 0) {
        row = step == GTK_MOVEMENT_BUFFER_ENDS && count > 0 ? rows - 1 : 0;
    } else {
        const gint height = MAX(row_area(view, 0).height, 1);
        const gint page = static_cast<gint>(gtk_adjustment_get_page_size(scrolling(view))) / height;

        row += count * MAX(page - 1, 1);
    }
    set_cursor(view, CLAMP(row, 0, rows - 1));
    g_signal_stop_emission_by_name(view, "move-cursor");
    return TRUE;
}

void follow_list_keyboard(GtkWidget *view)
{
    g_signal_connect(gtk_tree_view_get_selection(GTK_TREE_VIEW(view)), "changed",
                     G_CALLBACK(cb_selection_changed), nullptr);
    g_signal_connect(view, "row-activated", G_CALLBACK(cb_row_activated), nullptr);
    g_signal_connect(view, "cursor-changed", G_CALLBACK(cb_cursor_changed), nullptr);
    g_signal_connect(view, "move-cursor", G_CALLBACK(cb_move_cursor), nullptr);
}

void focus_list(GtkWidget *view)
{
    if (gtk_widget_is_focus(view))
        return;
    own_change = TRUE;
    gtk_widget_grab_focus(view);
    own_change = FALSE;
    highlight_chosen_row();
}

static void cb_set_focus(GtkWindow *, GtkWidget *focus, gpointer)
{
    if (focus != nullptr)
        last_focus = focus;
}

static void cb_sensitive(GtkWidget *widget)
{
    if (widget != last_focus || !gtk_widget_is_sensitive(widget) ||
        gtk_window_get_focus(GTK_WINDOW(mainwindow)) != nullptr)
        return;
    if (GTK_IS_TREE_VIEW(widget))
        focus_list(widget);
    else
        gtk_widget_grab_focus(widget);
}

void keep_focus(GtkWidget *window)
{
    g_signal_connect(window, "set-focus", G_CALLBACK(cb_set_focus), nullptr);
    for (const char *key : {NETWORK_VIEW, REFRESH_BUTTON, SETTINGS_BUTTON, PREFERRED_BUTTON,
                            ACTIVATE_BUTTON, CONNECT_BUTTON})
        g_signal_connect(find_widget(key), "notify::sensitive", G_CALLBACK(cb_sensitive), nullptr);
}
