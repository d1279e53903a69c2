// SPDX-License-Identifier: MIT
#include "connection/chosen_network.h"

#include <cstring>

#include "base/state.h"
#include "wifi.h"
#include "wifi_info/text.h"

static gboolean is_network(const WIFI_CELL *cell, const char *address, const char *essid)
{
    return strcmp(cell->address, address) == 0 && strcmp(cell->essid, essid) == 0;
}

// The index of the network with this address and name, -1 for none. One access point can be listed
// twice, so the current index is tried first.
static int find_network(const char *address, const char *essid)
{
    const WIFI_CELL *cell = scanned_cell(connect_index);

    if (cell != nullptr && is_network(cell, address, essid))
        return connect_index;
    for (int index = 0; (cell = scanned_cell(index)) != nullptr; index++)
        if (is_network(cell, address, essid))
            return index;
    return -1;
}

WIFI_CELL *find_chosen_network(const WIFI_CELL *chosen)
{
    int index = find_network(chosen->address, chosen->essid);

    // A scan reports a hidden network without the name that the user typed.
    if (index < 0)
        index = find_network(chosen->address, "");
    if (index < 0)
        return nullptr;

    WIFI_CELL *cell = scanned_cell(index);

    connect_index = index;
    copy_field(cell->essid, sizeof cell->essid, chosen->essid);
    return cell;
}

void take_answers_over(WIFI_CELL *cell, const WIFI_CELL *chosen)
{
    cell->encmode = chosen->encmode;
    cell->key_mgmt = chosen->key_mgmt;
    cell->key_index = chosen->key_index;
    memcpy(cell->userkey, chosen->userkey, sizeof cell->userkey);
}
