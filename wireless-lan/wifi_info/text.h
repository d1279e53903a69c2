// SPDX-License-Identifier: MIT
// Text: fixed fields, lines of a file, what can be shown.

#ifndef WIFI_INFO_TEXT_H
#define WIFI_INFO_TEXT_H

#include <cstdio>

#include <glib.h>

// Copies `text` into a fixed field of `size` bytes, NUL-terminated. A text that is too long is cut,
// never inside a UTF-8 character. `text` may be NULL (an empty field) or lie inside the field.
void copy_field(char *field, gsize size, const char *text);

// A copy of `text` for GTK+ to draw: bytes that are not valid UTF-8 become U+FFFD. g_free it.
gchar *displayable(const char *text);

// Logs GLib's message for a failed precondition with a plain function name and the literal
// expression; g_return_if_fail would log the whole signature in C++.
void log_critical(const char *function, const char *expression);

// Opens a text file for reading, close-on-exec. NULL when it cannot be opened or is a directory:
// errno has the reason, and one line is on standard error.
FILE *open_text(const gchar *file);

// Copies the second word of `text` (words are separated by white space) into a field as copy_field
// does; empty when there is none.
void copy_second_word(char *field, gsize size, const char *text);

// The decimal number at the start of `text`, limited to the range of an int; 0 when there is none.
int decimal(const char *text);

// A copy of `text` with its line ends replaced by spaces, so that a value cannot forge another line
// of a file. g_free it.
gchar *one_line(const char *text);

// A copy of `text` for a terminal or a log: control characters (ASCII, and U+0080 to U+009F, which
// some terminals obey) become \xNN, everything else is unchanged. g_free it.
gchar *printable(const char *text);

// Overwrites a text and frees it; NULL is allowed. WIPED before the declaration of a gchar * does
// so at the end of its scope, like g_autofree.
void wipe_text(gchar **text);

#define WIPED __attribute__((cleanup(wipe_text)))

// Overwrites and frees the content of a file that holds keys.
void wipe_content(GString *content);

// Appends "KEYWORD VALUE\n"; the value becomes one line.
void append_line(GString *content, const char *keyword, const char *value);
void append_number_line(GString *content, const char *keyword, int value);

#endif
