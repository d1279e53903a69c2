// SPDX-License-Identifier: MIT
// Texts, fields and lines.

#ifndef WIFI_INFO_TEXT_H
#define WIFI_INFO_TEXT_H

#include <cstdio>

#include <glib.h>

// Copies `text` into a fixed field of `size` bytes: cut to the field, never inside a UTF-8
// character, always NUL-terminated. `text` may be NULL (an empty field) or lie inside the field.
void copy_field(char *field, gsize size, const char *text);

// `text` as valid UTF-8 for what GTK draws: the bytes that are none become U+FFFD. g_free it.
gchar *displayable(const char *text);

// Logs GLib's failed-precondition message with a plain function name and the literal expression;
// g_return_if_fail of C++ would log the whole signature.
void log_critical(const char *function, const char *expression);

// Opens a text file for reading, close-on-exec. NULL for one that cannot be opened, a directory
// among them; standard error says so, and errno has the cause.
FILE *open_text(const gchar *file);

// Copies the second of the words of `text` (separated by white space) into a field as copy_field
// does; an empty field when there is none.
void copy_second_word(char *field, gsize size, const char *text);

// The decimal number that `text` begins with, limited to what an int holds; 0 when there is none.
int decimal(const char *text);

// A copy of `text` with blanks in place of its line ends, so that no value can forge another line
// of a file. g_free it.
gchar *one_line(const char *text);

// A copy of `text` for a terminal or a log: its control characters (of ASCII, and U+0080 to U+009F,
// which some terminals obey too) are written as \xNN, all other bytes are as they were. g_free it.
gchar *printable(const char *text);

// Wipes a text and frees it; NULL is none. WIPED in front of the declaration of a gchar * does so
// where the variable ends, as g_autofree frees.
void wipe_text(gchar **text);

#define WIPED __attribute__((cleanup(wipe_text)))

// Wipes and frees the content of a file that holds keys.
void wipe_content(GString *content);

// Appends "KEYWORD VALUE\n", the value in one line.
void append_line(GString *content, const char *keyword, const char *value);
void append_number_line(GString *content, const char *keyword, int value);

#endif
