// SPDX-License-Identifier: MIT
// What the kernel says of an interface, and what it is told: its address, its access point, its
// link statistics.

#ifndef WIFI_CONNECTION_INTERFACE_STATE_H
#define WIFI_CONNECTION_INTERFACE_STATE_H

#include <glib.h>

#include "wifi.h"

// Reads the access point of the first interface into Link_AP_MAC with SIOCGIWAP (linux/wireless.h);
// it stays empty when the request fails.
void get_ap_mac();

// TRUE when an access point address is neither empty nor all zeros.
gboolean is_associated(const char *ap_address);

// TRUE when the interface holds an IPv4 address (SIOCGIFADDR), whatever it is. NULL gives FALSE.
gboolean address_valid(WIFI_INTERFACE *iface);

// Reads the interface's IPv4 address into its `address`, which is emptied when it has none. NULL is
// no interface: nothing is done.
void get_interface_statistics_data(WIFI_INTERFACE *iface);

// Sets the IPv4 address of the interface `name` to 0.0.0.0, so that the one of the former network
// is not taken for an answer of the new one.
void clear_address(const char *name);

// Prints the interface's line of /proc/net/wireless to standard error. Nothing calls it: it is
// there to be called while a driver is looked into.
void get_network_statics(WIFI_INTERFACE *iface);

#endif
