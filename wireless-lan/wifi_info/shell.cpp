// SPDX-License-Identifier: MIT
#include "wifi_info/shell.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "wifi_info/debug.h"
#include "wifi_info/text.h"

gchar *shell_escape(const char *text)
{
    GString *escaped = g_string_sized_new(2 * strlen(text) + 1); // never moved, it may be a key

    for (; *text; text++) {
        if (strchr("\"\\$`", *text) != nullptr)
            g_string_append_c(escaped, '\\');
        g_string_append_c(escaped, *text);
    }
    return g_string_free(escaped, FALSE);
}

gchar *echo_command(const char *text, const char *path)
{
    WIPED gchar *escaped = shell_escape(text);

    // Some shells' echo takes "-n" as an option, and that of dash expands "\t" to a tab.
    if (text[0] == '-' || strchr(text, '\\') != nullptr)
        return g_strdup_printf("printf '%%s\\n' \"%s\" >%s", escaped, path);
    return g_strdup_printf("echo \"%s\" >%s", escaped, path);
}

void run_command(const char *command)
{
    int status = system(command);

    static_cast<void>(status);
}

static gboolean is_plain_name(const char *name)
{
    gsize length = strlen(name);

    if (length == 0 || length > 15 || g_str_equal(name, ".") || g_str_equal(name, ".."))
        return FALSE;
    if (name[0] == '-') // an option to the commands
        return FALSE;
    for (; *name; name++) {
        guchar byte = static_cast<guchar>(*name);

        if (byte <= ' ' || byte == 0x7F || byte == 0xA0 ||
            strchr("/:|&;<>()$`\\\"'*?[]#~=!{}^", byte) != nullptr)
            return FALSE;
    }
    return TRUE;
}

gboolean interface_usable(const char *name, const char *step)
{
    if (is_plain_name(name))
        return TRUE;
    debug_line("no usable interface name, skipping %s", step);
    return FALSE;
}

void bring_interface_up(const char *name)
{
    if (!interface_usable(name, "ifconfig up"))
        return;

    g_autofree gchar *command = g_strdup_printf("/sbin/ifconfig %s up", name);

    run_command(command);
}
