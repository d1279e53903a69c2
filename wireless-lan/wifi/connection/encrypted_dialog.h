// SPDX-License-Identifier: MIT
// The dialog that asks for key, key management and key index of an encrypted network.

#ifndef WIFI_CONNECTION_ENCRYPTED_DIALOG_H
#define WIFI_CONNECTION_ENCRYPTED_DIALOG_H

#include <gtk/gtk.h>

#include "wifi.h"

// Builds the dialog for the network at connect_index; `match_count` gets the number of preferred
// networks of its name and stays as it is when the preferred lists are missing. The caller runs and
// destroys it.
GtkWidget *create_encrypted_dialog(int *match_count);

// Copies the key, key management and key index of the dialog into `chosen`, whose encryption
// becomes ENC_OPEN. Without the dialog's controls their fields stay.
void read_answers(WIFI_CELL *chosen);

// TRUE unless the answers in `chosen` repeat the preferred network that was filled in.
gboolean is_new_configuration(const WIFI_CELL *chosen, int match_count);

// Forgets the stored key that was filled in; called once the dialog is answered.
void forget_stored_key();

// The three combos of the dialog, filled from the preferred networks of its name. Without the
// preferred lists the result is the invalid widget 1.
GtkWidget *create_Authentication_ComboBox();
GtkWidget *create_Key_Index_ComboBox();
GtkWidget *create_ComboBox(int *n);

#endif
