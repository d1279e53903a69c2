// SPDX-License-Identifier: MIT
#include "settings/wlan_dialog.h"

#include <initializer_list>

#include <glib/gi18n.h>

#include "base/dialogs.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/work_area.h"
#include "settings/adhoc_dialog.h"
#include "settings/apply.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/text.h"

static GtkTooltips *tooltips = nullptr; // shared by all openings of the dialog

// The texts of the address rows, in the order of address_settings.
static const struct {
    const char *label;
    const char *tooltip;
} ADDRESS_TEXTS[] = {
    {N_("Address"), N_("Enter your IP address here, e.g. 192.168.1.2")},
    {N_("Netmask"), N_("Enter your netmask here, e.g. 255.255.255.0")},
    {N_("Broadcast"), N_("Enter your broadcast address here, usually the same like your IP with "
                         "255 as last number.")},
    {N_("Gateway"), N_("Enter the IP Address of your default gateway here.")},
};
static_assert(G_N_ELEMENTS(ADDRESS_TEXTS) == G_N_ELEMENTS(address_settings));

static void set_setting_sensitive(const char *prefix, const gchar *iface_name, gboolean sensitive)
{
    g_autofree gchar *key = settings_key(prefix, iface_name);

    set_widget_sensitive(key, sensitive);
}

static void static_entry_status(gboolean flag, const gchar *iface_name)
{
    for (const address_setting &setting : address_settings)
        set_setting_sensitive(setting.prefix, iface_name, flag);
}

// This works on the selected interface, but the dialog shows the first one. With another one
// selected it finds none of the dialog's widgets.
static void changed_address_type(GtkToggleButton *togglebutton, gpointer)
{
    const int index = my_wifi->interface_index;

    if (index < 0 || index >= MAX_INTERFACES || my_wifi->wifi_interface[index] == nullptr)
        return;
    if (!gtk_toggle_button_get_active(togglebutton))
        return;

    WIFI_INTERFACE *iface = my_wifi->wifi_interface[index];
    GtkWidget *chosen = GTK_WIDGET(togglebutton);

    if (chosen == find_settings_widget("static", iface->name)) {
        iface->isstatic = TRUE;
        iface->isdhcp = FALSE;
        set_setting_sensitive("auto_dns", iface->name, FALSE);
    } else if (chosen == find_settings_widget("dhcp", iface->name)) {
        GtkWidget *auto_dns = find_settings_widget("auto_dns", iface->name);

        iface->isdhcp = TRUE;
        iface->isstatic = FALSE;
        set_setting_sensitive("auto_dns", iface->name, TRUE);
        if (auto_dns != nullptr)
            set_active(auto_dns, TRUE);
    }
    static_entry_status(iface->isstatic, iface->name);
}

static void register_setting(GtkWidget *widget, const char *prefix, const WIFI_INTERFACE *iface)
{
    g_autofree gchar *key = settings_key(prefix, iface->name);

    register_named_widget(widget, key);
}

static GtkWidget *create_type_radio(const WIFI_INTERFACE *iface, GSList *group, const char *prefix,
                                    const char *label)
{
    GtkWidget *radio = gtk_radio_button_new_with_label(group, label);
    g_autofree gchar *key = settings_key(prefix, iface->name);

    register_named_widget(radio, key);
    // The registry holds a reference until the button is destroyed or its key is reused.
    g_object_set_data_full(G_OBJECT(mainwindow), key, g_object_ref(radio), g_object_unref);
    return radio;
}

static GtkWidget *create_type_radios(const WIFI_INTERFACE *iface)
{
    GtkWidget *box = gtk_vbox_new(TRUE, 0);
    GtkWidget *dhcp = create_type_radio(iface, nullptr, "dhcp", _("dhcp"));
    GtkWidget *fixed = create_type_radio(iface, gtk_radio_button_get_group(GTK_RADIO_BUTTON(dhcp)),
                                         "static", _("static"));

    // A radio button can only be switched off by another one of its group, so both must exist.
    set_active(dhcp, iface->isdhcp);
    set_active(fixed, iface->isstatic);
    for (GtkWidget *radio : {dhcp, fixed}) {
        g_signal_connect(radio, "toggled", G_CALLBACK(changed_address_type), nullptr);
        gtk_box_pack_start(GTK_BOX(box), radio, TRUE, TRUE, 0);
    }
    return box;
}

