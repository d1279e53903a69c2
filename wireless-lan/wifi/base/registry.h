// SPDX-License-Identifier: MIT
// The named widgets of the main window.

#ifndef WIFI_BASE_REGISTRY_H
#define WIFI_BASE_REGISTRY_H

#include <gtk/gtk.h>

// The keys of the main window's own widgets.
constexpr char TITLE_LABEL[] = "title-label";
constexpr char NETWORK_VIEW[] = "view-press";
constexpr char NETWORK_ROWS[] = "cell-list"; // the model of the view
constexpr char REFRESH_BUTTON[] = "button-refresh";
constexpr char SETTINGS_BUTTON[] = "button-wifi-settings";
constexpr char PREFERRED_BUTTON[] = "button-network-configure";
constexpr char ACTIVATE_BUTTON[] = "button-active-device";
constexpr char CONNECT_BUTTON[] = "button-connect";

// Registers `widget` on the main window under `key`, in place of an earlier widget with this key. A
// destroyed widget leaves the registry by itself.
void register_widget(GtkWidget *widget, const char *key);

// The same; the key also becomes the name of the widget.
void register_named_widget(GtkWidget *widget, const char *key);

// The widget under `key`, NULL when there is none (or no main window).
GtkWidget *find_widget(const char *key);

// Sets the sensitivity of the widget under `key`, if there is one.
void set_widget_sensitive(const char *key, gboolean sensitive);

// Sets the status label of the main window, if it exists.
void set_title_label(const gchar *text);

// Sets the label of the Connect button, if it exists, to a stock id.
void set_connect_label(const gchar *stock);

#endif
