// SPDX-License-Identifier: MIT
#include "settings/apply.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstdio>

#include <glib/gi18n.h>

#include "base/controls.h"
#include "base/desktop.h"
#include "base/dialogs.h"
#include "base/network_list.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/unread_file.h"
#include "connection/commands.h"
#include "connection/interface_state.h"
#include "connection/monitor.h"
#include "wifi.h"
#include "wifi_info/basic_settings.h"
#include "wifi_info/debug.h"
#include "wifi_info/shell.h"
#include "wifi_info/text.h"

// The time that the interface needs to take the new settings.
constexpr guint FOLLOW_MS = 4000;

const address_setting address_settings[4] = {
    {"address", &static_address, &WIFI_INTERFACE::address},
    {"netmask", &static_netmask, &WIFI_INTERFACE::netmask},
    {"broadcast", &static_broadcast, &WIFI_INTERFACE::broadcast},
    {"gateway", &static_gateway, &WIFI_INTERFACE::gateway},
};

gchar *settings_key(const char *prefix, const char *iface_name)
{
    return g_strconcat(prefix, iface_name, nullptr);
}

GtkWidget *find_settings_widget(const char *prefix, const char *iface_name)
{
    g_autofree gchar *key = settings_key(prefix, iface_name);

    return find_widget(key);
}

gboolean address_is_valid(const gchar *ip)
{
    in_addr address;

    if (ip == nullptr)
        return FALSE;
    errno = EINVAL; // inet_pton sets none for a malformed address
    if (inet_pton(AF_INET, ip, &address) == 1)
        return TRUE;
    perror("inet_pton");
    return FALSE;
}

static gboolean take_static_addresses(GtkWidget *dialog, WIFI_INTERFACE *iface)
{
    for (const address_setting &setting : address_settings) {
        GtkWidget *entry = find_settings_widget(setting.prefix, iface->name);

        if (entry == nullptr)
            continue;

        const gchar *text = gtk_entry_get_text(GTK_ENTRY(entry));

        if (!address_is_valid(text)) {
            gtk_widget_grab_focus(entry); // the message does not name the value
            show_message_box(dialog, _("Settings invalid"));
            return FALSE;
        }
        copy_field(*setting.text, sizeof *setting.text, text);
        copy_field(iface->*setting.field, sizeof(iface->*setting.field), text);
    }
    return TRUE;
}

static void take_check_state(const char *prefix, const WIFI_INTERFACE *iface, gboolean *state)
{
    GtkWidget *check = find_settings_widget(prefix, iface->name);

    if (check != nullptr)
        *state = is_active(check);
}

static void enter_host_mode(const WIFI_INTERFACE *iface)
{
    if (!host_network(iface))
        show_warring_dialog(mainwindow,
                            _("The name and the key cannot be left in /tmp for the device.\n"
                              "The network is not set up."));
    hold_controls(HOLD_HOST);
    set_title_label(_("Ad-Hoc Host Mode"));
    send_status_to_desktop(STATUS_ASSOCIATED);
}

// FALSE when the interface is not associated and needs no address.
static gboolean enter_selection_mode()
{
    release_controls(HOLD_HOST);
    set_title_label(_("Wireless network selection"));
    send_status_to_desktop(STATUS_DISCONNECTED);
    if (my_wifi->cell_count < 1)
        return FALSE;

    get_ap_mac();
    if (!is_associated(Link_AP_MAC)) {
        debug_line("Current state:Disconnected");
        return FALSE;
    }
    review_tree_vanpro(_("Connected\nAcquire IP address..."));
    set_title_label(_("Wireless network selection"));
    g_timeout_add(FOLLOW_MS, detect_network_interface_state, nullptr);
    return TRUE;
}

static gboolean file_is_unread = FALSE; // it could not be read whole and has not been replaced yet

void load_settings()
{
    file_is_unread = !get_basic_setting_from_file(SETTINGS_FILE);
}

// FALSE when they could not be written. A user who keeps the old file has decided so: TRUE.
static gboolean write_settings(GtkWidget *dialog)
{
    const unread_answer answer =
        file_is_unread ? ask_to_replace(dialog, SETTINGS_FILE) : UNREAD_REPLACE;

    if (answer == UNREAD_REPLACE)
        file_is_unread = FALSE;
    return answer == UNREAD_LEAVE ||
           (answer == UNREAD_REPLACE && save_basic_setting_to_file(SETTINGS_FILE));
}

int Save_Basic_Setting(GtkWidget *dialog)
{
    WIFI_INTERFACE *iface = first_interface();

    if (iface == nullptr)
        return 1;
    if (iface->isstatic && !take_static_addresses(dialog, iface))
        return 0;
    take_check_state("auto_dns", iface, &iface->auto_dns);
    take_check_state("adhoc-host", iface, &iface->wifi_group_enable);

    // Settings that are not stored are applied all the same and last until the device is switched
    // off.
    if (!interface_usable(iface->name, "saving the settings") || !write_settings(dialog))
        show_message_box(dialog, _("The settings could not be saved."));

    if (iface->wifi_group_enable)
        enter_host_mode(iface);
    else if (!enter_selection_mode())
        return 1;
    require_ip_address();
    return 1;
}
