#include "base/widgets.h"

#include <cstring>
#include <initializer_list>

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
    GtkWidget *label = find_widget("title-label");

    if (label != nullptr)
        gtk_label_set_text(GTK_LABEL(label), text);
}

void set_connect_label(const gchar *stock)
{
    GtkWidget *button = find_widget("button-connect");

    if (button != nullptr)
        gtk_button_set_label(GTK_BUTTON(button), stock);
}

static void run_message(GtkWidget *parent, GtkDialogFlags flags, GtkButtonsType buttons,
                        const gchar *message)
{
    GtkWidget *dialog = begin_dialog(gtk_message_dialog_new(
        GTK_WINDOW(parent), flags, GTK_MESSAGE_INFO, buttons, "%s", message));

    gtk_dialog_run(GTK_DIALOG(dialog));
    end_dialog(dialog);
}

void show_message_box(GtkWidget *parent, const gchar *message)
{
    run_message(parent,
                static_cast<GtkDialogFlags>(GTK_DIALOG_MODAL | GTK_DIALOG_DESTROY_WITH_PARENT),
                GTK_BUTTONS_OK, message);
}

void show_warring_dialog(GtkWidget *parent, const gchar *message)
{
    run_message(parent, GTK_DIALOG_DESTROY_WITH_PARENT, GTK_BUTTONS_CLOSE, message);
}

GtkWidget *begin_dialog(GtkWidget *dialog)
{
    return static_cast<GtkWidget *>(g_object_ref(dialog));
}

void end_dialog(GtkWidget *dialog)
{
    gtk_widget_destroy(dialog);
    g_object_unref(dialog);
}

GtkWidget *create_normal_ComboBox()
{
    GtkWidget *combo = gtk_combo_box_new_text();

    for (const char *number : {"1", "2", "3", "4"})
        gtk_combo_box_append_text(GTK_COMBO_BOX(combo), number);
    gtk_combo_box_set_active(GTK_COMBO_BOX(combo), 0);
    return combo;
}

void set_active_number(GtkWidget *combo, const char *number)
{
    const gint64 item = g_ascii_strtoll(number, nullptr, 10);
    const int items =
        gtk_tree_model_iter_n_children(gtk_combo_box_get_model(GTK_COMBO_BOX(combo)), nullptr);

    gtk_combo_box_set_active(GTK_COMBO_BOX(combo),
                             item >= 0 && item < items ? static_cast<gint>(item) : 0);
}

GtkWidget *create_titled_frame(const gchar *title, guint border)
{
    GtkWidget *frame = gtk_frame_new(title);

    gtk_frame_set_label_align(GTK_FRAME(frame), 0.0F, 0.6F);
    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_container_set_border_width(GTK_CONTAINER(frame), border);
    return frame;
}

const gchar *clist_text(GtkWidget *clist, gint row, gint column)
{
    gchar *text = nullptr;

    if (!gtk_clist_get_text(GTK_CLIST(clist), row, column, &text) || text == nullptr)
        return "";
    return text;
}
