// SPDX-License-Identifier: MIT
// The dialog that asks for the key, key management and key index of an encrypted network.

#ifndef WIFI_CONNECTION_ENCRYPTED_DIALOG_H
#define WIFI_CONNECTION_ENCRYPTED_DIALOG_H

#include <gtk/gtk.h>

#include "wifi.h"

// Builds the dialog for the network at connect_index. `match_count` becomes the number of preferred
// networks with its name; it is unchanged when the preferred lists are missing. The caller runs and
// destroys the dialog.
GtkWidget *create_encrypted_dialog(int *match_count);

// Copies the answers of the dialog (key, key management, key index) to `chosen` and sets its
// encryption to ENC_OPEN. A field without its control is unchanged.
void read_answers(WIFI_CELL *chosen);

// FALSE when the answers in `chosen` are those of the preferred network that was filled in.
gboolean is_new_configuration(const WIFI_CELL *chosen, int match_count);

// Wipes the stored key; call it once the dialog is answered.
void forget_stored_key();

// The three combos of the dialog, filled from the preferred networks with its name. Without the
// preferred lists each is the invalid widget 1.
GtkWidget *create_Authentication_ComboBox();
GtkWidget *create_Key_Index_ComboBox();
GtkWidget *create_ComboBox(int *n);

#endif