static void create_propt_editable_entry(const WIFI_INTERFACE *iface, GtkWidget *attach_to,
                                        guint index, guint clnr, guint hspacing, gboolean settext)
{
    const address_setting &setting = address_settings[index];
    const guint padding = static_cast<guint>(boxspacing);
    GtkWidget *label = gtk_label_new(_(ADDRESS_TEXTS[index].label));
    GtkWidget *entry = gtk_entry_new();
    g_autofree gchar *key = settings_key(setting.prefix, iface->name);

    register_widget(entry, key);
    gtk_widget_set_name(entry, setting.prefix);
    if (settext) {
        g_autofree gchar *text = displayable(*setting.text);

        gtk_entry_set_text(GTK_ENTRY(entry), text);
        gtk_editable_set_editable(GTK_EDITABLE(entry), TRUE);
    }
    gtk_misc_set_alignment(GTK_MISC(label), 0, 0.5);
    gtk_label_set_mnemonic_widget(GTK_LABEL(label), entry);
    for (GtkWidget *widget : {label, entry})
        gtk_tooltips_set_tip(tooltips, widget, _(ADDRESS_TEXTS[index].tooltip), nullptr);
    gtk_table_attach(GTK_TABLE(attach_to), label, 0, 1, clnr, clnr + 1, GTK_FILL, GTK_FILL, padding,
                     hspacing);
    gtk_table_attach(GTK_TABLE(attach_to), entry, 1, 2, clnr, clnr + 1, EXPAND_FILL, EXPAND_FILL,
                     padding, hspacing);
}

static GtkWidget *create_auto_dns(const WIFI_INTERFACE *iface)
{
    GtkWidget *check = gtk_check_button_new_with_label(_("Auto DNS"));

    register_setting(check, "auto_dns", iface);
    if (iface->isdhcp)
        set_active(check, iface->auto_dns);
    else
        gtk_widget_set_sensitive(check, FALSE);
    return check;
}

static GtkWidget *create_network_widgets(WIFI_INTERFACE *iface)
{
    GtkWidget *table = gtk_table_new(16, 2, FALSE);
    GtkWidget *host = gtk_check_button_new_with_label(_("Ad-Hoc Host"));
    GtkWidget *preferences = gtk_button_new_from_stock(GTK_STOCK_PREFERENCES);
    guint row = 1; // row 0 stays empty

    gtk_table_set_col_spacings(GTK_TABLE(table), 5);
    gtk_table_set_row_spacings(GTK_TABLE(table), 5);
    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    if (tooltips == nullptr)
        tooltips = static_cast<GtkTooltips *>(g_object_ref_sink(gtk_tooltips_new()));

    gtk_table_attach(GTK_TABLE(table), create_type_radios(iface), 0, 2, row, row + 1, GTK_FILL,
                     GTK_FILL, 0, 0);
    for (guint i = 0; i < G_N_ELEMENTS(address_settings); i++)
        create_propt_editable_entry(iface, table, i, ++row, static_cast<guint>(boxspacing),
                                    iface->isstatic);
    static_entry_status(iface->isstatic, iface->name);
    row++;
    gtk_table_attach(GTK_TABLE(table), create_auto_dns(iface), 0, 2, row, row + 1, GTK_FILL,
                     GTK_FILL, 5, 5);
    row++;
    register_setting(host, "adhoc-host", iface);
    set_active(host, iface->wifi_group_enable);
    gtk_widget_set_sensitive(preferences, iface->wifi_group_enable);
    g_signal_connect(preferences, "clicked", G_CALLBACK(cb_adhoc_setup), &iface->wifi_group);
    g_signal_connect(host, "toggled", G_CALLBACK(cb_active_wifi_group), preferences);
    gtk_table_attach(GTK_TABLE(table), host, 0, 1, row, row + 1, GTK_FILL, GTK_FILL, 5, 5);
    gtk_table_attach(GTK_TABLE(table), preferences, 1, 2, row, row + 1, GTK_FILL, GTK_FILL, 5, 5);
    return table;
}

static GtkWidget *create_settings_dialog(WIFI_INTERFACE *iface)
{
    GtkWidget *dialog = create_dialog(_("WLAN Setting"), mainwindow, DEFAULT_CANCEL);
    GtkWidget *content = create_network_widgets(iface);

    gtk_window_set_modal(GTK_WINDOW(dialog), TRUE);
    gtk_window_set_default_size(GTK_WINDOW(dialog), 360, 320);
    gtk_container_set_border_width(GTK_CONTAINER(content), 5);
    pack_content(dialog, content);
    show_dialog(dialog);
    return dialog;
}

void cb_wifi_settings(GtkWidget *, gpointer)
{
    get_interface();
    if (my_wifi->interface_count < 1) {
        show_warring_dialog(mainwindow, _("No Wireless Device"));
        debug_line("No interface");
        return;
    }
    load_settings();

    GtkWidget *dialog = begin_dialog(create_settings_dialog(first_interface()));

    // A refused value keeps the dialog open, unless it went away with the main window.
    while (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK &&
           Save_Basic_Setting(dialog) == 0 && mainwindow != nullptr) {
    }
    end_dialog(dialog);
}
