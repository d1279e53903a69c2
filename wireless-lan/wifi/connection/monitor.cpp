// SPDX-License-Identifier: MIT
#include "connection/monitor.h"

#include <cstring>

#include <glib/gi18n.h>

#include "base/controls.h"
#include "base/desktop.h"
#include "base/dialogs.h"
#include "base/network_list.h"
#include "base/registry.h"
#include "base/state.h"
#include "connection/commands.h"
#include "connection/interface_state.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "wifi_info/interfaces.h"

constexpr int POLL_LIMIT = 21;

void connect_button_sensitive(gboolean flags)
{
    if (flags)
        release_controls(HOLD_CONNECT);
    else
        hold_controls(HOLD_CONNECT);
    get_interface();
    set_widget_sensitive(ACTIVATE_BUTTON,
                         my_wifi->interface_count == 0 && !controls_held(HOLD_REFRESH));
}

// Shows the progress of a chain. During a refresh, and in Ad-Hoc host mode, the list and the title
// belong to those.
static void show_state(const gchar *status, const gchar *title)
{
    if (controls_held(HOLD_REFRESH | HOLD_HOST))
        return;
    review_tree_vanpro(status);
    set_title_label(title);
}

static void show_address()
{
    WIFI_INTERFACE *iface = first_interface();

    get_interface_statistics_data(iface);

    g_autofree gchar *status = connected_state(iface->address);

    show_state(status, _("Wireless network selection"));
}

void give_controls_back()
{
    connect_button_sensitive(TRUE);
    doubleclick = TRUE;
}

// Only says that the connect failed; a device that knows the reason supplies a better text.
static void tell_reason()
{
    g_autofree gchar *reason = device_reason();

    if (reason != nullptr)
        show_warring_dialog(mainwindow, reason);
}

// In Ad-Hoc host mode the device has given itself the address, so a chain of the settings ends
// without a message. A chain that Connect began releases the controls in any case.
static gboolean ends_unseen()
{
    return controls_held(HOLD_HOST) && !controls_held(HOLD_CONNECT);
}

gboolean detect_network_interface_state(gpointer)
{
    static int count = 0; // shared by all chains

    debug_line("detect_network_interface_state ...");
    if (address_valid(first_interface())) {
        count = 0;
        debug_line("acquire address successed.");
        if (ends_unseen())
            return FALSE;
        send_status_to_desktop(STATUS_CONNECTED);
        show_address();
        set_connect_label(GTK_STOCK_DISCONNECT);
        give_controls_back();
        return FALSE;
    }
    if (++count < POLL_LIMIT)
        return TRUE;
    count = 0;
    if (ends_unseen())
        return FALSE;

    debug_line("acquire address failed.");
    show_state(_("Connected\nIP address invalid"), _("Wireless network selection"));

    const WIFI_CELL *selected = scanned_cell(my_wifi->cell_index);

    if (selected != nullptr && is_associated(selected->address))
        set_connect_label(GTK_STOCK_DISCONNECT);
    give_controls_back();
    tell_reason();
    return FALSE;
}

static void acquire_address()
{
    linkconnect = TRUE;
    send_status_to_desktop(STATUS_ASSOCIATED);
    debug_line("link connected,then we will require ip address.");
    show_state(_("Connected\nAcquire IP address..."), _("Connected\nAcquire IP address..."));
    require_ip_address();
    g_timeout_add(POLL_MS, detect_network_interface_state, nullptr);
}

static void give_up_link()
{
    linkconnect = FALSE;
    send_status_to_desktop(STATUS_DISCONNECTED);
    debug_line("Not connect,return.");
    // This title alone is never translated.
    show_state(_("Not Connect"), "Wireless network selection");

    WIFI_CELL *cell = scanned_cell(connect_index);

    if (cell != nullptr)
        cell->linkstate = 2;
    // doubleclick is unchanged: after a failure only the button connects again.
    connect_button_sensitive(TRUE);
    tell_reason();
}

gboolean detect_network_link_state(gpointer)
{
    static int link_count = 0; // shared by all chains

    get_ap_mac();
    if (is_associated(Link_AP_MAC)) {
        acquire_address();
        link_count = 0;
        return FALSE;
    }
    debug_line("AP MAC[%s]:Disconnected", Link_AP_MAC);
    if (++link_count < POLL_LIMIT)
        return TRUE;
    link_count = 0;
    give_up_link();
    return FALSE;
}
