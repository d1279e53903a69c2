// SPDX-License-Identifier: MIT
#include "base/desktop.h"

#include <cstring>
#include <unistd.h>

#include <X11/Xatom.h>
#include <X11/Xlib.h>
#include <gdk/gdkx.h>

#include "wifi_info/debug.h"

// Sets the root-window property `atom_str` (type STRING, format 8) to `data` as decimal text, and
// flushes it, because a command that blocks the main loop may follow. NULL is ignored.
static void send_atom_to_desktop(const gchar *atom_str, int data)
{
    if (atom_str == nullptr)
        return;

    Display *display = GDK_DISPLAY_XDISPLAY(gdk_display_get_default());
    const Atom atom = XInternAtom(display, atom_str, False);
    char text[256];

    g_snprintf(text, sizeof text, "%d", data);
    debug_line("send_atom_to_desktop [%s]", atom_str);
    XChangeProperty(display, DefaultRootWindow(display), atom, XA_STRING, 8, PropModeReplace,
                    reinterpret_cast<const unsigned char *>(text), static_cast<int>(strlen(text)));
    XFlush(display);
}

void send_status_to_desktop(desktop_status status)
{
    send_atom_to_desktop("_NET_WIFI_CHANGE_STATUS", status);
}

gboolean notice_desktop(gpointer)
{
    send_atom_to_desktop("_NET_WIFI_STOP_CHECK", getpid());
    return FALSE;
}
