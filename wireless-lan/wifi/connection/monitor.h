// The pollers that follow a connect from association to an address, and the controls they give
// back.

#ifndef WIFI_CONNECTION_MONITOR_H
#define WIFI_CONNECTION_MONITOR_H

#include <glib.h>

#include "wifi.h"

constexpr guint POLL_MS = 2000;

// Sets the sensitivity of the main window's buttons; "Active WIFI" instead follows whether an
// interface is missing.
void connect_button_sensitive(gboolean flags);

// Makes the scanned network that `chosen` is a copy of the one at connect_index and gives its
// record the copy's answers (encryption and key), since a refresh may have replaced the records
// after the copy was made. FALSE, with nothing changed: no network with this access point and name
// is there any more, and its key is for no other.
gboolean take_up_network(const WIFI_CELL *chosen);

// Timer: waits for an access point, 21 polls at most, then requires an address and hands over.
gboolean detect_network_link_state(gpointer data);

// Timer: waits for an address, 21 polls at most.
gboolean detect_network_interface_state(gpointer data);

// One-shot timer: takes up the network that `data` (a WIFI_CELL) is a copy of, or with NULL the one
// at connect_index, applies it and starts the link poller. A network that is gone ends the connect
// and gives the controls back. Always FALSE.
gboolean do_connect(gpointer data);

#endif
