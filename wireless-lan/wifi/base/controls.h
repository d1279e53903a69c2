// SPDX-License-Identifier: MIT
// Which controls of the main window are usable, and what keeps them grey.

#ifndef WIFI_BASE_CONTROLS_H
#define WIFI_BASE_CONTROLS_H

#include <glib.h>

// A reason to keep controls grey. Several can apply at once; a control becomes usable again only
// when the last of its reasons has ended.
enum control_hold : guint {
    HOLD_CHECK = 1 << 0,   // the checking window is shown
    HOLD_REFRESH = 1 << 1, // a refresh, until the end of its scan
    HOLD_CONNECT = 1 << 2, // a connect, until a chain of pollers ends
    HOLD_HOST = 1 << 3,    // the window is in Ad-Hoc host mode
};

// Begins `hold`: its controls turn grey.
void hold_controls(control_hold hold);

// Ends the holds in `holds`: controls that no other hold keeps grey become usable.
void release_controls(guint holds);

// TRUE while any of `holds` lasts.
gboolean controls_held(guint holds);

#endif
