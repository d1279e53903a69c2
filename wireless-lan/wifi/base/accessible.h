// SPDX-License-Identifier: MIT
// What assistive technology says of a control whose own text does not tell. Nothing happens where
// GTK+ has been started without it (no module of GTK_MODULES implements ATK).

#ifndef WIFI_BASE_ACCESSIBLE_H
#define WIFI_BASE_ACCESSIBLE_H

#include <gtk/gtk.h>

// Gives a control its name.
void name_for_ears(GtkWidget *widget, const gchar *name);

// Names a control of a group, as in "Key state: open".
void name_in_group(GtkWidget *widget, const gchar *group, const gchar *name);

// Adds what there is to know beside the name.
void describe_for_ears(GtkWidget *widget, const gchar *description);

// Makes an image a decoration, which is not read out.
void hide_from_ears(GtkWidget *image);

// Makes a label the status bar of its window: its changes are announced.
void announce_changes(GtkWidget *label);

#endif
