// SPDX-License-Identifier: MIT
// The wireless interfaces that the kernel lists.

#ifndef WIFI_INFO_INTERFACES_H
#define WIFI_INFO_INTERFACES_H

#include <cstdio>

#include <glib.h>

// Reads "cat /proc/net/wireless" (grammar: the kernel's net/wireless/wext-proc.c) into
// interface_index, interface_count and wifi_interface of my_wifi. An existing record keeps all but
// its name. Returns what closing the pipe returns, or FALSE when the command could not be started
// (the table is untouched then). interface_count is -1 when the header line is missing.
gboolean get_interface();

// The same from an open stream, which stays open; a read error is its end.
void read_interfaces(FILE *stream);

#endif
