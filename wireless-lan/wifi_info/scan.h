// SPDX-License-Identifier: MIT
// Scanning for networks.

#ifndef WIFI_INFO_SCAN_H
#define WIFI_INFO_SCAN_H

#include <cstdio>

#include <glib.h>

#include "wifi.h"

// Brings `iface` up, runs "iwlist %s scan" (wireless-tools) on it and replaces wifi_cell and
// cell_count of my_wifi by the networks printed, 128 at most. When the pipe cannot be opened the
// former records stay. Without a record, or for a name that is not usable, nothing is run and no
// network is left.
void get_cell(WIFI_INTERFACE *iface);

// The same from an open stream, which stays open; a read error is its end.
void read_cells(FILE *stream);

// The word behind the keyword `target` in the line `src`, or the first two words when `unit` is not
// 0; NULL when the keyword is missing or nothing stands behind it. The text behind the keyword is
// trimmed in place. g_free the result.
gchar *get_string_value(gchar *src, const gchar *target, int unit);

// The same, cut at eight blanks only, so that a network name with single blanks stays whole.
gchar *get_essid_value(gchar *src, const gchar *target, int unit);

#endif
