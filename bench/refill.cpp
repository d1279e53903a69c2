// SPDX-License-Identifier: MIT
// Times the refill of a shown list from scan records, the drawing included: the program's own, or
// the floor's.
//
//   refill program|floor ROUNDS
//
// "iwlist" comes from PATH. Answers one "US" line a round.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>

#include "base/network_list.h"
#include "base/state.h"
#include "floor_scan.h"
#include "floor_window.h"
#include "wifi.h"
#include "wifi_info/scan.h"
#include "window/main_window.h"

static floor_row rows[FLOOR_ROWS];

static double now_us()
{
    struct timespec now;

    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) * 1e6 + static_cast<double>(now.tv_nsec) / 1e3;
}

static void draw()
{
    do {
        while (gtk_events_pending())
            gtk_main_iteration();
        gdk_display_sync(gdk_display_get_default());
    } while (gtk_events_pending());
}

static void make_program_window()
{
    GtkWidget *pane = gtk_hpaned_new();

    my_wifi_init();
    mainwindow = gtk_window_new(GTK_WINDOW_TOPLEVEL);
    gtk_window_set_default_size(GTK_WINDOW(mainwindow), 800, 520);
    gtk_container_set_border_width(GTK_CONTAINER(mainwindow), 10);
    gtk_container_add(GTK_CONTAINER(mainwindow), pane);
    gtk_paned_add1(GTK_PANED(pane), create_left_text());
    gtk_paned_add2(GTK_PANED(pane), create_list());
    gtk_widget_show_all(mainwindow);
    draw();
    if (first_interface() != nullptr)
        get_cell(first_interface());
    connect_index = -1;
}

int main(int argc, char **argv)
{
    gtk_init(&argc, &argv);
    if (argc < 3)
        return 2;

    const gboolean own = strcmp(argv[1], "program") == 0;
    const int rounds = atoi(argv[2]);
    char width[] = "800", height[] = "520";
    char *size[] = {argv[0], width, height};
    GtkListStore *store = nullptr;
    int count = 0;

    if (own) {
        make_program_window();
        count = my_wifi->cell_count;
    } else {
        const floor_window made = make_floor_window(3, size);

        store = made.rows;
        gtk_widget_show_all(made.window);
        draw();
        count = read_scan("wlan0", rows);
    }
    if (count != FLOOR_ROWS)
        return 1;
    for (int i = -2; i < rounds; i++) {
        const double start = now_us();

        if (own)
            review_tree_vanpro("Disconnect");
        else
            fill_rows(store, rows, count);
        draw();
        if (i >= 0)
            printf("%.1f\n", now_us() - start);
    }
    return 0;
}
