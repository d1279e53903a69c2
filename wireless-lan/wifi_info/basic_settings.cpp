// SPDX-License-Identifier: MIT
#include "wifi_info/basic_settings.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/encryption.h"
#include "wifi_info/replace_file.h"
#include "wifi_info/text.h"

constexpr int LINE_SIZE = 255;

// The address lines, in the order of the file; each value has 32 bytes.
static const struct {
    const char *keyword;
    gchar *value;
} ADDRESSES[] = {
    {"address", static_address},
    {"netmask", static_netmask},
    {"broadcast", static_broadcast},
    {"gateway", static_gateway},
};

static GString *basic_setting_text(const WIFI_INTERFACE *iface)
{
    GString *text =
        g_string_sized_new(sizeof *iface); // enough for all fields, so it is never moved

    append_line(text, "iface", iface->name);
    if (iface->isstatic) {
        append_line(text, "addrtype", "static "); // the space is part of the format
        for (const auto &address : ADDRESSES)
            append_line(text, address.keyword, address.value);
    } else {
        append_line(text, "addrtype", iface->isdhcp ? "dhcp" : "static");
        append_line(text, "dns", iface->auto_dns ? "auto" : "manual");
    }
    append_number_line(text, "wifigroup", iface->wifi_group_enable);
    append_line(text, "ESSID", iface->wifi_group.essid);
    append_line(text, "MODE", "Ad-Hoc");
    append_line(text, "KEY", iface->wifi_group.userkey);
    append_line(text, "Encryption", encryption_word(iface->wifi_group.encmode, FILE_WORDS));
    return text;
}

gboolean save_basic_setting_to_file(const gchar *file)
{
    const WIFI_INTERFACE *iface = my_wifi->wifi_interface[0];

    if (iface == nullptr) {
        debug_line("no interface, %s is not written", file);
        return FALSE;
    }

    g_autoptr(GError) error = nullptr;
    GString *text = basic_setting_text(iface);
    const gboolean saved = replace_file(file, text->str, text->len, &error);

    wipe_content(text);
    if (!saved) {
        if (g_error_matches(error, REPLACE_ERROR, REPLACE_NOT_OPENED))
            debug_line("File %s cannot be open.", file);
        debug_line("%s", error->message);
        return FALSE;
    }
    debug_line("%s", iface->isstatic ? "isstatic" : "isdhcp");
    return TRUE;
}

// Reads the next line and trims it. At the end of the file `line` keeps the last one, which is then
// read again.
static gboolean next_line(FILE *stream, char *line)
{
    if (fgets(line, LINE_SIZE, stream) == nullptr)
        return FALSE;
    g_strstrip(line);
    return TRUE;
}

// The field of `line` after the `index`th space, trimmed. Two spaces in a row enclose an empty
// field. FALSE when there are fewer spaces; `value` is unchanged then.
static gboolean get_piece(const char *line, int index, char *value)
{
    for (; index > 0; index--) {
        line = strchr(line, ' ');
        if (line == nullptr)
            return FALSE;
        line++;
    }

    g_autofree gchar *piece = g_strndup(line, strcspn(line, " "));

    copy_field(value, LINE_SIZE, g_strstrip(piece));
    return TRUE;
}

// The value of a line that begins with `keyword`. FALSE for any other line, and for one without a
// value.
static gboolean get_value(const char *line, const char *keyword, char *value)
{
    return g_str_has_prefix(line, keyword) && get_piece(line, 1, value);
}

// Reads up to the line that names the first interface and leaves that line in `line`. FALSE when
// there is no such line.
static gboolean find_stanza(FILE *stream, char *line)
{
    const WIFI_INTERFACE *iface = my_wifi->wifi_interface[0];
    char name[LINE_SIZE] = ""; // a line without a name leaves the previous one

    while (next_line(stream, line)) {
        if (!g_str_has_prefix(line, "iface"))
            continue;
        get_piece(line, 1, name);

        g_autofree gchar *shown = printable(name);

        debug_line("ifname:%s", shown);
        if (iface != nullptr && g_str_equal(name, iface->name))
            return TRUE;
    }
    return FALSE;
}

static void set_static(WIFI_INTERFACE *iface, gboolean isstatic)
{
    iface->isstatic = isstatic;
    iface->isdhcp = !isstatic;
}

