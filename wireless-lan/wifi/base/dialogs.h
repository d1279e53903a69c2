// SPDX-License-Identifier: MIT
// Message boxes, and the parts that several dialogs share.

#ifndef WIFI_BASE_DIALOGS_H
#define WIFI_BASE_DIALOGS_H

#include <gtk/gtk.h>

constexpr auto EXPAND_FILL = static_cast<GtkAttachOptions>(GTK_EXPAND | GTK_FILL);

// Shows a modal information box with an OK button over `parent` (may be NULL) until it is answered.
void show_message_box(GtkWidget *parent, const gchar *message);

// The same with a Close button.
void show_warring_dialog(GtkWidget *parent, const gchar *message);

// The same with a second, smaller text below the first; NULL: none.
void show_explained_warning(GtkWidget *parent, const gchar *message, const gchar *explanation);

// Holds `dialog` until end_dialog, even when it is destroyed meanwhile with its parent:
// gtk_dialog_run answers GTK_RESPONSE_NONE then, and the dialog can still be looked at. end_dialog
// destroys it.
GtkWidget *begin_dialog(GtkWidget *dialog);
void end_dialog(GtkWidget *dialog);

// A combo with the items "1" to "4", the first one active.
GtkWidget *create_normal_ComboBox();

// Whether a toggle button (a check or radio button too) is active.
gboolean is_active(GtkWidget *button);
void set_active(GtkWidget *button, gboolean active);

// Activates the item of a combo that `number` (decimal, from 0) names; the first item when there is
// no such item.
void set_active_number(GtkWidget *combo, const char *number);

// Which button Enter activates: none, or Cancel.
enum dialog_default { DEFAULT_NONE, DEFAULT_CANCEL };

// A dialog window with OK and Cancel (GTK_RESPONSE_OK and GTK_RESPONSE_REJECT) over `parent` (may
// be NULL), destroyed together with it.
GtkWidget *create_dialog(const gchar *title, GtkWidget *parent, dialog_default which);

// Adds the only widget of the content area; it takes all the space.
void pack_content(GtkWidget *dialog, GtkWidget *content);

// An etched frame with its title slightly below the line and a border of `border` pixels around it.
GtkWidget *create_titled_frame(const gchar *title, guint border);

#endif
