// SPDX-License-Identifier: MIT
#include <cstdio>
#include <cstdlib>

#include <glib/gi18n.h>
#include <gtk/gtk.h>
#include <unistd.h>

#include "base/desktop.h"
#include "base/dialogs.h"
#include "base/icons.h"
#include "base/list_keyboard.h"
#include "base/state.h"
#include "base/work_area.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "window/activation.h"
#include "window/halves.h"
#include "window/main_window.h"

constexpr char TEXT_DOMAIN[] = "wireless-lan";
// When a window that starts as an icon gets its first scan.
constexpr guint UNSEEN_MS = 1000;

static void cb_leave(GtkWidget *, gpointer)
{
    mainwindow = nullptr;
    gtk_main_quit();
}

// A closed window ends with the process; destroying all its rows first would only take time.
static gboolean cb_close(GtkWidget *, GdkEvent *, gpointer)
{
    gtk_main_quit();
    return TRUE;
}

static guint unseen_timer = 0; // 0: it has fired, or is not needed

// Only root may run the commands of a device that reports reasons.
static void tell_missing_rights()
{
    if (!has_device_path() || geteuid() == 0)
        return;

    g_autofree gchar *reason = reason_sentence("not-root");

    show_warring_dialog(mainwindow, reason);
}

// Starts the jobs after the first drawing, because the scan blocks the window. What became visible
// was exposed with it, so one round trip to the X server brings the expose events, which GTK+
// handles before idle callbacks.
static gboolean start_jobs(gpointer)
{
    unseen_timer = 0;
    gdk_display_sync(gdk_display_get_default());
    tell_missing_rights();
    g_idle_add(
        [](gpointer) -> gboolean {
            cb_active_device(nullptr, nullptr);
            return FALSE;
        },
        nullptr);
    // It may have been closed already.
    if (mainwindow != nullptr)
        use_program_icon(mainwindow);
    g_idle_add(notice_desktop, nullptr);
    return FALSE;
}

// Not the first expose-event: GTK+ sends that itself, before the window manager shows the window.
static gboolean cb_first_sight(GtkWidget *widget, GdkEvent *, gpointer)
{
    g_signal_handlers_disconnect_by_func(widget, reinterpret_cast<gpointer>(cb_first_sight),
                                         nullptr);
    if (unseen_timer != 0) {
        g_source_remove(unseen_timer);
        g_idle_add(start_jobs, nullptr);
    }
    return FALSE;
}

int main(int argc, char **argv)
{
    // Each line is written at once, even to a pipe.
    setvbuf(stdout, nullptr, _IOLBF, 0);
    set_device_path(PROGRAM_DEVICE_PATH);
    bindtextdomain(TEXT_DOMAIN, PROGRAM_LOCALEDIR);
    textdomain(TEXT_DOMAIN);
    bind_textdomain_codeset(TEXT_DOMAIN, "UTF-8");
    gtk_init(&argc, &argv);
    // Its thread reads the font configuration, the longest piece of the start, while the device is
    // asked.
    pango_cairo_font_map_get_default();
    use_built_in_icons();
    if (!my_wifi_init()) {
        debug_line("my_wifi_init error!!!\r");
        return EXIT_SUCCESS;
    }

    mainwindow = gtk_window_new(GTK_WINDOW_TOPLEVEL);
    gtk_window_set_title(GTK_WINDOW(mainwindow), _("Wireless LAN"));
    g_signal_connect(mainwindow, "destroy", G_CALLBACK(cb_leave), nullptr);
    g_signal_connect(mainwindow, "delete-event", G_CALLBACK(cb_close), nullptr);
    gtk_container_set_border_width(GTK_CONTAINER(mainwindow), 10);

    GtkWidget *pane = gtk_hpaned_new();

    gtk_container_add(GTK_CONTAINER(mainwindow), pane);
    gtk_paned_add1(GTK_PANED(pane), create_left_text());
    gtk_paned_add2(GTK_PANED(pane), create_list());
    gtk_widget_show_all(pane);
    set_default_width(GTK_WINDOW(mainwindow));
    keep_in_work_area(mainwindow);
    share_room(mainwindow, pane);
    keep_focus(mainwindow);
    focus_list(my_wifi->wifi_view);

    gtk_widget_add_events(mainwindow, GDK_VISIBILITY_NOTIFY_MASK);
    g_signal_connect(mainwindow, "visibility-notify-event", G_CALLBACK(cb_first_sight), nullptr);
    unseen_timer = g_timeout_add(UNSEEN_MS, start_jobs, nullptr);
    gtk_widget_show_all(mainwindow);
    gtk_main();
    return EXIT_SUCCESS;
}
