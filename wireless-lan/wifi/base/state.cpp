// SPDX-License-Identifier: MIT
#include "base/state.h"

#include <cstring>

#include "wifi.h"

GtkWidget *mainwindow = nullptr;
gint connect_index = 0;
gint pid_dhclient = 0;
gboolean linkconnect = FALSE;
gboolean addressvalid = FALSE;
gboolean doubleclick = TRUE;
gint user_wifi_count = 0;
GtkWidget *global_build_list = nullptr;
gint boxspacing = 5;

gboolean my_wifi_init()
{
    my_wifi = static_cast<MY_WIFI *>(g_try_malloc0(sizeof(MY_WIFI)));
    if (my_wifi == nullptr)
        return FALSE;
    my_wifi->interface_index = -1;
    my_wifi->cell_index = -1;
    memset(Link_AP_MAC, 0, sizeof Link_AP_MAC);
    global_build_list = nullptr;
    return TRUE;
}

WIFI_INTERFACE *first_interface()
{
    return my_wifi->wifi_interface[0];
}

WIFI_CELL *scanned_cell(int index)
{
    if (index < 0 || index >= my_wifi->cell_count)
        return nullptr;
    return my_wifi->wifi_cell[index];
}
