// SPDX-License-Identifier: MIT
// Notices to the desktop shell, as text properties of the X11 root window.

#ifndef WIFI_BASE_DESKTOP_H
#define WIFI_BASE_DESKTOP_H

#include <glib.h>

// Values of "_NET_WIFI_CHANGE_STATUS".
enum desktop_status : int {
    STATUS_DISCONNECTED = 2,
    STATUS_ASSOCIATED = 3, // or hosting an Ad-Hoc network
    STATUS_CONNECTED = 4,
    STATUS_SCANNING = 5
};

// Sets "_NET_WIFI_CHANGE_STATUS".
void send_status_to_desktop(desktop_status status);

// Idle callback: publishes the process id in "_NET_WIFI_STOP_CHECK". Always FALSE.
gboolean notice_desktop(gpointer data);

#endif
