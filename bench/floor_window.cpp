// SPDX-License-Identifier: MIT
#include "floor_window.h"

#include <cstdlib>

static GtkWidget *scrolled_window()
{
    GtkWidget *scrolled = gtk_scrolled_window_new(nullptr, nullptr);

    gtk_scrolled_window_set_policy(GTK_SCROLLED_WINDOW(scrolled), GTK_POLICY_AUTOMATIC,
                                   GTK_POLICY_AUTOMATIC);
    return scrolled;
}

static GtkWidget *left_side()
{
    GtkWidget *scrolled = scrolled_window();
    GtkWidget *frame = gtk_frame_new("Settings");
    GtkWidget *table = gtk_table_new(10, 2, TRUE);
    GtkWidget *buttons[] = {
        gtk_button_new_from_stock(GTK_STOCK_REFRESH), gtk_button_new_with_label("WLAN Setting"),
        gtk_button_new_with_label("Preferred Network"), gtk_button_new_with_label("Active WIFI")};
    guint row = 1;

    gtk_widget_set_size_request(scrolled, 240, 300);
    gtk_frame_set_label_align(GTK_FRAME(frame), 0.0, 1.0);
    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_widget_set_size_request(frame, 220, 300);
    gtk_container_set_border_width(GTK_CONTAINER(frame), 10);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(scrolled), frame);
    gtk_container_set_border_width(GTK_CONTAINER(table), 10);
    gtk_container_add(GTK_CONTAINER(frame), table);
    for (GtkWidget *button : buttons) {
        gtk_table_attach_defaults(GTK_TABLE(table), button, 0, 2, row, row + 1);
        row += 2;
    }
    return scrolled;
}

static GtkWidget *network_list(GtkListStore **rows)
{
    const char *const titles[] = {"ESSID", "Mode", "KEY", "Signal strength", "State"};
    GtkCellRenderer *renderer = gtk_cell_renderer_text_new();
    GtkWidget *view = gtk_tree_view_new();
    gint position = 0;

    g_object_set(renderer, "foreground", "DarkOliveGreen", nullptr);
    for (const char *title : titles) {
        gtk_tree_view_insert_column_with_attributes(GTK_TREE_VIEW(view), -1, title, renderer,
                                                    "text", position, nullptr);
        position++;
    }
    *rows = gtk_list_store_new(5, G_TYPE_STRING, G_TYPE_STRING, G_TYPE_STRING, G_TYPE_STRING,
                               G_TYPE_STRING);
    gtk_tree_view_set_model(GTK_TREE_VIEW(view), GTK_TREE_MODEL(*rows));
    g_object_unref(*rows);
    return view;
}

static GtkWidget *right_side(GtkListStore **rows)
{
    GtkWidget *scrolled = scrolled_window();
    GtkWidget *list_scrolled = scrolled_window();
    GtkWidget *box = gtk_vbox_new(FALSE, 10);
    GtkWidget *label = gtk_label_new("Wireless network selection");
    GtkWidget *table = gtk_table_new(1, 6, TRUE);

    gtk_widget_set_size_request(scrolled, 400, 500);
    gtk_container_set_border_width(GTK_CONTAINER(box), 10);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(scrolled), box);
    gtk_misc_set_alignment(GTK_MISC(label), 0, 0);
    gtk_box_pack_start(GTK_BOX(box), label, FALSE, FALSE, 0);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(list_scrolled), network_list(rows));
    gtk_box_pack_start(GTK_BOX(box), list_scrolled, TRUE, TRUE, 0);
    gtk_table_attach_defaults(GTK_TABLE(table), gtk_button_new_from_stock(GTK_STOCK_CONNECT), 4, 6,
                              0, 1);
    gtk_box_pack_start(GTK_BOX(box), table, FALSE, FALSE, 0);
    return scrolled;
}

floor_window make_floor_window(int argc, char **argv)
{
    floor_window made = {gtk_window_new(GTK_WINDOW_TOPLEVEL), nullptr};
    GtkWidget *pane = gtk_hpaned_new();

    gtk_window_set_title(GTK_WINDOW(made.window), "Wireless LAN");
    gtk_container_set_border_width(GTK_CONTAINER(made.window), 10);
    if (argc > 2)
        gtk_window_set_default_size(GTK_WINDOW(made.window), atoi(argv[1]), atoi(argv[2]));
    gtk_paned_add1(GTK_PANED(pane), left_side());
    gtk_paned_add2(GTK_PANED(pane), right_side(&made.rows));
    gtk_container_add(GTK_CONTAINER(made.window), pane);
    g_signal_connect(made.window, "destroy", G_CALLBACK(gtk_main_quit), nullptr);
    return made;
}
