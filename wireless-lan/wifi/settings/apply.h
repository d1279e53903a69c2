// Taking the settings over: validate, store, write, apply.

#ifndef WIFI_SETTINGS_APPLY_H
#define WIFI_SETTINGS_APPLY_H

#include <gtk/gtk.h>

constexpr char SETTINGS_FILE[] = "/etc/wireless.conf";

// Takes over what the settings dialog shows. 0: a value was refused, with a message over `dialog`,
// and nothing was written; 1: done.
int Save_Basic_Setting(GtkWidget *dialog);

// TRUE for an IPv4 address in dotted-decimal form (inet_pton); otherwise the reason goes to
// standard error. NULL gives FALSE.
gboolean address_is_valid(const gchar *ip);

#endif
