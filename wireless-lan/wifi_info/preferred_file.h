// SPDX-License-Identifier: MIT
// The file of the preferred networks, /etc/wireless-user.conf.

#ifndef WIFI_INFO_PREFERRED_FILE_H
#define WIFI_INFO_PREFERRED_FILE_H

#include <cstdio>

#include <glib.h>

constexpr char USER_FILE[] = "/etc/wireless-user.conf";

// Writes the user_cell_count preferred networks. FALSE when they could not be stored: the old file
// is unchanged, and the reason is on standard error.
gboolean save_preferred_network_to_file(const gchar *file);

// Rebuilds user_wifi_cell and user_cell_count from the file. The 65th and later networks are
// dropped, with one line on standard error. A file that cannot be opened changes nothing. FALSE
// when the file holds more than was read: it could not be opened or read to its end, or networks
// were dropped. A missing file counts as an empty one.
gboolean get_preferred_network_setting_from_file(const gchar *file);

// The same from an open stream, which stays open. A read error ends it like the end of the file.
gboolean read_preferred_networks(FILE *stream);

#endif
