// SPDX-License-Identifier: MIT
#include "preferred/network_form.h"

#include <cstring>
#include <initializer_list>

#include <glib/gi18n.h>

#include "base/accessible.h"
#include "base/dialogs.h"
#include "base/entries.h"
#include "base/registry.h"
#include "base/shown_key.h"
#include "wifi.h"
#include "wifi_info/debug.h"

// With WPA the form offers neither mode, key state nor key index; the key state is "open".
static void follow_key_mgmt(const network_form &form, gboolean wpa)
{
    set_widget_sensitive(form.mode_container, !wpa);
    set_widget_sensitive(form.wep_container, !wpa);
    choose_form_radio(form.enc[wpa ? ENC_OPEN : ENC_OFF]);
    set_widget_sensitive(form.key_index, !wpa);
    set_widget_sensitive(form.key_hbox, wpa);
}

// "toggled" of WEP and WPA. Each toggle emits two signals; the button that became active emits the
// last one and decides.
static void change_wep_type(GtkWidget *, gpointer)
{
    follow_key_mgmt(add_form, FALSE);
}

static void change_wpa_type(GtkWidget *, gpointer)
{
    follow_key_mgmt(add_form, TRUE);
}

static void change_prefer_wep_type(GtkWidget *, gpointer)
{
    follow_key_mgmt(properties_form, FALSE);
}

static void change_prefer_wpa_type(GtkWidget *, gpointer)
{
    follow_key_mgmt(properties_form, TRUE);
}

const network_form add_form = {
    N_("Add WiFi Network"),
    "add_alias",
    "add_essid",
    "add_wep",
    "add_wpa",
    "mode_container",
    "add_mode_managed",
    "add_mode_ad-hoc",
    "wep_container",
    {"add_enc_off", "add_enc_open", "add_enc_restricted"},
    "add_key_hbox",
    "add_key",
    "add_key_index",
    change_wep_type,
    change_wpa_type,
};

const network_form properties_form = {
    N_("Properties"),
    "properties_alias",
    "properties_essid",
    "properties_add_wep",
    "properties_add_wpa",
    "properties_mode_container",
    "properties_mode_managed",
    "properties_mode_ad-hoc",
    "properties_wep_container",
    {"properties_enc_off", "properties_enc_open", "properties_enc_restricted"},
    "properties_key_hbox",
    "properties_key",
    "properties_key_index",
    change_prefer_wep_type,
    change_prefer_wpa_type,
};

// A label that is the accessible name of `target`.
static GtkWidget *create_label(const char *text, GtkWidget *target)
{
    GtkWidget *label = gtk_label_new(text);

    gtk_label_set_mnemonic_widget(GTK_LABEL(label), target);
    return label;
}

// Attaches one row. Its label names `target`, which is `control` or a widget inside it.
static void attach_row(GtkWidget *table, guint row, const char *text, GtkWidget *control,
                       GtkWidget *target)
{
    GtkWidget *label = create_label(text, target);

    gtk_misc_set_alignment(GTK_MISC(label), 0.0F, 0.5F);
    gtk_table_attach(GTK_TABLE(table), label, 0, 1, row, row + 1, GTK_FILL, GTK_FILL, 5, 5);
    gtk_table_attach(GTK_TABLE(table), control, 1, 2, row, row + 1, EXPAND_FILL, GTK_FILL, 5, 5);
}

static void cb_entered(GtkWidget *entry)
{
    gtk_dialog_response(GTK_DIALOG(gtk_widget_get_toplevel(entry)), GTK_RESPONSE_OK);
}

static GtkWidget *create_entry(const char *key)
{
    GtkWidget *entry = create_text_entry();

    register_named_widget(entry, key);
    g_signal_connect(entry, "activate", G_CALLBACK(cb_entered), nullptr);
    return entry;
}

static GtkWidget *create_box(const char *key)
{
    GtkWidget *box = gtk_hbox_new(FALSE, 5);

    register_named_widget(box, key);
    return box;
}

// Adds a radio button to `box`, in one group with `first` (NULL: a new group, chosen).
static GtkWidget *add_radio(GtkWidget *box, GtkWidget *first, const char *group, const char *text,
                            const char *key)
{
    GtkWidget *radio = gtk_radio_button_new_with_label_from_widget(GTK_RADIO_BUTTON(first), text);

    register_named_widget(radio, key);
    name_in_group(radio, group, text);
    gtk_box_pack_start(GTK_BOX(box), radio, FALSE, FALSE, 0);
    return radio;
}

static GtkWidget *create_encryption_row(const network_form &form)
{
    GtkWidget *box = gtk_hbox_new(FALSE, 5);
    GtkWidget *wep = add_radio(box, nullptr, _("Encryption"), "WEP", form.wep);

    add_radio(box, wep, _("Encryption"), "WPA", form.wpa);
    return box;
}

static GtkWidget *create_mode_row(const network_form &form)
{
    GtkWidget *box = create_box(form.mode_container);
    GtkWidget *managed = add_radio(box, nullptr, _("Mode"), _("Managed"), form.mode_managed);

    add_radio(box, managed, _("Mode"), _("Ad-Hoc"), form.mode_adhoc);
    return box;
}

static GtkWidget *create_key_state_row(const network_form &form)
{
    GtkWidget *box = create_box(form.wep_container);
    GtkWidget *off = add_radio(box, nullptr, _("Key state"), _("off"), form.enc[ENC_OFF]);

    add_radio(box, off, _("Key state"), _("open"), form.enc[ENC_OPEN]);
    add_radio(box, off, _("Key state"), _("restricted"), form.enc[ENC_RESTRICTED]);
    return box;
}