// Reads exactly four lines. A line with another keyword than the expected one is skipped.
static void read_addresses(FILE *stream, char *line)
{
    char value[LINE_SIZE];

    for (const auto &address : ADDRESSES) {
        next_line(stream, line);
        if (get_value(line, address.keyword, value))
            copy_field(address.value, sizeof static_address, value);
    }
}

static void read_group(FILE *stream, char *line, WIFI_INTERFACE *iface)
{
    WIFI_CELL *group = &iface->wifi_group;
    char value[LINE_SIZE];

    next_line(stream, line);

    g_autofree gchar *shown = printable(line);

    printf("buffer=%s\r\n", shown);
    if (get_value(line, "wifigroup", value))
        iface->wifi_group_enable = decimal(value);
    next_line(stream, line);
    if (get_value(line, "ESSID", value))
        copy_field(group->essid, sizeof group->essid, value);
    next_line(stream, line);
    // Whatever the file says; the spelling is part of the format.
    copy_field(group->mode, sizeof group->mode, "Ad-Hos");
    next_line(stream, line);
    if (get_value(line, "KEY", value))
        copy_field(group->userkey, sizeof group->userkey, value);
    next_line(stream, line);
    if (get_value(line, "Encryption", value))
        group->encmode = encryption_of(value, FILE_WORDS, ENC_RESTRICTED);
}

void read_basic_settings(FILE *stream)
{
    WIFI_INTERFACE *iface = my_wifi->wifi_interface[0];

    if (iface != nullptr) {
        iface->wifi_group_enable = FALSE;
        iface->wifi_group = {};
    }

    char line[LINE_SIZE] = "";
    char value[LINE_SIZE];

    if (!find_stanza(stream, line))
        return;
    next_line(stream, line);
    if (get_value(line, "addrtype", value))
        set_static(iface, g_str_equal(value, "static"));
    if (iface->isstatic == 1) {
        read_addresses(stream, line);
    } else {
        next_line(stream, line);
        if (get_value(line, "dns", value))
            iface->auto_dns = g_str_equal(value, "auto");
    }
    read_group(stream, line, iface);
}

void read_basic_settings_advanced(FILE *stream)
{
    char line[LINE_SIZE] = "";
    char method[LINE_SIZE];

    if (!find_stanza(stream, line))
        return;
    if (get_piece(line, 3, method))
        set_static(my_wifi->wifi_interface[0], g_str_equal(method, "static"));
    read_addresses(stream, line);
}

// Opens the settings for a reader. Each call closes the previous stream, so that at most one is
// open.
static FILE *open_settings(const gchar *file)
{
    static FILE *settings = nullptr;

    g_clear_pointer(&settings, fclose);
    settings = open_text(file);
    return settings;
}

gboolean get_basic_setting_from_file(const gchar *file)
{
    FILE *stream = open_settings(file);

    if (stream == nullptr)
        return errno == ENOENT;
    read_basic_settings(stream);
    return !ferror(stream);
}

gboolean get_basic_setting_from_file_Advanced(const gchar *file)
{
    FILE *stream = open_settings(file);

    if (stream == nullptr)
        return errno == ENOENT;
    read_basic_settings_advanced(stream);
    return !ferror(stream);
}

gchar *get_file_var(const gchar *file, const gchar *var)
{
    g_autofree gchar *content = nullptr;

    if (!g_file_get_contents(file, &content, nullptr, nullptr)) {
        fprintf(stderr, "Could not access file: %s.\n", file);
        return nullptr;
    }

    g_auto(GStrv) lines = g_strsplit(content, "\n", 2048);

    for (gchar **line = lines; *line != nullptr; line++) {
        g_strchomp(*line);
        if (**line == '#' || strstr(*line, var) == nullptr)
            continue;

        const gchar *separator = strrchr(*line, '=');

        if (separator == nullptr)
            separator = strrchr(*line, ' ');
        return separator != nullptr ? g_strdup(separator + 1) : nullptr;
    }
    return g_strdup("");
}

void get_paramval(gchar *source, gchar *keyword, gchar *ret)
{
    if (source == nullptr || keyword == nullptr || ret == nullptr) {
        log_critical("get_paramval", "source!=NULL&&keyword!=NULL&&ret!=NULL");
        return;
    }
    copy_second_word(ret, 128, source);

    g_autofree gchar *shown = printable(ret);

    debug_line("paramval:%s", shown);
}
