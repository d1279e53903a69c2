// SPDX-License-Identifier: MIT
// Applying the settings: validate, store, write, run.

#ifndef WIFI_SETTINGS_APPLY_H
#define WIFI_SETTINGS_APPLY_H

#include <gtk/gtk.h>

#include "wifi.h"

// One address of static addressing, and the two places that keep its text.
struct address_setting {
    const char *prefix; // of the entry's key, and the entry's widget name
    gchar (*text)[32];
    char (WIFI_INTERFACE::*field)[32];
};

extern const address_setting address_settings[4]; // in the order of the rows

// The registry key of a widget of the settings dialog: `prefix` and the name of the interface.
// g_free it.
gchar *settings_key(const char *prefix, const char *iface_name);

// The widget under that key, NULL when there is none. The keys have the name that the interface had
// when the dialog opened.
GtkWidget *find_settings_widget(const char *prefix, const char *iface_name);

// Reads the settings from their file and remembers whether that was all of it.
void load_settings();

// Applies what the settings dialog shows. 1: done. 0: a value was refused with a message over
// `dialog`, and nothing was written.
int Save_Basic_Setting(GtkWidget *dialog);

// TRUE for an IPv4 address in dotted-decimal form (inet_pton). Otherwise FALSE, with the reason on
// standard error. NULL gives FALSE.
gboolean address_is_valid(const gchar *ip);

#endif
