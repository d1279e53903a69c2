// The network that the user chose, found again after anything that may have run a refresh.

#ifndef WIFI_CONNECTION_CHOSEN_NETWORK_H
#define WIFI_CONNECTION_CHOSEN_NETWORK_H

#include <glib.h>

#include "wifi.h"

// Makes the scanned network that `chosen` is a copy of the one at connect_index and gives its
// record the copy's answers (encryption and key), since a refresh may have replaced the records
// after the copy was made. FALSE, with nothing changed: no network with this access point and name
// is there any more, and its key is for no other.
gboolean take_up_network(const WIFI_CELL *chosen);

#endif
