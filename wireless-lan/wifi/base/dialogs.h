// Message boxes, and what several dialogs build alike.

#ifndef WIFI_BASE_DIALOGS_H
#define WIFI_BASE_DIALOGS_H

#include <gtk/gtk.h>

// Runs a modal information box with one OK button over `parent` (may be NULL) until it is answered.
void show_message_box(GtkWidget *parent, const gchar *message);

// The same with one Close button.
void show_warring_dialog(GtkWidget *parent, const gchar *message);

// The same with a second, smaller text below the first; NULL: none.
void show_explained_warning(GtkWidget *parent, const gchar *message, const gchar *explanation);

// Runs `dialog` as gtk_dialog_run does. The caller keeps the dialog until end_dialog, even when it
// is destroyed meanwhile with its parent; the answer is then GTK_RESPONSE_NONE.
GtkWidget *begin_dialog(GtkWidget *dialog);
void end_dialog(GtkWidget *dialog);

// A combo of the texts "1" to "4" with the first one active.
GtkWidget *create_normal_ComboBox();

// Makes the item of a combo active that the decimal `number` names, counted from 0; one that is not
// there gives the first.
void set_active_number(GtkWidget *combo, const char *number);

// The frame of a dialog: etched out, its title a little below the line, `border` pixels around it.
GtkWidget *create_titled_frame(const gchar *title, guint border);

#endif
