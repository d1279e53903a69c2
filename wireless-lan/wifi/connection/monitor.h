// SPDX-License-Identifier: MIT
// The pollers that follow a connect from association to an address, and the controls they give
// back.

#ifndef WIFI_CONNECTION_MONITOR_H
#define WIFI_CONNECTION_MONITOR_H

#include <glib.h>

constexpr guint POLL_MS = 2000;

// Begins (FALSE) or ends (TRUE) the time in which a connect keeps the main window's buttons grey.
// "Active WIFI" instead follows whether an interface is missing: this runs `cat` and rewrites the
// interface table (get_interface).
void connect_button_sensitive(gboolean flags);

// Gives the controls back, and a double click may connect again too.
void give_controls_back();

// Timer: waits for an access point, 21 polls at most, then requires an address and hands over.
gboolean detect_network_link_state(gpointer data);

// Timer: waits for an address, 21 polls at most.
gboolean detect_network_interface_state(gpointer data);

#endif
