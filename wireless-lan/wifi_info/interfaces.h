// SPDX-License-Identifier: MIT
// The wireless interfaces that the kernel lists.

#ifndef WIFI_INFO_INTERFACES_H
#define WIFI_INFO_INTERFACES_H

#include <cstdio>

#include <glib.h>

// Reads "cat /proc/net/wireless" (format: net/wireless/wext-proc.c of the kernel) into
// interface_index, interface_count and wifi_interface of my_wifi. An existing record keeps
// everything but its name. interface_count is -1 when the header line is missing. Returns the
// result of closing the pipe, or FALSE, with nothing changed, when the command could not be
// started.
gboolean get_interface();

// The same from an open stream, which stays open. A read error ends it like the end of the file.
void read_interfaces(FILE *stream);

#endif
