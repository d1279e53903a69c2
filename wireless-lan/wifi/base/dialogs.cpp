// SPDX-License-Identifier: MIT
#include "base/dialogs.h"

#include <initializer_list>

#include <glib/gi18n.h>

#include "base/work_area.h"
#include "wifi_info/text.h"

static void run_message(GtkWidget *parent, GtkDialogFlags flags, GtkButtonsType buttons,
                        const gchar *message, const gchar *explanation)
{
    GtkWidget *dialog = begin_dialog(gtk_message_dialog_new(
        GTK_WINDOW(parent), flags, GTK_MESSAGE_INFO, buttons, "%s", message));

    // For the task bar.
    gtk_window_set_title(GTK_WINDOW(dialog), _("Wireless LAN"));
    if (explanation != nullptr)
        gtk_message_dialog_format_secondary_text(GTK_MESSAGE_DIALOG(dialog), "%s", explanation);
    show_dialog(dialog);
    gtk_dialog_run(GTK_DIALOG(dialog));
    end_dialog(dialog);
}

void show_message_box(GtkWidget *parent, const gchar *message)
{
    run_message(parent,
                static_cast<GtkDialogFlags>(GTK_DIALOG_MODAL | GTK_DIALOG_DESTROY_WITH_PARENT),
                GTK_BUTTONS_OK, message, nullptr);
}

void show_warring_dialog(GtkWidget *parent, const gchar *message)
{
    show_explained_warning(parent, message, nullptr);
}

void show_explained_warning(GtkWidget *parent, const gchar *message, const gchar *explanation)
{
    run_message(parent, GTK_DIALOG_DESTROY_WITH_PARENT, GTK_BUTTONS_CLOSE, message, explanation);
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

gboolean is_active(GtkWidget *button)
{
    return gtk_toggle_button_get_active(GTK_TOGGLE_BUTTON(button));
}

void set_active(GtkWidget *button, gboolean active)
{
    gtk_toggle_button_set_active(GTK_TOGGLE_BUTTON(button), active);
}

void set_active_number(GtkWidget *combo, const char *number)
{
    const int item = decimal(number);
    const int items =
        gtk_tree_model_iter_n_children(gtk_combo_box_get_model(GTK_COMBO_BOX(combo)), nullptr);

    gtk_combo_box_set_active(GTK_COMBO_BOX(combo), item >= 0 && item < items ? item : 0);
}

GtkWidget *create_dialog(const gchar *title, GtkWidget *parent, dialog_default which)
{
    GtkWidget *dialog =
        gtk_dialog_new_with_buttons(title, GTK_WINDOW(parent), GTK_DIALOG_DESTROY_WITH_PARENT,
                                    GTK_STOCK_OK, GTK_RESPONSE_OK, nullptr);
    GtkWidget *cancel =
        gtk_dialog_add_button(GTK_DIALOG(dialog), GTK_STOCK_CANCEL, GTK_RESPONSE_REJECT);
    // The window itself takes the default when no button has it.
    GtkWidget *widget = which == DEFAULT_CANCEL ? cancel : dialog;

    gtk_window_set_type_hint(GTK_WINDOW(dialog), GDK_WINDOW_TYPE_HINT_DIALOG);
    gtk_widget_set_can_default(widget, TRUE);
    gtk_widget_grab_default(widget);
    return dialog;
}

void pack_content(GtkWidget *dialog, GtkWidget *content)
{
    GtkWidget *area = gtk_dialog_get_content_area(GTK_DIALOG(dialog));

    gtk_box_pack_start(GTK_BOX(area), content, TRUE, TRUE, 0);
}

GtkWidget *create_titled_frame(const gchar *title, guint border)
{
    GtkWidget *frame = gtk_frame_new(title);

    gtk_frame_set_label_align(GTK_FRAME(frame), 0.0F, 0.6F);
    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_container_set_border_width(GTK_CONTAINER(frame), border);
    return frame;
}
