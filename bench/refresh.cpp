// SPDX-License-Identifier: MIT
// A floor to measure against: the widgets of the main window, the two helper processes of start-up,
// and after the first drawing one discovery, the 100 ms pause, the scan and its rows.

#include <cstdlib>

#include "floor_scan.h"
#include "floor_window.h"

static char interface_name[16];
static floor_row rows[FLOOR_ROWS];

static gboolean scan(gpointer store)
{
    const int count = read_scan(interface_name, rows);

    fill_rows(static_cast<GtkListStore *>(store), rows, count);
    return FALSE;
}

static gboolean discover(gpointer store)
{
    if (read_interface_name(interface_name))
        g_timeout_add(100, scan, store);
    return FALSE;
}

static gboolean first_exposure(GtkWidget *window, GdkEvent *, gpointer store)
{
    g_signal_handlers_disconnect_by_func(window, reinterpret_cast<gpointer>(first_exposure), store);
    g_idle_add(discover, store);
    return FALSE;
}

static void bring_up()
{
    char command[64];

    g_snprintf(command, sizeof command, "/sbin/ifconfig %s up", interface_name);
    if (system(command) != 0)
        g_printerr("%s failed\n", command);
}

int main(int argc, char **argv)
{
    gtk_init(&argc, &argv);
    if (read_interface_name(interface_name))
        bring_up();

    const floor_window made = make_floor_window(argc, argv);

    g_signal_connect(made.window, "expose-event", G_CALLBACK(first_exposure), made.rows);
    gtk_widget_show_all(made.window);
    gtk_main();
    return 0;
}
