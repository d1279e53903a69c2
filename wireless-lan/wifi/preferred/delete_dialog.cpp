// SPDX-License-Identifier: MIT
#include "preferred/delete_dialog.h"

#include <glib/gi18n.h>

#include "base/accessible.h"
#include "base/dialogs.h"
#include "base/state.h"
#include "base/work_area.h"
#include "preferred/store.h"
#include "wifi.h"

static GtkWidget *create_delete_dialog(GtkWidget *parent, const gchar *name)
{
    GtkWidget *dialog = create_dialog(_("Delete Network"), parent, DEFAULT_CANCEL);
    GtkWidget *table = gtk_table_new(4, 2, FALSE);
    GtkWidget *image = gtk_image_new_from_stock(GTK_STOCK_DIALOG_WARNING, GTK_ICON_SIZE_DIALOG);
    GtkWidget *label = gtk_label_new(nullptr);
    g_autofree gchar *escaped = g_markup_escape_text(name, -1);
    // The catalogues contain the text with this spelling.
    g_autofree gchar *markup =
        g_strdup_printf("%s\n%s?", _("Do you want to detele the network"), escaped);

    gtk_window_set_default_size(GTK_WINDOW(dialog), 120, 120);
    gtk_dialog_set_has_separator(GTK_DIALOG(dialog), FALSE);
    gtk_window_set_keep_above(GTK_WINDOW(dialog), TRUE);

    gtk_label_set_markup(GTK_LABEL(label), markup);
    gtk_label_set_justify(GTK_LABEL(label), GTK_JUSTIFY_CENTER);
    gtk_label_set_line_wrap(GTK_LABEL(label), TRUE);
    // A long name without spaces must not push the buttons off the screen.
    gtk_label_set_line_wrap_mode(GTK_LABEL(label), PANGO_WRAP_WORD_CHAR);
    gtk_misc_set_alignment(GTK_MISC(label), 0.0F, 0.5F);

    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    hide_from_ears(image);
    gtk_table_attach(GTK_TABLE(table), image, 0, 1, 1, 2, GTK_FILL, GTK_FILL, 5, 5);
    gtk_table_attach_defaults(GTK_TABLE(table), label, 1, 2, 1, 2);
    pack_content(dialog, table);
    return dialog;
}

static void delete_network(gint row)
{
    remove_user_cell_row(row);
    if (user_wifi_count < 1) {
        my_wifi->user_cell_index = -1;
        return;
    }
    select_user_cell_row(MIN(row, user_wifi_count - 1));
}

void cb_configuration_delete(GtkWidget *, gpointer data)
{
    const gint row = my_wifi->user_cell_index;

    if (row < 0 || row >= user_wifi_count || !user_cell_lists_exist())
        return;

    GtkWidget *dialog =
        begin_dialog(create_delete_dialog(static_cast<GtkWidget *>(data), front_text(row)));

    show_dialog(dialog);
    // Looked up again, because rows can go while the question is shown.
    if (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK && user_cell_lists_exist() &&
        row < user_wifi_count)
        delete_network(row);
    end_dialog(dialog);
}
