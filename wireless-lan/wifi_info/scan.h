// SPDX-License-Identifier: MIT
// Scanning for networks.

#ifndef WIFI_INFO_SCAN_H
#define WIFI_INFO_SCAN_H

#include <cstdio>

#include <glib.h>

#include "wifi.h"

// Brings `iface` up, runs "iwlist %s scan" (wireless-tools) on it and replaces wifi_cell and
// cell_count of my_wifi by the networks that it prints, 128 at most. The old records stay when the
// command cannot be started. When `iface` is NULL or its name is not usable, nothing is run and the
// list is emptied.
void get_cell(WIFI_INTERFACE *iface);

// The same from an open stream, which stays open. A read error ends it like the end of the file.
void read_cells(FILE *stream);

// The word after the keyword `target` in the line `src`, or the first two words when `unit` is not
// 0. NULL when the keyword is missing or nothing follows it. Trims the text after the keyword in
// place. g_free the result.
gchar *get_string_value(gchar *src, const gchar *target, int unit);

// The same, but only eight spaces in a row end the value: a network name may contain single spaces.
gchar *get_essid_value(gchar *src, const gchar *target, int unit);

#endif
