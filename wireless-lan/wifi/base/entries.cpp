// SPDX-License-Identifier: MIT
#include "base/entries.h"

#include <cstring>

#include "wifi.h"
#include "wifi_info/text.h"

static_assert(sizeof(WIFI_CELL::alias) == TEXT_SIZE && sizeof(WIFI_CELL::essid) == TEXT_SIZE &&
              sizeof(WIFI_CELL::userkey) == TEXT_SIZE);

// "insert-text": inserts only the part that fits.
static void cb_limit(GtkEditable *editable, const gchar *text, gint length, gint *position,
                     gpointer)
{
    const gsize held = strlen(gtk_entry_get_text(GTK_ENTRY(editable)));
    const gsize given = length < 0 ? strlen(text) : static_cast<gsize>(length);
    gsize room = held < TEXT_SIZE - 1 ? TEXT_SIZE - 1 - held : 0;

    if (given <= room)
        return;
    while (room > 0 && (text[room] & 0xC0) == 0x80)
        room--;
    if (room > 0)
        gtk_editable_insert_text(editable, text, static_cast<gint>(room), position);
    g_signal_stop_emission_by_name(editable, "insert-text");
    gtk_widget_error_bell(GTK_WIDGET(editable));
}

void limit_text_entry(GtkWidget *entry)
{
    g_signal_connect(entry, "insert-text", G_CALLBACK(cb_limit), nullptr);
}

GtkWidget *create_text_entry()
{
    GtkWidget *entry = gtk_entry_new();

    limit_text_entry(entry);
    return entry;
}

void fill_text_entry(GtkWidget *entry, const char *text)
{
    const auto limit = reinterpret_cast<gpointer>(cb_limit);
    WIPED gchar *shown = displayable(text);

    g_signal_handlers_block_by_func(entry, limit, nullptr);
    gtk_entry_set_text(GTK_ENTRY(entry), shown);
    g_signal_handlers_unblock_by_func(entry, limit, nullptr);
}
