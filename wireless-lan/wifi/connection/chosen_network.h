// SPDX-License-Identifier: MIT
// The network that the user chose, found again after a refresh may have replaced the list.

#ifndef WIFI_CONNECTION_CHOSEN_NETWORK_H
#define WIFI_CONNECTION_CHOSEN_NETWORK_H

#include <glib.h>

#include "wifi.h"

// The scanned network that `chosen` is a copy of; connect_index becomes its index. A network with
// the same access point and no name is the same hidden network and gets the name of the copy. NULL,
// with nothing changed, when there is no such network any more: its key must not be used for
// another one.
WIFI_CELL *find_chosen_network(const WIFI_CELL *chosen);

// Copies the user's answers (encryption and key) from `chosen` into the record.
void take_answers_over(WIFI_CELL *cell, const WIFI_CELL *chosen);

#endif
