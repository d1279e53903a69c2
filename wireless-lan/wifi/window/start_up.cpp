// SPDX-License-Identifier: MIT
#include "window/start_up.h"

#include "base/state.h"
#include "preferred/store.h"
#include "settings/apply.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/shell.h"

void load_configuration()
{
    get_interface();
    if (my_wifi->interface_count > 0) {
        bring_interface_up(first_interface()->name);
        debug_line("find a wifi device,up it");
    }
    load_settings();
    load_user_cells();
    global_build_list = build_user_cell_clist();
}
