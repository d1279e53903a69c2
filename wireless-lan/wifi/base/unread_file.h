// SPDX-License-Identifier: MIT
// Overwriting a configuration file that could not be read whole.

#ifndef WIFI_BASE_UNREAD_FILE_H
#define WIFI_BASE_UNREAD_FILE_H

#include <gtk/gtk.h>

enum unread_answer {
    UNREAD_REPLACE, // the user agreed; the old file is kept under another name
    UNREAD_LEAVE,   // the user refused
    UNREAD_NOT_KEPT // the user agreed, but the old file could not be kept; see standard error
};

// Asks over `parent` whether to replace `file`. On Yes the old file is kept as `file`.old.
unread_answer ask_to_replace(GtkWidget *parent, const char *file);

#endif
