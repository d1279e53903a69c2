// The named-widget registry on the main window, dialogs that any room may show, and the few widgets
// that several rooms build alike.

#ifndef WIFI_BASE_WIDGETS_H
#define WIFI_BASE_WIDGETS_H

#include <gtk/gtk.h>

// Registers `widget` on the main window under `key`. A later widget under the same key replaces it;
// a widget that is destroyed leaves the registry by itself.
void register_widget(GtkWidget *widget, const char *key);

// The same, and gives the widget the key as its name.
void register_named_widget(GtkWidget *widget, const char *key);

// The widget under `key`, NULL when there is none (or no main window).
GtkWidget *find_widget(const char *key);

// Sets the sensitivity of the widget under `key`; a missing widget is skipped.
void set_widget_sensitive(const char *key, gboolean sensitive);

// Sets the status label of the main window; skipped while it does not exist.
void set_title_label(const gchar *text);

// Sets the label of the Connect button to a stock id; skipped while it does not exist.
void set_connect_label(const gchar *stock);

// Runs a modal information box with one OK button over `parent` (may be NULL) until it is answered.
void show_message_box(GtkWidget *parent, const gchar *message);

// The same with one Close button.
void show_warring_dialog(GtkWidget *parent, const gchar *message);

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

// A row's text of a column list, "" when the cell has none. The list owns it.
const gchar *clist_text(GtkWidget *clist, gint row, gint column);

#endif
