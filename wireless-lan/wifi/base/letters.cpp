// SPDX-License-Identifier: MIT
#include "base/letters.h"

#include <cstring>
#include <initializer_list>

#include <gtk/gtk.h>

// A new label with the underscore before the first letter that is not in `taken`. In the scripts
// that have no letters for keys the letter follows the word, as in "(_D)": it comes from the name
// of the item then. NULL when all are taken.
static gchar *move_letter(const gchar *label, const gchar *stock_id, const GString *taken)
{
    const gchar *old = strchr(label, '_');
    const gboolean follows = old > label && old[-1] == '(';

    for (const gchar *at = follows ? stock_id + strlen("gtk-") : label; *at != '\0'; at++) {
        const gchar letter = g_ascii_tolower(*at);

        if (!g_ascii_isalpha(letter) || strchr(taken->str, letter) != nullptr)
            continue;
        if (follows)
            return g_strdup_printf("%.*s_%c%s", static_cast<int>(old - label), label,
                                   g_ascii_toupper(letter), old + 2);

        g_auto(GStrv) parts = g_strsplit(label, "_", 2);
        g_autofree gchar *plain = g_strconcat(parts[0], parts[1], nullptr);
        const gsize place = static_cast<gsize>(at - label) - (at > old ? 1 : 0);

        return g_strdup_printf("%.*s_%s", static_cast<int>(place), plain, plain + place);
    }
    return nullptr;
}

void set_letters_apart(std::initializer_list<const char *> stock_ids)
{
    GString *taken = g_string_new(nullptr);

    for (const char *id : stock_ids) {
        GtkStockItem item;
        const gchar *mark = gtk_stock_lookup(id, &item) ? strchr(item.label, '_') : nullptr;

        if (mark == nullptr)
            continue;

        gchar letter = g_ascii_tolower(mark[1]);

        if (strchr(taken->str, letter) != nullptr) {
            g_autofree gchar *moved = move_letter(item.label, id, taken);

            if (moved == nullptr)
                continue;
            letter = g_ascii_tolower(strchr(moved, '_')[1]);
            item.label = moved;
            item.translation_domain = nullptr;
            gtk_stock_add(&item, 1);
        }
        g_string_append_c(taken, letter);
    }
    g_string_free(taken, TRUE);
}
