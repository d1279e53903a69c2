// SPDX-License-Identifier: MIT
#include "preferred/list_dialog.h"

#include <gdk/gdkkeysyms.h>
#include <glib/gi18n.h>

#include "base/accessible.h"
#include "base/dialogs.h"
#include "base/letters.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/work_area.h"
#include "preferred/add_dialog.h"
#include "preferred/delete_dialog.h"
#include "preferred/properties_dialog.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/debug.h"

constexpr char ADD_BUTTON[] = "preferred_button_add";
constexpr char DELETE_BUTTON[] = "preferred_button_delete";
constexpr char PROPERTIES_BUTTON[] = "preferred_button_properties";

// Scrolls to a row. The list cannot do it itself, because it has its full height inside a viewport.
static void reveal_row(GtkWidget *front, gint row)
{
    GtkWidget *viewport = gtk_widget_get_parent(front);
    const gint height = GTK_CLIST(front)->row_height + 1; // with the line between two rows
    const gint borders = 2 * front->style->ythickness;    // above the first row and below the last

    if (row >= 0 && GTK_IS_VIEWPORT(viewport))
        gtk_adjustment_clamp_page(gtk_viewport_get_vadjustment(GTK_VIEWPORT(viewport)),
                                  row * height, (row + 1) * height + 1 + borders);
}

static void reveal_selected()
{
    GtkWidget *front = find_widget(FRONT_KEY);

    if (front != nullptr)
        reveal_row(front, my_wifi->user_cell_index);
}

static void cb_reveal_selected(GtkWidget *, gint, gint, GdkEventButton *, gpointer)
{
    reveal_selected();
}

// "changed" of the range that is scrolled over: a row that was just added can be reached once the
// list has grown. A window that is only resized leaves the view where it is.
static void cb_range_changed(GtkAdjustment *range, gpointer)
{
    static gdouble former = 0;
    const gdouble height = gtk_adjustment_get_upper(range);
    const gboolean grown = height > former && height > gtk_adjustment_get_page_size(range);

    former = height;
    if (grown)
        reveal_selected();
}

static void move_selected(gint step)
{
    const gint row = my_wifi->user_cell_index;

    if (!user_cell_lists_exist() || row < 0 || row >= user_wifi_count || row + step < 0 ||
        row + step >= user_wifi_count)
        return;
    move_user_cell_row(row + step);
    reveal_selected();
}

void cb_user_list_up(GtkWidget *, gpointer)
{
    move_selected(-1);
}

void cb_user_list_down(GtkWidget *, gpointer)
{
    move_selected(1);
}

// Selects the row of the keyboard's focus, which the list only frames.
static void cb_select_focus(GtkWidget *front, GtkScrollType, gfloat, gpointer)
{
    const gint row = GTK_CLIST(front)->focus_row;

    if (row != my_wifi->user_cell_index && row >= 0 && row < user_wifi_count)
        select_user_cell_row(row);
    reveal_row(front, row);
}

static void click_widget(const char *key)
{
    GtkWidget *button = find_widget(key);

    if (button != nullptr && gtk_widget_is_sensitive(button))
        gtk_button_clicked(GTK_BUTTON(button));
}

// What the keys do in the list beside its own moves.
static gboolean cb_list_key(GtkWidget *front, GdkEventKey *event, gpointer)
{
    const guint modifiers = event->state & gtk_accelerator_get_default_mod_mask();

    if (modifiers == GDK_MOD1_MASK && (event->keyval == GDK_Up || event->keyval == GDK_KP_Up)) {
        move_selected(-1);
        return TRUE;
    }
    if (modifiers == GDK_MOD1_MASK && (event->keyval == GDK_Down || event->keyval == GDK_KP_Down)) {
        move_selected(1);
        return TRUE;
    }
    if (modifiers != 0)
        return FALSE;

    switch (event->keyval) {
    case GDK_Home:
    case GDK_KP_Home:
        if (user_wifi_count > 0)
            select_user_cell_row(0);
        return TRUE;
    case GDK_End:
    case GDK_KP_End:
        if (user_wifi_count > 0)
            select_user_cell_row(user_wifi_count - 1);
        return TRUE;
    case GDK_Return:
    case GDK_KP_Enter:
        click_widget(PROPERTIES_BUTTON);
        return TRUE;
    case GDK_Delete:
    case GDK_KP_Delete:
        click_widget(DELETE_BUTTON);
        return TRUE;
    case GDK_Escape:
        // The list would keep it for itself.
        g_signal_emit_by_name(gtk_widget_get_toplevel(front), "close");
        return TRUE;
    default:
        return FALSE;
    }
}

static GtkWidget *create_front_window()
{
    GtkWidget *window = gtk_scrolled_window_new(nullptr, nullptr);
    GtkWidget *front = build_user_cell_clist();

    // Here and not where the list is made: the program would wait for the fonts as it starts.
    gtk_clist_set_column_auto_resize(GTK_CLIST(front), 0, TRUE);
    g_signal_connect_after(front, "select-row", G_CALLBACK(cb_reveal_selected), nullptr);
    g_signal_connect_after(front, "scroll-vertical", G_CALLBACK(cb_select_focus), nullptr);
    g_signal_connect(front, "key-press-event", G_CALLBACK(cb_list_key), nullptr);
    name_for_ears(front, _("Preferred Network"));
    // An empty list leaves the focus to what it is in.
    name_for_ears(window, _("Preferred Network"));
    gtk_container_set_border_width(GTK_CONTAINER(window), 5);
    gtk_scrolled_window_set_policy(GTK_SCROLLED_WINDOW(window), GTK_POLICY_AUTOMATIC,
                                   GTK_POLICY_AUTOMATIC);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(window), front);
    g_signal_connect(gtk_scrolled_window_get_vadjustment(GTK_SCROLLED_WINDOW(window)), "changed",
                     G_CALLBACK(cb_range_changed), nullptr);
    return window;
}

