// SPDX-License-Identifier: MIT
#include "window/activation.h"

#include <cstdio>
#include <unistd.h>

#include <glib/gi18n.h>

#include "base/controls.h"
#include "base/dialogs.h"
#include "base/registry.h"
#include "wifi.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/shell.h"
#include "window/refresh.h"

constexpr char CHECKING_KEY[] = "window-proc-win";
constexpr char MARKER_FILE[] = "/etc/build_in_wifi";
// The interface appears up to six seconds after the module is switched on.
constexpr guint POWER_ON_MS = 6050;
constexpr guint BORDER = 10; // of the checking window, pixels

// The window has no decorations that would set it off from the one below.
static gboolean cb_draw_border(GtkWidget *window, GdkEventExpose *event, gpointer)
{
    gtk_paint_shadow(gtk_widget_get_style(window), gtk_widget_get_window(window), GTK_STATE_NORMAL,
                     GTK_SHADOW_OUT, &event->area, window, nullptr, 0, 0, -1, -1);
    return FALSE;
}

// One-shot timer: looks for the interface again after the module was switched on.
static gboolean cb_check_wifi(gpointer)
{
    GtkWidget *window = find_widget(CHECKING_KEY);

    printf("proc_win=%p\n", static_cast<void *>(window));
    if (window != nullptr)
        gtk_widget_destroy(window);
    release_controls(HOLD_CHECK);

    get_interface();
    if (my_wifi->interface_count < 1) {
        show_message_box(nullptr,
                         _("Can not found any WIFI device.\nPlease confim that you have a WIFI "
                           "device (either built-in or USB WIFI)."));
        return FALSE;
    }
    if (find_widget(ACTIVATE_BUTTON) != nullptr) {
        set_widget_sensitive(ACTIVATE_BUTTON, FALSE);
        cb_refresh_network(nullptr, nullptr);
    }
    return FALSE;
}

static void show_checking_window()
{
    GtkWidget *window = gtk_window_new(GTK_WINDOW_POPUP);
    GtkWidget *box = gtk_vbox_new(FALSE, 0);
    GtkWidget *label = gtk_label_new(_("Checking,please wait..."));

    register_named_widget(window, CHECKING_KEY);
    hold_controls(HOLD_CHECK);
    run_command("echo 1 > /proc/kv/iwifi");
    gtk_label_set_justify(GTK_LABEL(label), GTK_JUSTIFY_CENTER);
    gtk_box_pack_start(GTK_BOX(box), label, FALSE, FALSE, 0);
    gtk_container_add(GTK_CONTAINER(window), box);
    gtk_window_set_position(GTK_WINDOW(window), GTK_WIN_POS_CENTER);
    gtk_container_set_border_width(GTK_CONTAINER(window), BORDER);
    g_signal_connect(window, "expose-event", G_CALLBACK(cb_draw_border), nullptr);
    g_timeout_add(POWER_ON_MS, cb_check_wifi, nullptr);
    gtk_widget_show_all(window);
}

void cb_active_device(GtkWidget *, gpointer)
{
    if (find_widget(CHECKING_KEY) != nullptr)
        return;
    if (access(MARKER_FILE, F_OK) == 0) {
        get_interface();
        if (my_wifi->interface_count < 1) {
            show_checking_window();
            return;
        }
    }
    cb_refresh_network(nullptr, nullptr);
}
