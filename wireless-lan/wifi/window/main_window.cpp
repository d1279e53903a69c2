// SPDX-License-Identifier: MIT
#include "window/main_window.h"

#include <gdk/gdkkeysyms.h>
#include <glib/gi18n.h>

#include "base/accessible.h"
#include "base/list_keyboard.h"
#include "base/network_list.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/work_area.h"
#include "connection/flow.h"
#include "preferred/list_dialog.h"
#include "settings/wlan_dialog.h"
#include "wifi.h"
#include "window/activation.h"
#include "window/columns.h"
#include "window/halves.h"
#include "window/refresh.h"
#include "window/row_text.h"
#include "window/start_up.h"

constexpr gint LEFT_WIDTH = 240;      // pixels, the least
constexpr gint LIST_SIDE_WIDTH = 400; // the same
// Borders and shadows around the list, and the scroll bar of a long one.
constexpr gint LIST_SIDE_MARGIN = 60;

static GtkWidget *create_scrolled_window()
{
    GtkWidget *scrolled = gtk_scrolled_window_new(nullptr, nullptr);

    gtk_scrolled_window_set_policy(GTK_SCROLLED_WINDOW(scrolled), GTK_POLICY_AUTOMATIC,
                                   GTK_POLICY_AUTOMATIC);
    return scrolled;
}

// F5 presses the button, where it can be pressed.
static void add_refresh_key(GtkWidget *button)
{
    GtkAccelGroup *keys = gtk_accel_group_new();

    gtk_window_add_accel_group(GTK_WINDOW(mainwindow), keys);
    gtk_widget_add_accelerator(button, "clicked", keys, GDK_F5, static_cast<GdkModifierType>(0),
                               static_cast<GtkAccelFlags>(0));
    g_object_unref(keys);
}

static void add_button(GtkWidget *table, guint left, guint right, guint top, GtkWidget *button,
                       const char *key, GCallback clicked)
{
    register_named_widget(button, key);
    g_signal_connect(button, "clicked", clicked, nullptr);
    gtk_table_attach_defaults(GTK_TABLE(table), button, left, right, top, top + 1);
}

GtkWidget *create_left_text()
{
    GtkWidget *scrolled = create_scrolled_window();
    GtkWidget *frame = gtk_frame_new(_("Settings"));
    GtkWidget *table = gtk_table_new(10, 2, TRUE);

    gtk_widget_set_size_request(scrolled, LEFT_WIDTH, 300);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(scrolled), frame);
    follow_focus(scrolled);
    gtk_frame_set_label_align(GTK_FRAME(frame), 0.0, 1.0);
    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_widget_set_size_request(frame, SETTINGS_WIDTH, SETTINGS_HEIGHT);
    gtk_container_set_border_width(GTK_CONTAINER(frame), 10);
    gtk_container_set_border_width(GTK_CONTAINER(table), 10);
    gtk_container_add(GTK_CONTAINER(frame), table);

    load_configuration();

    add_button(table, 0, 2, 1, gtk_button_new_from_stock(GTK_STOCK_REFRESH), REFRESH_BUTTON,
               G_CALLBACK(cb_refresh_network));
    add_button(table, 0, 2, 3, gtk_button_new_with_label(_("WLAN Setting")), SETTINGS_BUTTON,
               G_CALLBACK(cb_wifi_settings));
    add_button(table, 0, 2, 5, gtk_button_new_with_label(_("Preferred Network")), PREFERRED_BUTTON,
               G_CALLBACK(cb_preferred_network_setting));
    add_button(table, 0, 2, 7, gtk_button_new_with_label(_("Active WIFI")), ACTIVATE_BUTTON,
               G_CALLBACK(cb_active_device));
    add_refresh_key(find_widget(REFRESH_BUTTON));
    gtk_widget_show_all(scrolled);
    return scrolled;
}

