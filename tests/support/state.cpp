// SPDX-License-Identifier: MIT
#include "state.h"
#include "wifi.h"

#include <cstdlib>
#include <cstring>

void fresh_state()
{
    if (my_wifi) {
        for (WIFI_INTERFACE *iface : my_wifi->wifi_interface)
            g_free(iface);
        for (WIFI_CELL *cell : my_wifi->wifi_cell)
            g_free(cell);
        for (WIFI_CELL *cell : my_wifi->user_wifi_cell)
            g_free(cell);
        g_free(my_wifi);
    }
    my_wifi = g_new0(MY_WIFI, 1);
    my_wifi->interface_index = -1;
    my_wifi->cell_index = -1;
    for (gchar *text : {static_address, static_netmask, static_broadcast, static_gateway})
        memset(text, 0, sizeof static_address);
}

WIFI_INTERFACE *add_interface(const char *name)
{
    WIFI_INTERFACE *iface = g_new0(WIFI_INTERFACE, 1);
    strncpy(iface->name, name, sizeof iface->name - 1);
    my_wifi->wifi_interface[0] = iface;
    my_wifi->interface_count = 1;
    return iface;
}

WIFI_CELL *add_preferred()
{
    WIFI_CELL *cell = g_new0(WIFI_CELL, 1);
    my_wifi->user_wifi_cell[my_wifi->user_cell_count++] = cell;
    return cell;
}

std::string field_text(const char *field, gsize size)
{
    if (!memchr(field, '\0', size))
        abort();
    return field;
}
