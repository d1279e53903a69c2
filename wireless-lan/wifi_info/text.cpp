// SPDX-License-Identifier: MIT
#include "wifi_info/text.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <initializer_list>

#include <sys/stat.h>

constexpr char WHITE_SPACE[] = " \t\n\v\f\r";

// How many of the first `length` bytes are whole UTF-8 characters; `text` is longer than `length`.
static gsize whole_characters(const char *text, gsize length)
{
    gsize start = length;

    while (start > 0 && length - start < 3 && (text[start] & 0xC0) == 0x80)
        start--;

    gsize end = start + static_cast<gsize>(g_utf8_skip[static_cast<guchar>(text[start])]);

    return end > length ? start : length;
}

void copy_field(char *field, gsize size, const char *text)
{
    gsize length = text != nullptr ? strnlen(text, size) : 0;

    if (length == size)
        length = whole_characters(text, size - 1);
    if (length > 0)
        memmove(field, text, length);
    field[length] = '\0';
}

gchar *displayable(const char *text)
{
    return g_utf8_make_valid(text, -1);
}

void log_critical(const char *function, const char *expression)
{
    g_return_if_fail_warning(G_LOG_DOMAIN, function, expression);
}

FILE *open_text(const gchar *file)
{
    FILE *stream = fopen(file, "re");
    struct stat status;
    int reason = errno;

    if (stream != nullptr && fstat(fileno(stream), &status) == 0 && S_ISDIR(status.st_mode)) {
        fclose(stream);
        stream = nullptr;
        reason = EISDIR;
    }
    if (stream == nullptr)
        fprintf(stderr, "Could not access file: %s\n", file);
    errno = reason;
    return stream;
}

void copy_second_word(char *field, gsize size, const char *text)
{
    text += strspn(text, WHITE_SPACE);
    text += strcspn(text, WHITE_SPACE);
    text += strspn(text, WHITE_SPACE);

    g_autofree gchar *word = g_strndup(text, strcspn(text, WHITE_SPACE));

    copy_field(field, size, word);
}

int decimal(const char *text)
{
    return static_cast<int>(CLAMP(g_ascii_strtoll(text, nullptr, 10), G_MININT, G_MAXINT));
}

gchar *one_line(const char *text)
{
    return g_strdelimit(g_strdup(text), "\r\n", ' ');
}

// The length of the control character that `text` begins with: 1 in ASCII, 2 for U+0080 to U+009F,
// 0 when there is none.
static int control_length(const guchar *text)
{
    if (text[0] < 0x20 || text[0] == 0x7F)
        return 1;
    return text[0] == 0xC2 && text[1] >= 0x80 && text[1] < 0xA0 ? 2 : 0;
}

gchar *printable(const char *text)
{
    const guchar *byte = reinterpret_cast<const guchar *>(text);
    GString *shown = g_string_sized_new(4 * strlen(text) + 1); // never moved, it may be a key

    while (*byte != '\0') {
        int length = control_length(byte);

        if (length == 0)
            g_string_append_c(shown, static_cast<gchar>(*byte++));
        for (; length > 0; length--)
            g_string_append_printf(shown, "\\x%02x", *byte++);
    }
    return g_string_free(shown, FALSE);
}

void wipe_text(gchar **text)
{
    if (*text != nullptr)
        explicit_bzero(*text, strlen(*text));
    g_clear_pointer(text, g_free);
}

void wipe_content(GString *content)
{
    explicit_bzero(content->str, content->allocated_len);
    g_string_free(content, TRUE);
}

void append_line(GString *content, const char *keyword, const char *value)
{
    WIPED gchar *line = one_line(value);

    // In pieces, because formatting the line would leave a copy of the key in the heap.
    for (const char *piece : {keyword, " ", static_cast<const char *>(line), "\n"})
        g_string_append(content, piece);
}

void append_number_line(GString *content, const char *keyword, int value)
{
    g_string_append_printf(content, "%s %d\n", keyword, value);
}
