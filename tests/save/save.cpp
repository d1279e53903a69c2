// SPDX-License-Identifier: MIT
// Saves one of the two files: save basic|preferred FILE old|new|short. Exit status 0: saved; 1: not
// saved, with the reason on standard error.

#include <cstring>

#include <unistd.h>

#include "support/state.h"
#include "wifi.h"
#include "wifi_info/basic_settings.h"
#include "wifi_info/preferred_file.h"

static void fill(char *field, gsize size, char byte)
{
    memset(field, byte, size - 1);
}

int main(int argc, char **argv)
{
    if (argc != 4)
        return 2;
    fresh_state();
    WIFI_INTERFACE *iface = add_interface("wlan0");
    char byte = argv[3][0];
    bool is_short = strcmp(argv[3], "short") == 0;
    iface->isdhcp = is_short;
    iface->isstatic = !is_short;
    fill(static_address, sizeof static_address, byte);
    fill(iface->wifi_group.essid, is_short ? 4 : 128, byte);
    for (int i = 0; i < (is_short ? 2 : 64); i++) {
        WIFI_CELL *cell = add_preferred();
        fill(cell->alias, sizeof cell->alias, byte);
        fill(cell->essid, sizeof cell->essid, byte);
    }
    getppid(); // marks the beginning of the save for strace
    bool basic = strcmp(argv[1], "basic") == 0;
    gboolean saved =
        basic ? save_basic_setting_to_file(argv[2]) : save_preferred_network_to_file(argv[2]);
    return saved ? 0 : 1;
}
