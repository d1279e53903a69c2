// SPDX-License-Identifier: MIT
#include "preferred/properties_dialog.h"

#include <cstdio>
#include <cstring>

#include "base/dialogs.h"
#include "base/registry.h"
#include "base/shown_key.h"
#include "base/state.h"
#include "base/work_area.h"
#include "preferred/network_form.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/encryption.h"
#include "wifi_info/text.h"

static const network_form &form = properties_form;

static t_encmode row_encryption(gint row)
{
    return encryption_of(user_cell_text(row, LIST_ENC), LIST_WORDS, ENC_RESTRICTED);
}

static void fill_form(gint row)
{
    const t_encmode encmode = row_encryption(row);

    set_form_text(form.alias, user_cell_text(row, LIST_ALIAS));
    set_form_text(form.essid, user_cell_text(row, LIST_ESSID));
    if (strcmp(user_cell_text(row, LIST_MODE), "Ad-Hoc") == 0)
        choose_form_radio(form.mode_adhoc);
    choose_form_radio(form.enc[encmode]);
    set_widget_sensitive(form.key_hbox, encmode != ENC_OFF);
    set_form_text(form.key, user_cell_text(row, LIST_KEY));
    keep_key_hidden(find_widget(form.key));
    printf("KEY_INDEX = %s \n", user_cell_text(row, LIST_KEY_INDEX));
    set_active_number(find_widget(form.key_index), user_cell_text(row, LIST_KEY_INDEX));
}

// Activating a radio button calls its handler, but one that is active already emits nothing: hence
// the direct calls.
static void choose_key_mgmt(gint row)
{
    if (strcmp(user_cell_text(row, LIST_KEY_MGMT), "1") == 0) {
        choose_form_radio(form.wpa);
        form.change_wpa(find_widget(form.wpa), nullptr);
        return;
    }
    choose_form_radio(form.wep);
    form.change_wep(find_widget(form.wep), nullptr);
    choose_form_radio(form.enc[row_encryption(row)]);
}

// Stores an entry in its column. An unchanged entry leaves the column alone, which may hold bytes
// that the entry cannot show.
static void store_entry(gint row, list_column column, const char *key)
{
    g_autofree gchar *shown = displayable(user_cell_text(row, column));
    const gchar *text = form_text(key);

    if (strcmp(text, shown) != 0)
        set_user_cell_text(row, column, text);
}

// Writes the form into the row, column by column. When an entry is refused the columns before it
// have been written already. FALSE: a message has said what is wrong.
static gboolean store_network(gint row, GtkWidget *dialog)
{
    store_entry(row, LIST_ALIAS, form.alias);
    if (!form_has_essid(form, dialog))
        return FALSE;
    store_entry(row, LIST_ESSID, form.essid);
    set_front_text(row, user_cell_text(row, LIST_ALIAS), user_cell_text(row, LIST_ESSID));

    g_autofree gchar *key_index_text = form_key_index(form);

    set_user_cell_text(row, LIST_KEY_MGMT, form_key_mgmt(form));
    set_user_cell_text(row, LIST_KEY_INDEX, key_index_text);
    set_user_cell_text(row, LIST_MODE, form_mode(form));
    set_user_cell_text(row, LIST_ENC, encryption_word(form_enc(form), LIST_WORDS));
    if (!form_has_key(form, dialog))
        return FALSE;
    store_entry(row, LIST_KEY, form.key);
    return TRUE;
}

void cb_configuration_properties(GtkWidget *, gpointer data)
{
    const gint row = my_wifi->user_cell_index;

    if (row < 0 || row >= user_wifi_count || !user_cell_lists_exist())
        return;

    GtkWidget *dialog = begin_dialog(create_network_dialog(form, static_cast<GtkWidget *>(data)));

    fill_form(row);
    connect_network_form(form);
    choose_key_mgmt(row);
    show_dialog(dialog);
    // Looked up again, because rows can go while the form is shown.
    while (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK && user_cell_lists_exist() &&
           row < user_wifi_count && !store_network(row, dialog)) {
    }
    end_dialog(dialog);
}
