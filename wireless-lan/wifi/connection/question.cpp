// SPDX-License-Identifier: MIT
#include "connection/question.h"

#include <glib/gi18n.h>

#include "base/dialogs.h"
#include "base/entries.h"
#include "base/work_area.h"

static void cb_text_changed(GtkEntry *entry, gpointer dialog)
{
    if (gtk_entry_get_text_length(entry) > 0)
        gtk_dialog_set_default_response(GTK_DIALOG(dialog), GTK_RESPONSE_YES);
    else
        gtk_window_set_default(GTK_WINDOW(dialog), nullptr);
}

gchar *ask_text(GtkWidget *parent, const gchar *message, const gchar *label, enter_answers enter)
{
    GtkWidget *dialog = begin_dialog(
        gtk_message_dialog_new(GTK_WINDOW(parent), GTK_DIALOG_DESTROY_WITH_PARENT,
                               GTK_MESSAGE_QUESTION, GTK_BUTTONS_YES_NO, "%s", message));
    GtkWidget *content = gtk_dialog_get_content_area(GTK_DIALOG(dialog));
    GtkWidget *box = gtk_hbox_new(FALSE, 5);
    GtkWidget *text = gtk_label_new(label);
    GtkWidget *entry = create_text_entry();
    gchar *answer = nullptr;

    gtk_label_set_mnemonic_widget(GTK_LABEL(text), entry);
    gtk_box_pack_start(GTK_BOX(box), text, FALSE, FALSE, 0);
    gtk_box_pack_start(GTK_BOX(box), entry, TRUE, TRUE, 0);
    gtk_container_set_border_width(GTK_CONTAINER(box), 5);
    gtk_box_pack_end(GTK_BOX(content), box, FALSE, FALSE, 0);
    gtk_window_set_title(GTK_WINDOW(dialog), _("Wireless LAN"));
    gtk_entry_set_activates_default(GTK_ENTRY(entry), TRUE);
    if (enter == ENTER_ANSWERS)
        gtk_dialog_set_default_response(GTK_DIALOG(dialog), GTK_RESPONSE_YES);
    else
        g_signal_connect(entry, "changed", G_CALLBACK(cb_text_changed), dialog);
    gtk_widget_grab_focus(entry);
    show_dialog(dialog);
    if (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_YES)
        answer = g_strdup(gtk_entry_get_text(GTK_ENTRY(entry)));
    end_dialog(dialog);
    return answer;
}
