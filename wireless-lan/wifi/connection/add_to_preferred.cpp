// SPDX-License-Identifier: MIT
#include "connection/add_to_preferred.h"

#include <cstring>

#include <glib/gi18n.h>

#include "base/state.h"
#include "connection/commands.h"
#include "connection/question.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/encryption.h"

static void keep_network(const WIFI_CELL *cell, const gchar *alias)
{
    g_autofree gchar *management = g_strdup_printf("%d", static_cast<int>(cell->key_mgmt));
    g_autofree gchar *index = g_strdup_printf("%d", static_cast<int>(cell->key_index));
    const gchar *const ftext[LIST_COLUMNS] = {
        alias,
        cell->essid,
        client_mode(cell->mode),
        encryption_word(ENC_OPEN, LIST_WORDS),
        cell->userkey,
        management,
        index,
    };

    if (append_user_cell_row(ftext))
        save_user_cell_clist();
    else
        show_store_full(mainwindow);
}

void Add2Preferred(GtkWidget *parent)
{
    const WIFI_CELL *connecting = scanned_cell(connect_index);

    if (connecting == nullptr)
        return;

    // By value: a refresh may replace the records while the question is open.
    WIFI_CELL cell = *connecting;

    gtk_widget_hide_all(parent);

    // Enter pressed twice in the key entry must not store the key unseen.
    g_autofree gchar *alias =
        ask_text(parent, _("Do you want to add this configuration to the preferred network?"),
                 _("Alias:"), ENTER_ANSWERS_WITH_TEXT);

    if (alias != nullptr && user_cell_lists_exist())
        keep_network(&cell, alias);
    explicit_bzero(&cell, sizeof cell);
}
