// SPDX-License-Identifier: MIT
#include "wifi_info/interfaces.h"

#include <cstdio>
#include <cstring>

#include "wifi.h"
#include "wifi_info/text.h"

// Stores the name at the start of `line` in a slot. An existing record keeps everything else.
static void name_interface(int slot, const char *line)
{
    WIFI_INTERFACE *&iface = my_wifi->wifi_interface[slot];

    if (iface == nullptr)
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
        if (fgets(line, sizeof line, stream) == nullptr)
            return;
    } while (!g_str_has_prefix(line, " face"));

    int count = 0;

    while (fgets(line, sizeof line, stream) != nullptr) {
        if (count < MAX_INTERFACES)
            name_interface(count++, line);
    }
    // The slot after the last interface is filled too, because the settings need a first record
    // even when there is no interface.
    if (count < MAX_INTERFACES)
        name_interface(count, line);
    my_wifi->interface_count = count;
}

gboolean get_interface()
{
    FILE *pipe = popen("cat /proc/net/wireless", "r");

    if (pipe == nullptr) {
        perror("pipe");
        return FALSE;
    }
    read_interfaces(pipe);
    return pclose(pipe);
}
