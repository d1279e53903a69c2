#include "wifi_info/text.h"

#include <cstring>

#include <sys/stat.h>

static const char WHITE_SPACE[] = " \t\n\v\f\r";

// How many of the first `length` bytes are whole characters; `text` is longer than that.
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
    gsize length = text ? strnlen(text, size) : 0;

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

    if (stream && fstat(fileno(stream), &status) == 0 && S_ISDIR(status.st_mode)) {
        fclose(stream);
        stream = nullptr;
    }
    if (!stream)
        fprintf(stderr, "Could not access file: %s\n", file);
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

void append_line(GString *content, const char *keyword, const char *value)
{
    g_autofree gchar *line = g_strdup(value);

    g_strdelimit(line, "\r\n", ' ');
    g_string_append_printf(content, "%s %s\n", keyword, line);
}

void append_number_line(GString *content, const char *keyword, int value)
{
    g_string_append_printf(content, "%s %d\n", keyword, value);
}
