// SPDX-License-Identifier: MIT
// The network that the user chose, found again after anything that may have run a refresh.

#ifndef WIFI_CONNECTION_CHOSEN_NETWORK_H
#define WIFI_CONNECTION_CHOSEN_NETWORK_H

#include <glib.h>

#include "wifi.h"

// The scanned network that `chosen` is a copy of; connect_index becomes its index, since a refresh
// may have replaced the records after the copy was made. A network with this access point that is
// listed without a name is the same one, and its record gets the copy's name. NULL, with nothing
// changed: no such network is there any more, and its key is for no other.
WIFI_CELL *find_chosen_network(const WIFI_CELL *chosen);

// Copies the user's answers (encryption and key) from `chosen` into the record.
void take_answers_over(WIFI_CELL *cell, const WIFI_CELL *chosen);

#endif
