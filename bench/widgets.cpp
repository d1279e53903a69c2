// SPDX-License-Identifier: MIT
// A floor to measure against: the widgets of the main window, no logic.

#include "floor_window.h"

int main(int argc, char **argv)
{
    gtk_init(&argc, &argv);
    gtk_widget_show_all(make_floor_window(argc, argv).window);
    gtk_main();
    return 0;
}
