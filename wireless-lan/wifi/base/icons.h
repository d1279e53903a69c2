// SPDX-License-Identifier: MIT
// Where GTK+ looks up icons.

#ifndef WIFI_BASE_ICONS_H
#define WIFI_BASE_ICONS_H

#include <gtk/gtk.h>

// Keeps the icon theme of the default screen from searching its directories while nobody has chosen
// a theme: every stock icon is then the toolkit's built-in one, which the search would end with.
// Once a theme is named, by a settings manager or a gtkrc, the theme searches as usual. Call it
// after gtk_init and before the first icon.
void use_built_in_icons();

// Gives `window`, which must be realized, the program's icon, drawn here so that no file and no
// theme is needed for it. Window managers show it for the dialogs of a window too.
void use_program_icon(GtkWidget *window);

#endif
