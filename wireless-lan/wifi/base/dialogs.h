// SPDX-License-Identifier: MIT
// Message boxes, and what several dialogs build alike.

#ifndef WIFI_BASE_DIALOGS_H
#define WIFI_BASE_DIALOGS_H

#include <gtk/gtk.h>

constexpr auto EXPAND_FILL = static_cast<GtkAttachOptions>(GTK_EXPAND | GTK_FILL);

// Runs a modal information box with one OK button over `parent` (may be NULL) until it is answered.
void show_message_box(GtkWidget *parent, const gchar *message);

// The same with one Close button.
void show_warring_dialog(GtkWidget *parent, const gchar *message);

// The same with a second, smaller text below the first; NULL: none.
void show_explained_warning(GtkWidget *parent, const gchar *message, const gchar *explanation);

// Holds `dialog` until end_dialog, even when it is destroyed meanwhile with its parent:
// gtk_dialog_run answers GTK_RESPONSE_NONE then, and the dialog can still be looked at. end_dialog
// destroys it.
GtkWidget *begin_dialog(GtkWidget *dialog);
void end_dialog(GtkWidget *dialog);

// A combo of the texts "1" to "4" with the first one active.
GtkWidget *create_normal_ComboBox();

// Whether a toggle button (a check or radio button too) is active.
gboolean is_active(GtkWidget *button);
void set_active(GtkWidget *button, gboolean active);

// Makes the item of a combo active that the decimal `number` names, counted from 0; one that is not
// there gives the first.
void set_active_number(GtkWidget *combo, const char *number);

// The button that has the default of a dialog; with none of them Enter neither accepts nor cancels.
enum dialog_default { DEFAULT_NONE, DEFAULT_CANCEL };

// A dialog window with OK and Cancel (GTK_RESPONSE_OK and GTK_RESPONSE_REJECT) over `parent` (may
// be NULL), with which it is destroyed.
GtkWidget *create_dialog(const gchar *title, GtkWidget *parent, dialog_default which);

// Adds the one widget of a dialog's content, which takes all the room.
void pack_content(GtkWidget *dialog, GtkWidget *content);

// The frame of a dialog: etched out, its title a little below the line, `border` pixels around it.
GtkWidget *create_titled_frame(const gchar *title, guint border);

#endif
