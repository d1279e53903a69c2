#include "connection/chosen_network.h"

#include <cstring>

#include "base/state.h"
#include "wifi.h"

static gboolean same_network(const WIFI_CELL *a, const WIFI_CELL *b)
{
    return strcmp(a->address, b->address) == 0 && strcmp(a->essid, b->essid) == 0;
}

WIFI_CELL *find_chosen_network(const WIFI_CELL *chosen)
{
    int index = connect_index;
    WIFI_CELL *cell = scanned_cell(index);

    // One access point can be in the list twice, so the index in hand goes first.
    if (cell == nullptr || !same_network(cell, chosen)) {
        for (index = 0; (cell = scanned_cell(index)) != nullptr; index++)
            if (same_network(cell, chosen))
                break;
        if (cell == nullptr)
            return nullptr;
    }
    connect_index = index;
    return cell;
}

void take_answers_over(WIFI_CELL *cell, const WIFI_CELL *chosen)
{
    cell->encmode = chosen->encmode;
    cell->key_mgmt = chosen->key_mgmt;
    cell->key_index = chosen->key_index;
    memcpy(cell->userkey, chosen->userkey, sizeof cell->userkey);
}
