// The dialog that asks for key, key management and key index of an encrypted network.

#ifndef WIFI_CONNECTION_ENCRYPTED_DIALOG_H
#define WIFI_CONNECTION_ENCRYPTED_DIALOG_H

#include <gtk/gtk.h>

extern gchar *sel_key; // key of the preferred network that was pre-filled, or NULL; flow takes it

// Builds the dialog for the network at connect_index; `match_count` gets the number of preferred
// networks of its name. The caller runs and destroys it.
GtkWidget *build_encrypted_dialog(int *match_count);

GtkWidget *create_Authentication_ComboBox();
GtkWidget *create_Key_Index_ComboBox();
GtkWidget *create_ComboBox(int *n);
void cb_key_index_stat(GtkWidget *combobox, gpointer data);
void cb_change_network(GtkWidget *combobox, gpointer data);
gboolean connect_key_cb(GdkEventKey *key_event);

#endif
