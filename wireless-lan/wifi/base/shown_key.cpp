// SPDX-License-Identifier: MIT
#include "base/shown_key.h"

#include <glib/gi18n.h>

constexpr char STORED_KEY[] = "holds-stored-key";

static void set_stored(GtkEntry *entry, gboolean stored)
{
    g_object_set_data(G_OBJECT(entry), STORED_KEY, GINT_TO_POINTER(stored));
    gtk_entry_set_icon_sensitive(entry, GTK_ENTRY_ICON_SECONDARY, !stored);
}

static void cb_deleted(GtkEntryBuffer *buffer, guint, guint, gpointer entry)
{
    if (gtk_entry_buffer_get_length(buffer) == 0)
        set_stored(GTK_ENTRY(entry), FALSE);
}

static void turn_visibility(GtkEntry *entry)
{
    if (g_object_get_data(G_OBJECT(entry), STORED_KEY) == nullptr)
        gtk_entry_set_visibility(entry, !gtk_entry_get_visibility(entry));
}

// A double click is two presses and a third event for both.
static void cb_icon(GtkEntry *entry, GtkEntryIconPosition, GdkEvent *event, gpointer)
{
    if (event->type == GDK_BUTTON_PRESS)
        turn_visibility(entry);
}

static void cb_item(GtkMenuItem *, gpointer entry)
{
    turn_visibility(GTK_ENTRY(entry));
}

// The menu key and Shift+F10 open this menu.
static void cb_menu(GtkEntry *entry, GtkMenu *menu)
{
    GtkWidget *item = gtk_menu_item_new_with_label(_("Show key"));

    gtk_widget_set_sensitive(item, g_object_get_data(G_OBJECT(entry), STORED_KEY) == nullptr);
    g_signal_connect(item, "activate", G_CALLBACK(cb_item), entry);
    gtk_menu_shell_prepend(GTK_MENU_SHELL(menu), item);
    gtk_widget_show(item);
}

void let_key_be_shown(GtkWidget *widget)
{
    GtkEntry *entry = GTK_ENTRY(widget);
    GtkRequisition request;

    // The icon takes its place inside the entry, which stays as wide as without it.
    gtk_widget_size_request(widget, &request);
    gtk_widget_set_size_request(widget, request.width, -1);
    gtk_entry_set_icon_from_stock(entry, GTK_ENTRY_ICON_SECONDARY, GTK_STOCK_DIALOG_AUTHENTICATION);
    gtk_entry_set_icon_tooltip_text(entry, GTK_ENTRY_ICON_SECONDARY, _("Show key"));
    g_signal_connect(entry, "icon-press", G_CALLBACK(cb_icon), nullptr);
    g_signal_connect(entry, "populate-popup", G_CALLBACK(cb_menu), nullptr);
    g_signal_connect_after(gtk_entry_get_buffer(entry), "deleted-text", G_CALLBACK(cb_deleted),
                           entry);
}

void keep_key_hidden(GtkWidget *entry)
{
    set_stored(GTK_ENTRY(entry), gtk_entry_get_text_length(GTK_ENTRY(entry)) > 0);
}
