// SPDX-License-Identifier: MIT
// The settings file, /etc/wireless.conf.

#ifndef WIFI_INFO_BASIC_SETTINGS_H
#define WIFI_INFO_BASIC_SETTINGS_H

#include <cstdio>

#include <glib.h>

constexpr char SETTINGS_FILE[] = "/etc/wireless.conf";

// Writes the settings of wifi_interface[0] and the static_ globals. FALSE when they could not be
// stored: the old file is unchanged, and the reason is on standard error.
gboolean save_basic_setting_to_file(const gchar *file);

// Reads them back. A file that cannot be opened changes nothing. A file without a stanza for the
// interface only empties the hosted network. The stream stays open until the next call of this
// reader or the next one. FALSE when the file could not be opened or not be read to its end; a
// missing file counts as an empty one.
gboolean get_basic_setting_from_file(const gchar *file);

// The same from an open stream, which stays open. A read error ends it like the end of the file.
void read_basic_settings(FILE *stream);

// The general readers, which this program does not call: they are for files in the distributions'
// own formats.

// Reads the addressing from a stanza that begins with "iface NAME inet METHOD", as
// get_basic_setting_from_file does.
gboolean get_basic_setting_from_file_Advanced(const gchar *file);
void read_basic_settings_advanced(FILE *stream);

// The value of the first line of `file` that contains `var` and is no comment: the text after its
// last '=', or after its last space where there is no '='. Empty when no line contains `var`; NULL
// when the file cannot be read or the line has no value. g_free it.
gchar *get_file_var(const gchar *file, const gchar *var);

// Copies the second word of `source` into `ret`: at most 127 bytes and the terminator, "" when
// there is none. `keyword` is ignored.
void get_paramval(gchar *source, gchar *keyword, gchar *ret);

#endif
