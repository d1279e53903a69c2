// SPDX-License-Identifier: MIT
// The form that the dialogs for adding and editing a preferred network share.

#ifndef WIFI_PREFERRED_NETWORK_FORM_H
#define WIFI_PREFERRED_NETWORK_FORM_H

#include <gtk/gtk.h>

#include "wifi.h"

typedef void (*toggle_handler)(GtkWidget *widget, gpointer data);

// What differs between the two forms: the title, the registry keys of the widgets and the handlers
// of WEP and WPA.
struct network_form {
    const char *title;
    const char *alias;
    const char *essid;
    const char *wep;
    const char *wpa;
    const char *mode_container;
    const char *mode_managed;
    const char *mode_adhoc;
    const char *wep_container;
    const char *enc[3]; // indexed by t_encmode
    const char *key_hbox;
    const char *key;
    const char *key_index;
    toggle_handler change_wep;
    toggle_handler change_wpa;
};

extern const network_form add_form;
extern const network_form properties_form;

// Builds the dialog of a form over `parent` (may be NULL) and registers its widgets. Initial state:
// empty, WEP, "Managed", "off". The caller fills the form, connects it, and shows, runs and
// destroys the dialog.
GtkWidget *create_network_dialog(const network_form &form, GtkWidget *parent);

// Connects the handlers of the radio buttons. Call it when the form is complete: the handlers find
// each other's widgets by key.
void connect_network_form(const network_form &form);

// Fill an entry, or activate a radio button, by its key.
void set_form_text(const char *key, const gchar *text);
void choose_form_radio(const char *key);

// What the user entered or chose. An entry owns its text.
const gchar *form_text(const char *key);
const char *form_key_mgmt(const network_form &form); // "0": WEP, "1": WPA
const char *form_mode(const network_form &form);     // "Managed" or "Ad-Hoc"
t_encmode form_enc(const network_form &form);
gchar *form_key_index(const network_form &form); // from "0"; g_free it

// TRUE when there is a text. Otherwise a message says what to enter. The key may be empty while its
// entry is insensitive.
gboolean form_has_essid(const network_form &form, GtkWidget *dialog);
gboolean form_has_key(const network_form &form, GtkWidget *dialog);

#endif
