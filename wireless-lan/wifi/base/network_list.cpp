// SPDX-License-Identifier: MIT
#include "base/network_list.h"

#include <glib/gi18n.h>

#include "base/controls.h"
#include "base/list_keyboard.h"
#include "base/registry.h"
#include "base/state.h"
#include "wifi.h"
#include "wifi_info/text.h"

void model_data_new(GtkListStore *store, const gchar *ESSID, const gchar *Mode, const gchar *Key,
                    const gchar *Quality, const gchar *State)
{
    const gchar *texts[] = {ESSID, Mode, Key, Quality, State};
    gchar *repaired[G_N_ELEMENTS(texts)] = {};

    for (gsize i = 0; i < G_N_ELEMENTS(texts); i++)
        if (!g_utf8_validate(texts[i], -1, nullptr))
            texts[i] = repaired[i] = displayable(texts[i]);
    gtk_list_store_insert_with_values(store, nullptr, -1, 0, texts[0], 1, texts[1], 2, texts[2], 3,
                                      texts[3], 4, texts[4], -1);
    for (gchar *text : repaired)
        g_free(text);
}

static GtkListStore *cell_list()
{
    if (mainwindow == nullptr)
        return nullptr;
    return static_cast<GtkListStore *>(g_object_get_data(G_OBJECT(mainwindow), NETWORK_ROWS));
}

gchar *connected_state(const char *address)
{
    return g_strdup_printf("%s:%s", _("Connected\nIP Address"), address);
}

void clear_network_list()
{
    GtkListStore *store = cell_list();

    if (store != nullptr)
        gtk_list_store_clear(store);
}

void review_tree_vanpro(const gchar *data)
{
    GtkListStore *store = cell_list();

    if (store == nullptr || controls_held(HOLD_REFRESH))
        return;
    gtk_list_store_clear(store);

    const gchar *disconnected = _("Disconnect");

    for (int i = 0; i < my_wifi->cell_count; i++) {
        WIFI_CELL *cell = my_wifi->wifi_cell[i];
        const gboolean connected = i == connect_index;

        copy_field(cell->state, sizeof cell->state, connected ? data : disconnected);
        cell->linkstate = connected ? 1 : 2;
        model_data_new(store, cell->essid, cell->mode, cell->key, cell->quality, cell->state);
    }
    highlight_chosen_row();
}
