// SPDX-License-Identifier: MIT
#include "window/refresh.h"

#include <cstdio>
#include <cstring>

#include <glib/gi18n.h>
#ifdef HAVE_MALLOC_TRIM
#include <malloc.h>
#endif

#include "base/controls.h"
#include "base/desktop.h"
#include "base/dialogs.h"
#include "base/network_list.h"
#include "base/registry.h"
#include "base/state.h"
#include "connection/interface_state.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/scan.h"
#include "wifi_info/text.h"

// Long enough to draw "Searching..." before the scan blocks the window.
constexpr guint SCAN_DELAY_MS = 100;

static void show_no_device()
{
    set_title_label(_("No Wireless Device"));
    show_warring_dialog(mainwindow, _("No Wireless Device"));
    debug_line("No interface");
}

// Sets connect_index to the last network whose access point is the current one, and `status` to its
// text in the list.
static void match_access_point(const WIFI_INTERFACE *iface, char *status, gsize size)
{
    connect_index = -1;
    g_strstrip(Link_AP_MAC);
    for (int i = 0; i < my_wifi->cell_count; i++) {
        WIFI_CELL *cell = my_wifi->wifi_cell[i];

        cell->linkstate = 2;
        if (strcmp(Link_AP_MAC, cell->address) != 0)
            continue;
        debug_line("Match_AP_MAC:%s,address:%s", Link_AP_MAC, cell->address);
        cell->linkstate = 1;
        connect_index = i;

        g_autofree gchar *text = iface->address[0] == '\0'
                                     ? g_strdup(_("Connected\nIP address invalid"))
                                     : connected_state(iface->address);

        copy_field(status, size, text);
        debug_line("connect_index[%d] BUFFER:%s", connect_index, status);

        g_autofree gchar *essid = printable(cell->essid);

        fprintf(stderr, "%smatched connect info:state [%d],essid:[%s]", DEBUG_PREFIX,
                cell->linkstate, essid);
    }
    if (connect_index == -1)
        copy_field(status, size, _("Disconnect"));
}

// What the start and the scan have freed goes back to the system once the list is drawn.
static gboolean cb_drawn(gpointer)
{
#ifdef HAVE_MALLOC_TRIM
    malloc_trim(0);
#endif
    return FALSE;
}

// One-shot timer: scans and fills the list. Always FALSE.
static gboolean cb_refresh(gpointer)
{
    WIFI_INTERFACE *iface = first_interface();
    char status[STATUS_TEXT_SIZE] = "";

    // The settings dialog has switched to hosting in the meantime: nothing is scanned.
    if (controls_held(HOLD_HOST)) {
        release_controls(HOLD_REFRESH);
        return FALSE;
    }
    if (iface == nullptr) {
        release_controls(HOLD_REFRESH);
        show_no_device();
        return FALSE;
    }
    send_status_to_desktop(STATUS_SCANNING);
    get_cell(iface);
    release_controls(HOLD_REFRESH | HOLD_CONNECT);
    set_widget_sensitive(ACTIVATE_BUTTON, FALSE);
    my_wifi->cell_index = -1;
    if (my_wifi->cell_count < 1) {
        set_title_label(_("No Network"));

        g_autofree gchar *reason = device_reason();

        show_explained_warning(mainwindow, _("No Network"), reason);
        set_title_label(_("Wireless network selection"));
        return FALSE;
    }

    get_ap_mac();
    get_interface_statistics_data(iface);
    match_access_point(iface, status, sizeof status);
    review_tree_vanpro(status);
    set_title_label(_("Wireless network selection"));
    g_idle_add_full(G_PRIORITY_LOW, cb_drawn, nullptr, nullptr);
    return FALSE;
}

gboolean cb_refresh_network(GtkWidget *, gpointer)
{
    debug_line("Searching...");
    if (first_interface() != nullptr && first_interface()->wifi_group_enable) {
        hold_controls(HOLD_HOST);
        set_title_label(_("Ad-Hoc Host Mode"));
        return FALSE;
    }

    set_title_label(_("Searching..."));
    get_interface();
    printf("my_wifi->interface_count = %d\n", my_wifi->interface_count);
    if (my_wifi->interface_count < 1) {
        show_no_device();
        return FALSE;
    }

    clear_network_list();
    release_controls(HOLD_HOST);
    hold_controls(HOLD_REFRESH);
    set_widget_sensitive(ACTIVATE_BUTTON, FALSE);
    g_timeout_add(SCAN_DELAY_MS, cb_refresh, nullptr);
    return FALSE;
}
