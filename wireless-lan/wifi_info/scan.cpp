// SPDX-License-Identifier: MIT
#include "wifi_info/scan.h"

#include <cstddef>
#include <cstdio>
#include <cstring>

#include <libintl.h>

#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "wifi_info/encryption.h"
#include "wifi_info/shell.h"
#include "wifi_info/text.h"

constexpr int LINE_SIZE = 512;

// The text after `target`, up to the first separator, or up to the second one when `unit` is set.
static gchar *first_pieces(gchar *src, const gchar *target, const char *separator, int unit)
{
    gchar *keyword = strstr(src, target);

    if (keyword == nullptr)
        return nullptr;

    gchar *first = g_strstrip(keyword + strlen(target));

    if (*first == '\0')
        return nullptr;

    const gchar *first_end = strstr(first, separator);

    if (first_end == nullptr)
        return g_strdup(first);

    gchar *piece = g_strndup(first, static_cast<gsize>(first_end - first));

    if (unit == 0)
        return piece;

    const gchar *second = first_end + strlen(separator);
    const gchar *second_end = strstr(second, separator);
    g_autofree gchar *head = piece;
    g_autofree gchar *tail = second_end != nullptr
                                 ? g_strndup(second, static_cast<gsize>(second_end - second))
                                 : g_strdup(second);

    return g_strconcat(head, " ", tail, nullptr);
}

gchar *get_string_value(gchar *src, const gchar *target, int unit)
{
    return first_pieces(src, target, " ", unit);
}

gchar *get_essid_value(gchar *src, const gchar *target, int unit)
{
    return first_pieces(src, target, "        ", unit);
}

// The values of a network in the output of iwlist, in the order in which a line is searched for
// their keywords.
static const struct {
    const char *keyword;
    gchar *(*extract)(gchar *src, const gchar *target, int unit);
    const char *label; // for standard error; NULL for the encryption key, which prints its own line
    gsize offset, size;
} VALUES[] = {
    {"Address:", get_string_value, "Address", offsetof(WIFI_CELL, address),
     sizeof(WIFI_CELL::address)},
    {"ESSID:", get_essid_value, "ESSID", offsetof(WIFI_CELL, essid), sizeof(WIFI_CELL::essid)},
    {"Mode:", get_string_value, "Mode", offsetof(WIFI_CELL, mode), sizeof(WIFI_CELL::mode)},
    {"Frequency:", get_string_value, "Frequency", offsetof(WIFI_CELL, channel),
     sizeof(WIFI_CELL::channel)},
    {"Quality:", get_string_value, "quality", offsetof(WIFI_CELL, quality),
     sizeof(WIFI_CELL::quality)},
    {"Encryption key:", get_string_value, nullptr, offsetof(WIFI_CELL, key),
     sizeof(WIFI_CELL::key)},
};

// Removes the quotes around a name, and the spaces just inside them.
static gchar *unquote(gchar *name)
{
    gsize length = strlen(name);

    if (name[0] == '"')
        name[0] = ' ';
    if (name[length - 1] == '"')
        name[length - 1] = ' ';
    return g_strstrip(name);
}

// Stores the first value in the line that the network still lacks. FALSE when there is none.
static gboolean take_value(char *line, gboolean *keywords_used, WIFI_CELL *cell)
{
    for (gsize i = 0; i < G_N_ELEMENTS(VALUES); i++) {
        if (keywords_used[i])
            continue;

        g_autofree gchar *value = VALUES[i].extract(line, VALUES[i].keyword, 0);

        if (value == nullptr)
            continue;
        keywords_used[i] = TRUE;
        if (VALUES[i].extract == get_essid_value)
            unquote(value);
        copy_field(reinterpret_cast<char *>(cell) + VALUES[i].offset, VALUES[i].size, value);
        if (VALUES[i].label != nullptr) {
            g_autofree gchar *shown = printable(value);

            debug_line("%s:%s", VALUES[i].label, shown);
        } else {
            cell->encmode = encryption_of(value, SCAN_WORDS, ENC_RESTRICTED);
            debug_line("key:%d", static_cast<int>(cell->encmode));
        }
        return TRUE;
    }
    return FALSE;
}

// WEP or WPA, where the device says it; a board's own tool has no such line.
static gboolean take_authentication(char *line, WIFI_CELL *cell)
{
    if (!has_device_path() || cell->encmode != ENC_OPEN)
        return FALSE;

    g_autofree gchar *word = get_string_value(line, "Authentication:", 0);

    if (word == nullptr)
        return FALSE;
    cell->key_mgmt = g_str_equal(word, "WPA");
    return TRUE;
}

// Reads from the first line of a network to its "Bit Rates:" line. Where that is missing, the lines
// of the next network fill in what this one lacks.
static void read_cell(FILE *stream, char *line, WIFI_CELL *cell)
{
    gboolean keywords_used[G_N_ELEMENTS(VALUES)] = {};

    do {
        if (take_value(line, keywords_used, cell) || take_authentication(line, cell))
            continue;

        g_autofree gchar *bit_rates = get_string_value(line, "Bit Rates:", 0);

        if (bit_rates)
            return;
    } while (fgets(line, LINE_SIZE, stream) != nullptr);
}

static void release_cells()
{
    for (WIFI_CELL *&cell : my_wifi->wifi_cell)
        g_clear_pointer(&cell, g_free);
    my_wifi->cell_count = 0;
}

void read_cells(FILE *stream)
{
    release_cells();

    const char *disconnected = gettext("Disconnect");
    char line[LINE_SIZE] = "";

    while (fgets(line, sizeof line, stream) != nullptr) {
        if (strstr(line, "Cell") == nullptr)
            continue;
        debug_line("FIND CELL[%d]", my_wifi->cell_count);

        WIFI_CELL *cell = g_new0(WIFI_CELL, 1);

        copy_field(cell->state, sizeof cell->state, disconnected);
        cell->linkstate = 2;
        read_cell(stream, line, cell);
        if (my_wifi->cell_count == MAX_CELLS) {
            g_free(cell);
            return;
        }
        my_wifi->wifi_cell[my_wifi->cell_count++] = cell;
    }
}

void get_cell(WIFI_INTERFACE *iface)
{
    debug_line("get cell start...");
    if (iface == nullptr || !interface_usable(iface->name, "the scan")) {
        release_cells();
        return;
    }
    bring_interface_up(iface->name);

    g_autofree gchar *command = g_strdup_printf("iwlist %s scan", iface->name);
    FILE *pipe = popen(command, "r");

    if (pipe == nullptr) {
        perror("pipe");
        return;
    }
    collect_debug_lines();
    read_cells(pipe);
    write_debug_lines();
    pclose(pipe);
}
