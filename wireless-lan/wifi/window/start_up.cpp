#include "window/start_up.h"

#include "base/state.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/basic_settings.h"
#include "wifi_info/debug.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/preferred_file.h"
#include "wifi_info/shell.h"

void load_configuration()
{
    get_interface();
    if (my_wifi->interface_count > 0) {
        bring_interface_up(first_interface()->name);
        debug_line("find a wifi device,up it");
    }
    get_basic_setting_from_file(SETTINGS_FILE);
    get_preferred_network_setting_from_file(USER_FILE);
    global_build_list = build_user_cell_clist();
}
