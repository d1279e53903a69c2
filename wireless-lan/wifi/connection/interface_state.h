// SPDX-License-Identifier: MIT
// The state of an interface in the kernel: address, access point, link statistics.

#ifndef WIFI_CONNECTION_INTERFACE_STATE_H
#define WIFI_CONNECTION_INTERFACE_STATE_H

#include <glib.h>

#include "wifi.h"

// Reads the access point of the first interface into Link_AP_MAC (SIOCGIWAP of linux/wireless.h),
// which stays empty when the request fails.
void get_ap_mac();

// TRUE when the address of an access point is neither empty nor all zeros.
gboolean is_associated(const char *ap_address);

// TRUE when the interface has any IPv4 address (SIOCGIFADDR). NULL gives FALSE.
gboolean address_valid(WIFI_INTERFACE *iface);

// Reads the interface's IPv4 address into its `address`, which becomes empty when there is none.
// NULL is ignored.
void get_interface_statistics_data(WIFI_INTERFACE *iface);

// Sets the IPv4 address of `name` to 0.0.0.0, so that the address from the previous network is not
// taken for one from the new network.
void clear_address(const char *name);

// Prints the interface's line of /proc/net/wireless to standard error. Nothing calls it; it helps
// to look into a driver.
void get_network_statics(WIFI_INTERFACE *iface);

#endif
