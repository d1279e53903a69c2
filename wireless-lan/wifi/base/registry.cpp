// SPDX-License-Identifier: MIT
#include "base/registry.h"

#include <cstring>

#include "base/state.h"

static void cb_forget_widget(GtkWidget *widget, gpointer key)
{
    const GQuark quark = GPOINTER_TO_UINT(key);

    if (mainwindow != nullptr && g_object_get_qdata(G_OBJECT(mainwindow), quark) == widget)
        g_object_set_qdata(G_OBJECT(mainwindow), quark, nullptr);
}

void register_widget(GtkWidget *widget, const char *key)
{
    const GQuark quark = g_quark_from_string(key);

    g_object_set_qdata(G_OBJECT(mainwindow), quark, widget);
    g_signal_connect(widget, "destroy", G_CALLBACK(cb_forget_widget), GUINT_TO_POINTER(quark));
}

void register_named_widget(GtkWidget *widget, const char *key)
{
    register_widget(widget, key);
    gtk_widget_set_name(widget, key);
}

GtkWidget *find_widget(const char *key)
{
    if (mainwindow == nullptr)
        return nullptr;
    return static_cast<GtkWidget *>(g_object_get_data(G_OBJECT(mainwindow), key));
}

void set_widget_sensitive(const char *key, gboolean sensitive)
{
    GtkWidget *widget = find_widget(key);

    if (widget != nullptr)
        gtk_widget_set_sensitive(widget, sensitive);
}

void set_title_label(const gchar *text)
{
    GtkWidget *label = find_widget(TITLE_LABEL);

    // The same text is not announced a second time.
    if (label != nullptr && strcmp(gtk_label_get_text(GTK_LABEL(label)), text) != 0)
        gtk_label_set_text(GTK_LABEL(label), text);
}

void set_connect_label(const gchar *stock)
{
    GtkWidget *button = find_widget(CONNECT_BUTTON);

    if (button != nullptr)
        gtk_button_set_label(GTK_BUTTON(button), stock);
}
