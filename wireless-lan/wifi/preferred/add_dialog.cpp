// SPDX-License-Identifier: MIT
#include "preferred/add_dialog.h"

#include <cstdio>

#include "base/dialogs.h"
#include "base/work_area.h"
#include "preferred/network_form.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"

// Appends what was entered as a row and selects it. FALSE: a message has said what is wrong.
static gboolean add_network(GtkWidget *dialog)
{
    if (!form_has_essid(add_form, dialog) || !form_has_key(add_form, dialog))
        return FALSE;

    g_autofree gchar *key_index_text = form_key_index(add_form);
    const gchar *const ftext[LIST_COLUMNS] = {
        form_text(add_form.alias),
        form_text(add_form.essid),
        form_mode(add_form),
        encryption_word(form_enc(add_form), LIST_WORDS),
        form_text(add_form.key),
        form_key_mgmt(add_form),
        key_index_text,
    };

    printf("ftext[LIST_KEY_INDEX] = %s\n", ftext[LIST_KEY_INDEX]);
    if (!append_user_cell_row(ftext)) {
        show_store_full(dialog);
        return FALSE;
    }
    select_user_cell_row(my_wifi->user_cell_index);
    debug_line("user_wifi_count=%d", my_wifi->user_cell_index);
    return TRUE;
}

void cb_configuration_add(GtkWidget *, gpointer data)
{
    if (!user_cell_lists_exist())
        return;

    GtkWidget *dialog =
        begin_dialog(create_network_dialog(add_form, static_cast<GtkWidget *>(data)));

    connect_network_form(add_form);
    show_dialog(dialog);
    while (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK && !add_network(dialog)) {
    }
    end_dialog(dialog);
}
