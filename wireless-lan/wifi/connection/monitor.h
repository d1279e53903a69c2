// SPDX-License-Identifier: MIT
// The pollers that follow a connect from association to an address, and the release of the controls
// at its end.

#ifndef WIFI_CONNECTION_MONITOR_H
#define WIFI_CONNECTION_MONITOR_H

#include <glib.h>

constexpr guint POLL_MS = 2000;

// FALSE: a connect begins and the buttons of the main window turn grey. TRUE: it has ended. "Active
// WIFI" instead depends on whether an interface is missing, for which this runs get_interface.
void connect_button_sensitive(gboolean flags);

// Ends the hold of a connect and lets a double click connect again.
void give_controls_back();

// Timer: waits for an access point, 21 polls at most, then requests an address and starts the next
// poller.
gboolean detect_network_link_state(gpointer data);

// Timer: waits for an address, 21 polls at most.
gboolean detect_network_interface_state(gpointer data);

#endif
