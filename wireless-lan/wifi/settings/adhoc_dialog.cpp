// SPDX-License-Identifier: MIT
#include "settings/adhoc_dialog.h"

#include <cstdio>
#include <cstring>

#include <glib/gi18n.h>

#include "base/dialogs.h"
#include "base/entries.h"
#include "base/work_area.h"
#include "wifi.h"
#include "wifi_info/text.h"

// Only the ESSID is shown. The other widgets are never placed: they carry encryption and key from
// the record to OK, which stores them again.
struct group_form {
    GtkWidget *essid;
    GtkWidget *key;
    GtkWidget *rbt_off;
    GtkWidget *rbt_open;
    GtkWidget *rbt_res;
    GtkWidget *unplaced[4];
};

void active_key_entry(GtkToggleButton *togglebutton, gpointer user_data)
{
    gtk_widget_set_sensitive(GTK_WIDGET(user_data), !gtk_toggle_button_get_active(togglebutton));
}

void cb_active_wifi_group(GtkToggleButton *togglebutton, gpointer user_data)
{
    gtk_widget_set_sensitive(GTK_WIDGET(user_data), gtk_toggle_button_get_active(togglebutton));
}

static GtkWidget *create_entry(const char *text)
{
    GtkWidget *entry = create_text_entry();

    gtk_editable_set_editable(GTK_EDITABLE(entry), TRUE);
    fill_text_entry(entry, text);
    return entry;
}

// Stores an entry in the field that it was filled from. An unchanged entry leaves the field alone,
// whose bytes need not be UTF-8.
static void take_entry(GtkWidget *entry, char *field, gsize size)
{
    const gchar *text = gtk_entry_get_text(GTK_ENTRY(entry));
    g_autofree gchar *shown = displayable(field);

    if (strcmp(text, shown) != 0)
        copy_field(field, size, text);
}

static gboolean is_empty(GtkWidget *entry)
{
    return gtk_entry_get_text_length(GTK_ENTRY(entry)) == 0;
}

static GtkWidget *create_radio(GtkWidget *box, GSList *group, const char *label)
{
    GtkWidget *radio = gtk_radio_button_new_with_label(group, label);

    gtk_box_pack_start(GTK_BOX(box), radio, FALSE, FALSE, 0);
    return radio;
}

static GSList *radio_group(GtkWidget *radio)
{
    return gtk_radio_button_get_group(GTK_RADIO_BUTTON(radio));
}

static GtkWidget *unplaced(GtkWidget *widget)
{
    return static_cast<GtkWidget *>(g_object_ref_sink(widget));
}

static void create_unplaced(group_form *form, const WIFI_CELL *group_info)
{
    GtkWidget *box = gtk_hbox_new(FALSE, 0);

    form->key = create_entry(group_info->userkey);
    gtk_entry_set_visibility(GTK_ENTRY(form->key), FALSE);
    gtk_widget_set_sensitive(form->key, group_info->encmode != ENC_OFF);

    form->rbt_off = create_radio(box, nullptr, _("off"));
    form->rbt_open = create_radio(box, radio_group(form->rbt_off), _("open"));
    form->rbt_res = create_radio(box, radio_group(form->rbt_off), _("restricted"));
    set_active(form->rbt_off, group_info->encmode == ENC_OFF);
    set_active(form->rbt_open, group_info->encmode == ENC_OPEN);
    set_active(form->rbt_res, group_info->encmode == ENC_RESTRICTED);
    g_signal_connect(form->rbt_off, "toggled", G_CALLBACK(active_key_entry), form->key);

    form->unplaced[0] = unplaced(gtk_label_new(_("Key")));
    form->unplaced[1] = unplaced(form->key);
    form->unplaced[2] = unplaced(gtk_label_new(_("WEP")));
    form->unplaced[3] = unplaced(box);
}

static GtkWidget *create_essid_row(group_form *form, const WIFI_CELL *group_info)
{
    GtkWidget *frame = create_titled_frame(_("Ad-Hoc Information"), 10);
    GtkWidget *table = gtk_table_new(8, 2, FALSE);
    GtkWidget *label = gtk_label_new(_("ESSID"));

    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    gtk_container_add(GTK_CONTAINER(frame), table);

    form->essid = create_entry(group_info->essid);
    gtk_misc_set_alignment(GTK_MISC(label), 1.0, 0.5);
    gtk_label_set_mnemonic_widget(GTK_LABEL(label), form->essid);
    gtk_table_attach(GTK_TABLE(table), label, 0, 1, 0, 1, EXPAND_FILL, EXPAND_FILL, 5, 5);
    gtk_table_attach(GTK_TABLE(table), form->essid, 1, 2, 0, 1, GTK_FILL, GTK_FILL, 5, 5);
    return frame;
}

static GtkWidget *create_group_dialog()
{
    GtkWidget *dialog = create_dialog(_("Ad-Hoc Information"), nullptr, DEFAULT_NONE);

    gtk_window_set_policy(GTK_WINDOW(dialog), FALSE, FALSE, TRUE);
    // Without a parent nothing else keeps it above the settings dialog, which is blocked while it
    // runs.
    gtk_window_set_keep_above(GTK_WINDOW(dialog), TRUE);
    return dialog;
}

// Stores the form. What is stored before a value is refused stays. FALSE: run the dialog again.
static gboolean store_group(GtkWidget *dialog, const group_form *form, WIFI_CELL *group_info)
{
    if (is_empty(form->essid)) {
        show_warring_dialog(dialog, _("Please enter the ESSID."));
        return FALSE;
    }
    take_entry(form->essid, group_info->essid, sizeof group_info->essid);
    group_info->encmode = is_active(form->rbt_off)    ? ENC_OFF
                          : is_active(form->rbt_open) ? ENC_OPEN
                                                      : ENC_RESTRICTED;
    printf("group_info->encmode=%d\r\n", static_cast<int>(group_info->encmode));
    if (group_info->encmode != ENC_OFF) {
        if (is_empty(form->key)) {
            show_warring_dialog(dialog, _("Please enter the Key."));
            return FALSE;
        }
        take_entry(form->key, group_info->userkey, sizeof group_info->userkey);
    }
    copy_field(group_info->mode, sizeof group_info->mode, "Ad-Hoc");
    return TRUE;
}

static void cb_entered(GtkEntry *, gpointer dialog)
{
    gtk_dialog_response(GTK_DIALOG(dialog), GTK_RESPONSE_OK);
}

void cb_adhoc_setup(GtkWidget *, gpointer user_data)
{
    WIFI_CELL *group_info = static_cast<WIFI_CELL *>(user_data);
    GtkWidget *dialog = begin_dialog(create_group_dialog());
    group_form form;

    create_unplaced(&form, group_info);
    pack_content(dialog, create_essid_row(&form, group_info));
    g_signal_connect(form.essid, "activate", G_CALLBACK(cb_entered), dialog);
    show_dialog(dialog);
    while (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK &&
           !store_group(dialog, &form, group_info)) {
    }
    end_dialog(dialog);
    for (GtkWidget *widget : form.unplaced) {
        gtk_widget_destroy(widget);
        g_object_unref(widget);
    }
}
