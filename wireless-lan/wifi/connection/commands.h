// SPDX-License-Identifier: MIT
// The commands that the device runs: joining and leaving a network, getting an address.

#ifndef WIFI_CONNECTION_COMMANDS_H
#define WIFI_CONNECTION_COMMANDS_H

#include <glib.h>

#include "wifi.h"

// The command line for /sbin/iwset that joins `cell` on the interface `name`. g_free it.
gchar *iwset_command(const char *name, const WIFI_CELL *cell);

// The key for the device's commands: "off" when `cell` has none. Owned by `cell`.
const char *key_word(const WIFI_CELL *cell);

// The mode for /sbin/iwset and for a preferred network: "Managed" for "Master" in any case,
// otherwise `mode`.
const char *client_mode(const char *mode);

// Writes `text` and a newline to `path` for the device's scripts; a line end inside `text` becomes
// a space. The file is created anew with the permissions `mode` (less the umask): a link under that
// name is removed, not followed, and so is, a hundred times at most, what another user creates
// there meanwhile. FALSE: the file could not be made ours, and standard error has the reason.
gboolean leave_text_for_scripts(const char *text, const char *path, guint mode);

// Joins the network at connect_index with the first interface: brings it up, clears its address,
// writes name and key to /tmp for the device's scripts and runs /sbin/iwset. Without an interface
// or a network it does nothing. FALSE: one of the two files could not be written; then neither is
// there, and /sbin/iwset has not run.
gboolean apply_configuration();

// Brings `iface` up, writes the name of its hosted network to /tmp for the device's scripts and
// runs /sbin/iwset. FALSE: the file could not be written, and /sbin/iwset has not run.
gboolean host_network(const WIFI_INTERFACE *iface);

// Starts "/sbin/lnk-ifup" for the first interface as an orphan that init reaps. Always FALSE.
gboolean require_ip_address();

// Runs "/sbin/lnk-ifdown" for the first interface and waits for it.
void leave_network();

#endif
