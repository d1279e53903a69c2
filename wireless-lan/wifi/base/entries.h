// SPDX-License-Identifier: MIT
// Entries for the texts of a record.

#ifndef WIFI_BASE_ENTRIES_H
#define WIFI_BASE_ENTRIES_H

#include <gtk/gtk.h>

// The bytes that a name, an alias or a key has in every record, with its terminator.
constexpr gsize TEXT_SIZE = 128;

// Lets an entry take no more bytes than such a field holds, typed or pasted, and never a part of a
// character: what does not fit is left out with a beep. Handlers of "insert-text" that were
// connected before see the whole text.
void limit_text_entry(GtkWidget *entry);

// A new entry with that limit.
GtkWidget *create_text_entry();

// Shows `text` in such an entry as `displayable` makes it, whole, though that may be longer than
// the field.
void fill_text_entry(GtkWidget *entry, const char *text);

#endif