static GtkWidget *create_move_buttons()
{
    GtkWidget *box = gtk_vbutton_box_new();
    GtkWidget *up = gtk_button_new_from_stock(GTK_STOCK_GO_UP);
    GtkWidget *down = gtk_button_new_from_stock(GTK_STOCK_GO_DOWN);

    gtk_button_box_set_layout(GTK_BUTTON_BOX(box), GTK_BUTTONBOX_START);
    gtk_box_set_spacing(GTK_BOX(box), 5);
    g_signal_connect(up, "clicked", G_CALLBACK(cb_user_list_up), nullptr);
    g_signal_connect(down, "clicked", G_CALLBACK(cb_user_list_down), nullptr);
    gtk_container_add(GTK_CONTAINER(box), up);
    gtk_container_add(GTK_CONTAINER(box), down);
    return box;
}

static GtkWidget *create_list_frame()
{
    GtkWidget *frame = gtk_frame_new(nullptr);
    GtkWidget *table = gtk_table_new(2, 2, FALSE);

    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_container_set_border_width(GTK_CONTAINER(frame), 5);
    gtk_table_attach_defaults(GTK_TABLE(table), create_front_window(), 0, 1, 0, 2);
    gtk_table_attach(GTK_TABLE(table), create_move_buttons(), 1, 2, 0, 2, GTK_FILL, GTK_FILL, 5, 5);
    gtk_container_add(GTK_CONTAINER(frame), table);
    return frame;
}

static GtkWidget *create_edit_buttons(GtkWidget *dialog)
{
    static const struct {
        const char *stock;
        const char *key;
        GCallback handler;
    } buttons[] = {
        {GTK_STOCK_ADD, ADD_BUTTON, G_CALLBACK(cb_configuration_add)},
        {GTK_STOCK_DELETE, DELETE_BUTTON, G_CALLBACK(cb_configuration_delete)},
        {GTK_STOCK_PROPERTIES, PROPERTIES_BUTTON, G_CALLBACK(cb_configuration_properties)},
    };
    GtkWidget *box = gtk_hbox_new(TRUE, 5);

    for (const auto &entry : buttons) {
        GtkWidget *button = gtk_button_new_from_stock(entry.stock);

        register_named_widget(button, entry.key);
        g_signal_connect(button, "clicked", entry.handler, dialog);
        gtk_box_pack_start(GTK_BOX(box), button, TRUE, TRUE, 0);
    }
    return box;
}

static GtkWidget *create_list_dialog()
{
    GtkWidget *dialog = create_dialog(_("Preferred Network Setting"), nullptr, DEFAULT_CANCEL);
    GtkWidget *frame = create_titled_frame(_("Preferred Network Setting"), 5);
    GtkWidget *table = gtk_table_new(4, 2, FALSE);
    GtkWidget *label = gtk_label_new(
        _("Automatic connect to one of the network \nfollowing the order in the list below"));

    gtk_window_set_default_size(GTK_WINDOW(dialog), 480, 320);

    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    gtk_container_add(GTK_CONTAINER(frame), table);
    pack_content(dialog, frame);

    gtk_misc_set_alignment(GTK_MISC(label), 0.0F, 0.5F);
    gtk_table_attach(GTK_TABLE(table), label, 0, 2, 0, 1, GTK_FILL, GTK_FILL, 5, 5);
    gtk_table_attach(GTK_TABLE(table), create_list_frame(), 0, 2, 1, 2, EXPAND_FILL, EXPAND_FILL, 0,
                     0);
    gtk_table_attach(GTK_TABLE(table), create_edit_buttons(dialog), 0, 2, 2, 3, EXPAND_FILL,
                     GTK_FILL, 5, 5);
    return dialog;
}

// The front list outlives the dialog: the add prompt appends to it.
static void take_front_list_out()
{
    GtkWidget *front = find_widget(FRONT_KEY);
    GtkWidget *viewport = front != nullptr ? gtk_widget_get_parent(front) : nullptr;

    if (viewport != nullptr)
        gtk_container_remove(GTK_CONTAINER(viewport), front);
}

void cb_preferred_network_setting(GtkWidget *, gpointer)
{
    set_letters_apart({GTK_STOCK_OK, GTK_STOCK_CANCEL, GTK_STOCK_GO_UP, GTK_STOCK_GO_DOWN,
                       GTK_STOCK_ADD, GTK_STOCK_DELETE, GTK_STOCK_PROPERTIES});

    GtkWidget *dialog = begin_dialog(create_list_dialog());

    show_dialog(dialog);
    if (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK) {
        debug_line("OK,we will connect network by this order.");
        save_user_cell_clist();
        take_front_list_out();
    } else {
        rebuild_user_cell_clist();
    }
    end_dialog(dialog);
}
