// SPDX-License-Identifier: MIT
// Which controls of the main window can be used, and what keeps them grey.

#ifndef WIFI_BASE_CONTROLS_H
#define WIFI_BASE_CONTROLS_H

#include <glib.h>

// What holds controls. Several can at a time; a control comes back when the last one that holds it
// lets go, so that nothing gives back what something else still needs grey.
enum control_hold : guint {
    HOLD_CHECK = 1 << 0,   // the checking window stands
    HOLD_REFRESH = 1 << 1, // a refresh, until its scan has ended
    HOLD_CONNECT = 1 << 2, // a connect, until a chain of pollers ends
    HOLD_HOST = 1 << 3,    // the window is in Ad-Hoc host mode
};

// Lets `hold` begin: what it holds turns grey.
void hold_controls(control_hold hold);

// Ends the holds in `holds`: what nothing else holds can be used again.
void release_controls(guint holds);

// TRUE while one of `holds` lasts.
gboolean controls_held(guint holds);

#endif
