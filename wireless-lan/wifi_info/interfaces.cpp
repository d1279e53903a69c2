#include <cstdio>
#include <cstring>

#include "wifi.h"
#include "wifi_info/readers.h"

// Puts the name at the start of `line` into a slot; a record that is there keeps all the rest.
static void name_interface(int slot, const char *line)
{
    WIFI_INTERFACE *&iface = my_wifi->wifi_interface[slot];

    if (!iface)
        iface = g_new0(WIFI_INTERFACE, 1);

    g_autofree gchar *name = g_strndup(line, strcspn(line, ":"));

    copy_field(iface->name, sizeof iface->name, g_strstrip(name));
}

void read_interfaces(FILE *stream)
{
    char line[255] = "";

    my_wifi->interface_index = 0;
    my_wifi->interface_count = -1;
    do {
        if (!fgets(line, sizeof line, stream))
            return;
    } while (!g_str_has_prefix(line, " face"));

    int count = 0;

    while (fgets(line, sizeof line, stream)) {
        if (count < MAX_INTERFACES)
            name_interface(count++, line);
    }
    // The slot behind the last interface is filled too: the settings always find a first record.
    if (count < MAX_INTERFACES)
        name_interface(count, line);
    my_wifi->interface_count = count;
}

gboolean get_interface()
{
    FILE *pipe = popen("cat /proc/net/wireless", "r");

    if (!pipe) {
        perror("pipe");
        return FALSE;
    }
    read_interfaces(pipe);
    return pclose(pipe);
}

// What stands behind `target`, up to the first separator, or the second one when `unit` is set.
static gchar *first_pieces(gchar *src, const gchar *target, const char *separator, int unit)
{
    gchar *keyword = strstr(src, target);

    if (!keyword)
        return nullptr;

    gchar *first = g_strstrip(keyword + strlen(target));

    if (*first == '\0')
        return nullptr;

    const gchar *first_end = strstr(first, separator);

    if (!first_end)
        return g_strdup(first);

    gchar *piece = g_strndup(first, static_cast<gsize>(first_end - first));

    if (!unit)
        return piece;

    const gchar *second = first_end + strlen(separator);
    const gchar *second_end = strstr(second, separator);
    g_autofree gchar *head = piece;
    g_autofree gchar *tail =
        second_end ? g_strndup(second, static_cast<gsize>(second_end - second)) : g_strdup(second);

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
