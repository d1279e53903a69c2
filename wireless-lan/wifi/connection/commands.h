// What the device is told: the command lines that join and leave a network and get an address.

#ifndef WIFI_CONNECTION_COMMANDS_H
#define WIFI_CONNECTION_COMMANDS_H

#include <glib.h>

#include "wifi.h"

// The command line for /sbin/iwset that joins `cell` on the interface `name`. g_free it.
gchar *iwset_command(const char *name, const WIFI_CELL *cell);

// The word /sbin/iwset takes for an encryption: "off", "open" or (any other value) "restricted".
const char *encryption_word(t_encmode encmode);

// The mode /sbin/iwset and the preferred networks take: "Managed" for "Master" in any case, else
// `mode` itself.
const char *client_mode(const char *mode);

// Applies the network at connect_index to the first interface: brings it up, clears its address,
// leaves name and key in /tmp for the device's scripts and runs /sbin/iwset.
void apply_configuration();

// Leaves `text` and a line end in the file `path` below /tmp for the device's scripts; a link
// planted there is removed, not followed. `mode` are the permissions of the new file.
void leave_text_for_scripts(const char *text, const char *path, guint mode);

// Starts "/sbin/lnk-ifup" for the first interface, detached: nobody's child. Always FALSE.
gboolean require_ip_address();

// One-shot timer: leaves the network. Always FALSE.
gboolean do_disconnect(gpointer data);

#endif
