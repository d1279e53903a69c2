// SPDX-License-Identifier: MIT
// Diagnostics on standard error.

#ifndef WIFI_INFO_DEBUG_H
#define WIFI_INFO_DEBUG_H

#include <glib.h>

// What every diagnostic of the program begins with.
constexpr char DEBUG_PREFIX[] = "WIRELESS-LAN-DEBUG: ";

// Prints one line in a single write: the prefix, the formatted text (up to 4,000 bytes) and a line
// end.
void debug_line(const char *format, ...) G_GNUC_PRINTF(1, 2);

#endif
