#include "connection/monitor.h"

#include <cstring>

#include <glib/gi18n.h>

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
    set_widgets_sensitive(CONNECT_CONTROLS, flags);
    get_interface();
    set_widget_sensitive(ACTIVATE_BUTTON, my_wifi->interface_count == 0);
}

static void show_address()
{
    WIFI_INTERFACE *iface = first_interface();

    get_interface_statistics_data(iface);

    g_autofree gchar *status = connected_state(iface->address);

    review_tree_vanpro(status);
}

void give_controls_back()
{
    connect_button_sensitive(TRUE);
    doubleclick = TRUE;
}

// The status text says that a connect has failed; a device that knows why has a word of its own.
static void tell_reason()
{
    g_autofree gchar *reason = device_reason();

    if (reason != nullptr)
        show_warring_dialog(mainwindow, reason);
}

gboolean detect_network_interface_state(gpointer)
{
    static int count = 0; // shared by all chains
    const WIFI_INTERFACE *iface = first_interface();

    debug_line("detect_network_interface_state ...");
    if (address_valid(first_interface())) {
        count = 0;
        debug_line("acquire address successed.");
        send_status_to_desktop(STATUS_CONNECTED);
        set_title_label(_("Wireless network selection"));
        show_address();
        set_connect_label(GTK_STOCK_DISCONNECT);
        give_controls_back();
        return FALSE;
    }
    if (++count < POLL_LIMIT)
        return TRUE;
    count = 0;
    // The host of an Ad-Hoc network has the address it gave itself.
    if (iface != nullptr && iface->wifi_group_enable)
        return FALSE;

    debug_line("acquire address failed.");
    review_tree_vanpro(_("Connected\nIP address invalid"));
    set_title_label(_("Wireless network selection"));

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
    review_tree_vanpro(_("Connected\nAcquire IP address..."));
    set_title_label(_("Connected\nAcquire IP address..."));
    require_ip_address();
    g_timeout_add(POLL_MS, detect_network_interface_state, nullptr);
}

static void give_up_link()
{
    linkconnect = FALSE;
    send_status_to_desktop(STATUS_DISCONNECTED);
    debug_line("Not connect,return.");
    review_tree_vanpro(_("Not Connect"));

    WIFI_CELL *cell = scanned_cell(connect_index);

    if (cell != nullptr)
        cell->linkstate = 2;
    // In English whatever the language, so that a failed connect can be told from the idle title.
    set_title_label("Wireless network selection");
    // doubleclick stays as it is: after a failure only the button connects again.
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
