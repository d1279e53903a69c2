#include "connection/chosen_network.h"

#include <cstring>

#include "base/state.h"
#include "wifi.h"

static gboolean same_network(const WIFI_CELL *a, const WIFI_CELL *b)
{
    return strcmp(a->address, b->address) == 0 && strcmp(a->essid, b->essid) == 0;
}

gboolean take_up_network(const WIFI_CELL *chosen)
{
    int index = connect_index;
    WIFI_CELL *cell = scanned_cell(index);

    // One access point can stand in the list twice, so the index in hand goes first.
    if (cell == nullptr || !same_network(cell, chosen)) {
        for (index = 0; (cell = scanned_cell(index)) != nullptr; index++)
            if (same_network(cell, chosen))
                break;
        if (cell == nullptr)
            return FALSE;
    }
    connect_index = index;
    cell->encmode = chosen->encmode;
    cell->key_mgmt = chosen->key_mgmt;
    cell->key_index = chosen->key_index;
    memcpy(cell->userkey, chosen->userkey, sizeof cell->userkey);
    return TRUE;
}
