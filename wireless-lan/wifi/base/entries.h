// SPDX-License-Identifier: MIT
// Entries for the texts of a record.

#ifndef WIFI_BASE_ENTRIES_H
#define WIFI_BASE_ENTRIES_H

#include <gtk/gtk.h>

// The size of a name, an alias or a key in every record, with its terminator.
constexpr gsize TEXT_SIZE = 128;

// Limits an entry, typed or pasted, to what such a field holds: the rest is dropped with a beep,
// and no character is split. "insert-text" handlers connected earlier see the whole text.
void limit_text_entry(GtkWidget *entry);

// A new entry with this limit.
GtkWidget *create_text_entry();

// Shows all of `text`, made valid by displayable(), in such an entry, although the result may be
// longer than the field.
void fill_text_entry(GtkWidget *entry, const char *text);

#endif
