// SPDX-License-Identifier: MIT
// The network list by keyboard, and where the keyboard's focus is in the main window.

#ifndef WIFI_BASE_LIST_KEYBOARD_H
#define WIFI_BASE_LIST_KEYBOARD_H

#include <gtk/gtk.h>

// Lets the selection of the list be the chosen network however it changes, Return and Space on a
// row do what the Connect button does, and the list scroll to its cursor.
void follow_list_keyboard(GtkWidget *view);

// Highlights the row of cell_index, or none, after the rows were built anew.
void highlight_chosen_row();

// Gives the list the focus and chooses nothing, which the toolkit would.
void focus_list(GtkWidget *view);

// Lets the focus come back to a control of the main window that had it when it turned grey. Called
// with the controls registered.
void keep_focus(GtkWidget *window);

#endif