// Adds the five columns to a list view.
static void arrange_tree_view(GtkWidget *view)
{
    const char *const titles[] = {_("ESSID"), _("Mode"), _("KEY"), _("Signal strength"),
                                  _("State")};
    GtkCellRenderer *renderer = row_text_new();

    g_object_set(renderer, "foreground", "DarkOliveGreen", nullptr);
    for (gint column = 0; column < static_cast<gint>(G_N_ELEMENTS(titles)); column++)
        gtk_tree_view_insert_column_with_attributes(GTK_TREE_VIEW(view), -1, titles[column],
                                                    renderer, "text", column, nullptr);
    fit_columns(view, renderer);
}

// A new empty model of five text columns. The caller owns it.
static GtkTreeModel *create_model()
{
    return GTK_TREE_MODEL(gtk_list_store_new(5, G_TYPE_STRING, G_TYPE_STRING, G_TYPE_STRING,
                                             G_TYPE_STRING, G_TYPE_STRING));
}

GtkWidget *create_list()
{
    GtkWidget *scrolled = create_scrolled_window();
    GtkWidget *box = gtk_vbox_new(FALSE, 10);
    GtkWidget *label = gtk_label_new(_("Wireless network selection"));
    GtkWidget *list_scrolled = create_scrolled_window();
    GtkWidget *view = gtk_tree_view_new();
    GtkTreeModel *model = create_model();
    GtkWidget *table = gtk_table_new(1, 6, TRUE);

    gtk_container_set_border_width(GTK_CONTAINER(box), 10);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(scrolled), box);
    follow_focus(scrolled);
    gtk_widget_set_size_request(scrolled, LIST_SIDE_WIDTH, 500);

    register_named_widget(label, TITLE_LABEL);
    announce_changes(label);
    gtk_misc_set_alignment(GTK_MISC(label), 0, 0);
    gtk_box_pack_start(GTK_BOX(box), label, FALSE, FALSE, 0);

    gtk_box_pack_start(GTK_BOX(box), list_scrolled, TRUE, TRUE, 0);
    register_named_widget(view, NETWORK_VIEW);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(list_scrolled), view);
    arrange_tree_view(view);
    g_signal_connect(view, "button-press-event", G_CALLBACK(cb_view_sel), nullptr);
    follow_list_keyboard(view);
    name_for_ears(view, _("Wireless network selection"));

    g_object_set_data(G_OBJECT(mainwindow), NETWORK_ROWS, model);
    gtk_tree_view_set_model(GTK_TREE_VIEW(view), model);
    g_object_unref(model);
    my_wifi->wifi_view = view;

    add_button(table, 4, 6, 0, gtk_button_new_from_stock(GTK_STOCK_CONNECT), CONNECT_BUTTON,
               G_CALLBACK(cb_connect));
    gtk_box_pack_start(GTK_BOX(box), table, FALSE, FALSE, 0);
    gtk_widget_show_all(scrolled);
    return scrolled;
}

void set_default_width(GtkWindow *window)
{
    // A tree view measures the first rows of a model once and takes their height for all rows; the
    // sample must not use up that measurement.
    GtkTreeView *view = GTK_TREE_VIEW(my_wifi->wifi_view);
    GtkTreeModel *model = gtk_tree_view_get_model(view);
    GtkTreeModel *sample = create_model();
    g_autofree gchar *state = connected_state("255.255.255.255");
    GtkRequisition list, whole;

    model_data_new(GTK_LIST_STORE(sample), "a network's usual name", "Managed", "off", "100/100",
                   state);
    g_object_ref(model);
    gtk_tree_view_set_model(view, sample);
    gtk_widget_size_request(my_wifi->wifi_view, &list);
    gtk_tree_view_set_model(view, model);
    gtk_tree_view_columns_autosize(view);
    g_object_unref(model);
    g_object_unref(sample);
    gtk_widget_size_request(GTK_WIDGET(window), &whole);
    gtk_window_set_default_size(window,
                                MIN(whole.width - LEFT_WIDTH +
                                        left_half_width(gtk_bin_get_child(GTK_BIN(window))) -
                                        LIST_SIDE_WIDTH + LIST_SIDE_MARGIN + list.width,
                                    gdk_screen_get_width(gtk_window_get_screen(window))),
                                -1);
}
