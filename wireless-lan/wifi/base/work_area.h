// SPDX-License-Identifier: MIT
// Windows on a screen that is smaller than they ask for.

#ifndef WIFI_BASE_WORK_AREA_H
#define WIFI_BASE_WORK_AREA_H

#include <gtk/gtk.h>

// The part of the screen that windows may cover: _NET_WORKAREA of the desktop in use (Extended
// Window Manager Hints), the whole screen without a window manager.
GdkRectangle work_area(GdkScreen *screen);

// Keeps `window` within the work area while it lives, also when the screen is turned: where it asks
// for more it may shrink below its request and opens as large as the work area. Called before the
// window is shown, with its default size set.
void keep_in_work_area(GtkWidget *window);

// Shows a dialog with all that is in it, once, and keeps it in the work area. A content that does
// not fit goes into a scrolled window, so that the buttons below it stay in sight.
void show_dialog(GtkWidget *dialog);

// Sets the size that `widget` asks for: what is given, and more where its texts need more.
void request_at_least(GtkWidget *widget, gint width, gint height);

// Lets a scrolled window with a viewport scroll to the control that gets the focus.
void follow_focus(GtkWidget *scrolled);

#endif
