// SPDX-License-Identifier: MIT
// What the device is told: the command lines that join and leave a network and get an address.

#ifndef WIFI_CONNECTION_COMMANDS_H
#define WIFI_CONNECTION_COMMANDS_H

#include <glib.h>

#include "wifi.h"

// The command line for /sbin/iwset that joins `cell` on the interface `name`. g_free it.
gchar *iwset_command(const char *name, const WIFI_CELL *cell);

// The key that the device is told for `cell`: "off" where it has none. The cell owns it.
const char *key_word(const WIFI_CELL *cell);

// The mode that /sbin/iwset and the preferred networks take: "Managed" for "Master" in any case,
// else `mode` itself.
const char *client_mode(const char *mode);

// Leaves `text` and a line end in the file `path` for the device's scripts, created anew with the
// permissions `mode` (less the umask): a link planted under the name is removed, not followed, and
// a name that another user makes again meanwhile is removed again, a hundred times at most. A line
// end inside `text` becomes a blank. FALSE: the file could not be made ours; standard error has the
// cause.
gboolean leave_text_for_scripts(const char *text, const char *path, guint mode);

// Applies the network at connect_index to the first interface: brings it up, clears its address,
// leaves name and key in /tmp for the device's scripts and runs /sbin/iwset. Does nothing without
// an interface or a network. FALSE: one of the two files could not be left; then neither is, and
// /sbin/iwset has not run.
gboolean apply_configuration();

// Brings `iface` up, leaves the name of its hosted network in /tmp for the device's scripts and
// runs /sbin/iwset on it. FALSE: the file could not be left, and /sbin/iwset has not run.
gboolean host_network(const WIFI_INTERFACE *iface);

// Starts "/sbin/lnk-ifup" for the first interface, detached: nobody's child. Always FALSE.
gboolean require_ip_address();

// Runs "/sbin/lnk-ifdown" for the first interface and waits for it.
void leave_network();

#endif
