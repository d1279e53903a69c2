// SPDX-License-Identifier: MIT
// State notices to the desktop shell: text properties of the X11 root window.

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

// Sends "_NET_WIFI_CHANGE_STATUS".
void send_status_to_desktop(desktop_status status);

// Idle job: tells the desktop the program's process id in "_NET_WIFI_STOP_CHECK". FALSE: run once.
gboolean notice_desktop(gpointer data);

#endif
