// SPDX-License-Identifier: MIT
// A configuration file that could not be read whole, and is about to be written over.

#ifndef WIFI_BASE_UNREAD_FILE_H
#define WIFI_BASE_UNREAD_FILE_H

#include <gtk/gtk.h>

enum unread_answer {
    UNREAD_REPLACE, // the user agreed, and the old file is kept beside the new one
    UNREAD_LEAVE,   // the user did not
    UNREAD_NOT_KEPT // the user agreed, but the old file could not be kept: standard error says why
};

// Asks over `parent` whether `file` is to be replaced, and keeps it as `file`.old on Yes.
unread_answer ask_to_replace(GtkWidget *parent, const char *file);

#endif
