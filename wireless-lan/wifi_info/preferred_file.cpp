// SPDX-License-Identifier: MIT
#include "wifi_info/preferred_file.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"
#include "wifi_info/replace_file.h"
#include "wifi_info/text.h"

constexpr int LINE_SIZE = 255;

gboolean save_preferred_network_to_file(const gchar *file)
{
    // Enough for every field at its longest, so that the buffer is never reallocated and no copy of
    // a key stays in the heap.
    const gsize records = static_cast<gsize>(my_wifi->user_cell_count);
    GString *text = g_string_sized_new(records * sizeof(WIFI_CELL) + 1);

    for (int i = 0; i < my_wifi->user_cell_count; i++) {
        const WIFI_CELL *cell = my_wifi->user_wifi_cell[i];

        append_number_line(text, "USERCELL", i);
        append_line(text, "ALIAS", cell->alias);
        append_line(text, "ESSID", cell->essid);
        append_line(text, "MODE", cell->mode);
        append_number_line(text, "KMGMT", static_cast<int>(cell->key_mgmt));
        append_number_line(text, "KINDEX", static_cast<int>(cell->key_index));
        // An unknown number is written as "off" here, and as "restricted" to /etc/wireless.conf.
        append_line(
            text, "Encryption",
            encryption_word(cell->encmode <= ENC_RESTRICTED ? cell->encmode : ENC_OFF, FILE_WORDS));
        append_line(text, "KEY", cell->encmode == ENC_OFF ? "off" : cell->userkey);
    }

    g_autoptr(GError) error = nullptr;
    const gboolean saved = replace_file(file, text->str, text->len, &error);

    wipe_content(text);
    if (!saved)
        debug_line("%s", error->message);
    return saved;
}

// Copies the text after the first space, with its inner spaces.
static void copy_rest(char *field, gsize size, char *line)
{
    gchar *space = strchr(line, ' ');

    copy_field(field, size, space != nullptr ? g_strstrip(space) : nullptr);
}

static t_encmode read_encryption(const char *line)
{
    char word[128];

    copy_second_word(word, sizeof word, line);
    return encryption_of(word, FILE_WORDS, ENC_OFF);
}

static guint32 read_number(const char *line)
{
    char word[128];

    copy_second_word(word, sizeof word, line);
    return static_cast<guint32>(decimal(word));
}

// Reads the next line into `line`, which is empty at the end of the file.
static char *next_line(FILE *stream, char *line)
{
    if (fgets(line, LINE_SIZE, stream) == nullptr)
        line[0] = '\0';
    return line;
}

// Reads the seven lines after a header by position, whatever their keywords. Fields that are
// missing at the end of a cut file stay zero.
static void read_record(FILE *stream, WIFI_CELL *cell)
{
    char line[LINE_SIZE];

    copy_rest(cell->alias, sizeof cell->alias, next_line(stream, line));
    copy_rest(cell->essid, sizeof cell->essid, next_line(stream, line));
    copy_second_word(cell->mode, sizeof cell->mode, next_line(stream, line));
    cell->key_mgmt = read_number(next_line(stream, line));
    cell->key_index = read_number(next_line(stream, line));
    cell->encmode = read_encryption(next_line(stream, line));
    copy_second_word(cell->userkey, sizeof cell->userkey, next_line(stream, line));
}

gboolean read_preferred_networks(FILE *stream)
{
    char line[LINE_SIZE] = "";
    gboolean left_out = FALSE;
    int count = 0;

    while (fgets(line, sizeof line, stream) != nullptr) {
        if (!g_str_has_prefix(line, "USERCELL"))
            continue;

        WIFI_CELL record = {};

        read_record(stream, &record);
        if (count == MAX_USER_CELLS) {
            left_out = TRUE;
            continue;
        }

        WIFI_CELL *&cell = my_wifi->user_wifi_cell[count++];

        if (cell == nullptr)
            cell = g_new(WIFI_CELL, 1);
        *cell = record;
    }
    my_wifi->user_cell_count = count;
    if (left_out)
        debug_line("only the first %d preferred networks are kept", MAX_USER_CELLS);
    return !left_out && !ferror(stream);
}

gboolean get_preferred_network_setting_from_file(const gchar *file)
{
    FILE *stream = open_text(file);

    if (stream == nullptr)
        return errno == ENOENT;

    gboolean whole = read_preferred_networks(stream);

    fclose(stream);
    return whole;
}
