// SPDX-License-Identifier: MIT
// Entries with a hidden key that the user may look at.

#ifndef WIFI_BASE_SHOWN_KEY_H
#define WIFI_BASE_SHOWN_KEY_H

#include <gtk/gtk.h>

// Gives an empty entry with hidden text an icon, and its menu an item, that show what was typed.
void let_key_be_shown(GtkWidget *entry);

// Keeps what was just filled into the entry from being shown: only once all of it is gone, what is
// typed then may be.
void keep_key_hidden(GtkWidget *entry);

#endif
