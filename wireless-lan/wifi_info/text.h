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

// Opens a text file for reading, close-on-exec. NULL for one that cannot be opened, a folder among
// them; standard error says so.
FILE *open_text(const gchar *file);

// Copies the second of the words of `text` (separated by white space) into a field as copy_field
// does; an empty field when there is none.
void copy_second_word(char *field, gsize size, const char *text);

// The decimal number that `text` begins with, limited to what an int holds; 0 when there is none.
int decimal(const char *text);

// Appends "KEYWORD VALUE\n". Line ends inside the value become blanks, so that no value can forge
// another line.
void append_line(GString *content, const char *keyword, const char *value);
void append_number_line(GString *content, const char *keyword, int value);

#endif
