// SPDX-License-Identifier: MIT
// A floor to measure against: an empty GTK+ 2 window.

#include <gtk/gtk.h>

int main(int argc, char **argv)
{
    gtk_init(&argc, &argv);

    GtkWidget *window = gtk_window_new(GTK_WINDOW_TOPLEVEL);

    gtk_window_set_title(GTK_WINDOW(window), "Wireless LAN");
    gtk_window_set_default_size(GTK_WINDOW(window), 640, 520);
    g_signal_connect(window, "destroy", G_CALLBACK(gtk_main_quit), nullptr);
    gtk_widget_show(window);
    gtk_main();
    return 0;
}
