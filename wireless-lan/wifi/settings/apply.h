// SPDX-License-Identifier: MIT
// Taking the settings over: validate, store, write, apply.

#ifndef WIFI_SETTINGS_APPLY_H
#define WIFI_SETTINGS_APPLY_H

#include <gtk/gtk.h>

#include "wifi.h"

// One address of static addressing: its row in the dialog and the two places that keep its text.
struct address_setting {
    const char *prefix; // of the entry's key, and the entry's widget name
    gchar (*text)[32];
    char (WIFI_INTERFACE::*field)[32];
};

extern const address_setting address_settings[4]; // in the order of the rows

// The key of a widget of the settings dialog: `prefix` followed by the interface's name. g_free it.
gchar *settings_key(const char *prefix, const char *iface_name);

// The widget under that key, NULL when there is none: a dialog's widgets carry the name that the
// interface had when it opened.
GtkWidget *find_settings_widget(const char *prefix, const char *iface_name);

// Reads the settings from their file, and remembers whether that was all of it.
void load_settings();

// Takes over what the settings dialog shows. 0: a value was refused, with a message over `dialog`,
// and nothing was written; 1: done.
int Save_Basic_Setting(GtkWidget *dialog);

// TRUE for an IPv4 address in dotted-decimal form (inet_pton); otherwise the reason goes to
// standard error. NULL gives FALSE.
gboolean address_is_valid(const gchar *ip);

#endif