static GtkWidget *create_key_row(const network_form &form)
{
    GtkWidget *box = create_box(form.key_hbox);
    GtkWidget *key = create_entry(form.key);
    GtkWidget *key_index = create_normal_ComboBox();

    gtk_entry_set_visibility(GTK_ENTRY(key), FALSE);
    let_key_be_shown(key);
    register_named_widget(key_index, form.key_index);
    gtk_box_pack_start(GTK_BOX(box), key, TRUE, TRUE, 0);
    gtk_box_pack_start(GTK_BOX(box), create_label(_(" Key index:"), key_index), FALSE, FALSE, 0);
    gtk_box_pack_start(GTK_BOX(box), key_index, FALSE, FALSE, 0);
    gtk_widget_set_sensitive(box, FALSE);
    return box;
}

GtkWidget *create_network_dialog(const network_form &form, GtkWidget *parent)
{
    GtkWidget *dialog = create_dialog(_(form.title), parent, DEFAULT_NONE);
    GtkWidget *frame = create_titled_frame(_("WiFi Network"), 10);
    GtkWidget *table = gtk_table_new(8, 2, FALSE);

    gtk_window_set_policy(GTK_WINDOW(dialog), FALSE, FALSE, TRUE);

    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    gtk_container_add(GTK_CONTAINER(frame), table);
    pack_content(dialog, frame);

    GtkWidget *alias = create_entry(form.alias);
    GtkWidget *essid = create_entry(form.essid);
    GtkWidget *encryption_row = create_encryption_row(form);
    GtkWidget *mode_row = create_mode_row(form);
    GtkWidget *key_state_row = create_key_state_row(form);
    GtkWidget *key_row = create_key_row(form);

    attach_row(table, 0, _("Alias"), alias, alias);
    attach_row(table, 1, _("ESSID"), essid, essid);
    attach_row(table, 2, _("Encryption"), encryption_row, encryption_row);
    attach_row(table, 3, _("Mode"), mode_row, mode_row);
    attach_row(table, 4, _("Key state"), key_state_row, key_state_row);
    attach_row(table, 5, _("Key"), key_row, find_widget(form.key));
    return dialog;
}

// "toggled" of "off", "open" and "restricted": the latter two make the key editable. `user_data` is
// the registry key of the box around the key entry.
static void changed_enc_type(GtkToggleButton *togglebutton, gpointer user_data)
{
    const auto key_hbox = static_cast<const char *>(user_data);

    if (!gtk_toggle_button_get_active(togglebutton))
        return;
    debug_line("user_data:%s", key_hbox);

    const network_form &form =
        strcmp(key_hbox, add_form.key_hbox) == 0 ? add_form : properties_form;
    const GtkWidget *widget = GTK_WIDGET(togglebutton);

    set_widget_sensitive(key_hbox, widget == find_widget(form.enc[ENC_OPEN]) ||
                                       widget == find_widget(form.enc[ENC_RESTRICTED]));
}

void connect_network_form(const network_form &form)
{
    const auto connect = [](const char *key, GCallback handler, const char *data) {
        g_signal_connect(find_widget(key), "toggled", handler, const_cast<char *>(data));
    };

    connect(form.wep, G_CALLBACK(form.change_wep), nullptr);
    connect(form.wpa, G_CALLBACK(form.change_wpa), nullptr);
    for (const char *key : form.enc)
        connect(key, G_CALLBACK(changed_enc_type), form.key_hbox);
}

void set_form_text(const char *key, const gchar *text)
{
    fill_text_entry(find_widget(key), text);
}

void choose_form_radio(const char *key)
{
    GtkWidget *radio = find_widget(key);

    if (radio != nullptr)
        set_active(radio, TRUE);
}

static gboolean radio_chosen(const char *key)
{
    return is_active(find_widget(key));
}

const gchar *form_text(const char *key)
{
    return gtk_entry_get_text(GTK_ENTRY(find_widget(key)));
}

const char *form_key_mgmt(const network_form &form)
{
    return radio_chosen(form.wep) ? "0" : "1";
}

const char *form_mode(const network_form &form)
{
    return radio_chosen(form.mode_adhoc) ? "Ad-Hoc" : "Managed";
}

t_encmode form_enc(const network_form &form)
{
    if (radio_chosen(form.enc[ENC_OFF]))
        return ENC_OFF;
    return radio_chosen(form.enc[ENC_OPEN]) ? ENC_OPEN : ENC_RESTRICTED;
}

gchar *form_key_index(const network_form &form)
{
    return g_strdup_printf("%d",
                           gtk_combo_box_get_active(GTK_COMBO_BOX(find_widget(form.key_index))));
}

gboolean form_has_essid(const network_form &form, GtkWidget *dialog)
{
    if (form_text(form.essid)[0] != '\0')
        return TRUE;
    show_warring_dialog(dialog, _("Please enter the ESSID."));
    return FALSE;
}

gboolean form_has_key(const network_form &form, GtkWidget *dialog)
{
    if (form_text(form.key)[0] != '\0' || !gtk_widget_is_sensitive(find_widget(form.key)))
        return TRUE;
    show_warring_dialog(dialog, _("Please enter the Key."));
    return FALSE;
}
