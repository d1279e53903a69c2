// SPDX-License-Identifier: MIT
// Diagnostics on standard error.

#ifndef WIFI_INFO_DEBUG_H
#define WIFI_INFO_DEBUG_H

#include <glib.h>

// The prefix of every diagnostic.
constexpr char DEBUG_PREFIX[] = "WIRELESS-LAN-DEBUG: ";

// Prints the prefix, the formatted text (4,000 bytes at most) and a newline in a single write.
void debug_line(const char *format, ...) G_GNUC_PRINTF(1, 2);

// From here on the lines are collected and written in blocks, because a scan has a thousand of
// them, until write_debug_lines() writes the rest.
void collect_debug_lines();
void write_debug_lines();

#endif
