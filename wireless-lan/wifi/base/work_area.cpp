// SPDX-License-Identifier: MIT
#include "base/work_area.h"

#include <cstring>

#include <X11/Xatom.h>
#include <gdk/gdkx.h>

#include "base/state.h"

// What a window manager's frame may take of a window that it has not shown yet, in pixels. The
// window opens as large as the work area; one that asks for less may be made to fit by its frame.
constexpr gint FRAME_ALLOWANCE = 64;

constexpr gint MAX_TRIES = 20;

// How many sizes a busy window manager may still have to grant.
constexpr gsize MAX_ASKED = 8;

constexpr GtkRequisition NO_REPORT = {G_MAXINT, G_MAXINT};

constexpr char KEPT_KEY[] = "kept-in-work-area";

struct kept_window {
    GtkRequisition natural; // what the window asked for last
    GtkRequisition opening; // its default size; -1: none
    gboolean limited;       // the work area is smaller than the window would be
    gint tries;             // to make it fit, one after the other
    GtkRequisition growing; // what it asks for on a larger screen, until it has it; 0: nothing
    GtkWidget *content;     // of a dialog, once it is in a scrolled window
    GtkRequisition asked[MAX_ASKED]; // the sizes that it asked for, the last one first; 0: none
};

// Reads `count` cardinals of a root-window property from the item `offset` on.
static gboolean read_cardinals(GdkScreen *screen, const char *name, glong offset, glong count,
                               gulong *values)
{
    Display *display = GDK_SCREEN_XDISPLAY(screen);
    Atom type = None;
    int format = 0;
    unsigned long items = 0;
    unsigned long rest = 0;
    unsigned char *data = nullptr;

    if (!gdk_x11_screen_supports_net_wm_hint(screen, gdk_atom_intern(name, FALSE)))
        return FALSE;

    const int status =
        XGetWindowProperty(display, GDK_WINDOW_XID(gdk_screen_get_root_window(screen)),
                           gdk_x11_get_xatom_by_name(name), offset, count, False, XA_CARDINAL,
                           &type, &format, &items, &rest, &data);
    const gboolean whole = status == Success && type == XA_CARDINAL && format == 32 &&
                           items == static_cast<unsigned long>(count);

    // A cardinal of 32 bits comes as a long.
    if (whole)
        memcpy(values, data, sizeof *values * items);
    if (data != nullptr)
        XFree(data);
    return whole;
}

GdkRectangle work_area(GdkScreen *screen)
{
    const GdkRectangle whole = {0, 0, gdk_screen_get_width(screen), gdk_screen_get_height(screen)};
    gulong desktop = 0;
    gulong area[4];

    if (!read_cardinals(screen, "_NET_CURRENT_DESKTOP", 0, 1, &desktop))
        desktop = 0;
    if (!read_cardinals(screen, "_NET_WORKAREA", static_cast<glong>(desktop) * 4, 4, area))
        return whole;

    const GdkRectangle told = {static_cast<gint>(area[0]), static_cast<gint>(area[1]),
                               static_cast<gint>(area[2]), static_cast<gint>(area[3])};
    GdkRectangle result;

    // When the screen is turned, the window manager reports the new area a moment later.
    return gdk_rectangle_intersect(&told, &whole, &result) ? result : whole;
}

// The size that the X server knows: GTK+ may not have seen the last change yet.
static void shown_size(GtkWidget *window, gint *width, gint *height)
{
    gdk_window_get_geometry(gtk_widget_get_window(window), nullptr, nullptr, width, height,
                            nullptr);
}

static gboolean is_size(GtkRequisition size, GtkRequisition other)
{
    return size.width == other.width && size.height == other.height;
}

// A window that is shown, with its frame; its own size goes to `width` and `height`. They are read
// one after the other, and the window manager may set a size in between.
static GdkRectangle shown_frame(GtkWidget *window, gint *width, gint *height)
{
    GdkRectangle frame;
    GtkRequisition before;

    shown_size(window, width, height);
    do {
        before = {*width, *height};
        gdk_window_get_frame_extents(gtk_widget_get_window(window), &frame);
        shown_size(window, width, height);
    } while (!is_size(before, {*width, *height}));
    return frame;
}

// The size of the frame around a window that is shown.
static GtkRequisition frame_size(GtkWidget *window)
{
    gint width, height;
    const GdkRectangle frame = shown_frame(window, &width, &height);

    return {MAX(frame.width - width, 0), MAX(frame.height - height, 0)};
}

// The largest size of a window whose frame stays in the work area too. A window that is not shown
// yet will have the frame of the main window.
static GtkRequisition largest_size(GtkWidget *window)
{
    const GdkRectangle area = work_area(gtk_widget_get_screen(window));
    GtkRequisition frame = {0, 0};

    if (gtk_widget_get_mapped(window))
        frame = frame_size(window);
    else if (mainwindow != nullptr && gtk_widget_get_mapped(mainwindow))
        frame = frame_size(mainwindow);
    return {MAX(area.width - frame.width, 1), MAX(area.height - frame.height, 1)};
}

static kept_window *kept(GtkWidget *window)
{
    return static_cast<kept_window *>(g_object_get_data(G_OBJECT(window), KEPT_KEY));
}

// After the window's own request. The first window is not shown when it asks for the first time,
// and nobody knows the frame that it will get.
static void cb_limit_request(GtkWidget *window, GtkRequisition *request, gpointer)
{
    GtkRequisition largest = largest_size(window);

    if (window == mainwindow && !gtk_widget_get_mapped(window)) {
        largest.width -= FRAME_ALLOWANCE;
        largest.height -= FRAME_ALLOWANCE;
    }
    kept(window)->natural = *request;
    request->width = MIN(request->width, MAX(largest.width, 1));
    request->height = MIN(request->height, MAX(largest.height, 1));
}

static gboolean is_smaller(GtkRequisition size, GtkRequisition than)
{
    return size.width < than.width || size.height < than.height;
}

static void note_asked(kept_window *of, GtkRequisition wanted)
{
    if (is_size(of->asked[0], wanted))
        return;
    memmove(&of->asked[1], &of->asked[0], sizeof of->asked - sizeof of->asked[0]);
    of->asked[0] = wanted;
}

static gboolean was_asked(const kept_window *of, GtkRequisition size)
{
    for (const GtkRequisition &asked : of->asked)
        if (is_size(asked, size))
            return TRUE;
    return FALSE;
}

// The size that a window has to have: what it has got, or, where a smaller screen has taken it,
// what it asks for and opens with, within the work area.
static GtkRequisition fitting_size(GtkWidget *window, gint width, gint height)
{
    kept_window *of = kept(window);
    const GtkRequisition largest = largest_size(window);

    if (of->limited || of->growing.width > 0) {
        width = MAX(width, MAX(of->natural.width, of->opening.width));
        height = MAX(height, MAX(of->natural.height, of->opening.height));
    }
    of->limited = width > largest.width || height > largest.height;
    return {MIN(width, largest.width), MIN(height, largest.height)};
}

// Makes a window that is shown fit. `reported` is the size in a configure event that GTK+ handles
// next, or NO_REPORT.
static void fit_window(GtkWidget *window, GtkRequisition reported)
{
    const GdkRectangle area = work_area(gtk_widget_get_screen(window));
    gint width, height;
    GdkRectangle frame = shown_frame(window, &width, &height);
    kept_window *of = kept(window);
    const GtkRequisition wanted = fitting_size(window, width, height);
    // It may have the size still and have asked for a smaller one, which is on its way.
    const gboolean grows = is_smaller({width, height}, wanted) || is_smaller(reported, wanted) ||
                           (of->asked[0].width > 0 && is_smaller(of->asked[0], wanted));

    of->growing = grows ? wanted : GtkRequisition{0, 0};
    frame.width += wanted.width - width;
    frame.height += wanted.height - height;
    gtk_widget_queue_resize(window);
    if (grows || !is_size(wanted, {width, height})) {
        note_asked(of, wanted);
        gtk_window_resize(GTK_WINDOW(window), wanted.width, wanted.height);
        // GTK+ asks for a size once, also when the window manager has undone it since.
        gdk_window_resize(gtk_widget_get_window(window), wanted.width, wanted.height);
    }

    const gint x = CLAMP(frame.x, area.x, MAX(area.x + area.width - frame.width, area.x));
    const gint y = CLAMP(frame.y, area.y, MAX(area.y + area.height - frame.height, area.y));

    if (x != frame.x || y != frame.y)
        gtk_window_move(GTK_WINDOW(window), x, y);
}

// What a scrolled content asks for: all of it, and the width of the scroll bar beside it.
static void cb_request_content(GtkWidget *scrolled, GtkRequisition *request, gpointer content)
{
    GtkRequisition bar;
    gint spacing;

    gtk_widget_style_get(scrolled, "scrollbar-spacing", &spacing, nullptr);
    gtk_widget_get_child_requisition(GTK_WIDGET(content), request);
    gtk_widget_size_request(gtk_scrolled_window_get_vscrollbar(GTK_SCROLLED_WINDOW(scrolled)),
                            &bar);
    request->width += bar.width + spacing;
}

void request_at_least(GtkWidget *widget, gint width, gint height)
{
    GtkRequisition needs;

    gtk_widget_show_all(widget);
    gtk_widget_size_request(widget, &needs);
    gtk_widget_set_size_request(widget, MAX(width, needs.width), MAX(height, needs.height));
}

void follow_focus(GtkWidget *scrolled)
{
    GtkScrolledWindow *window = GTK_SCROLLED_WINDOW(scrolled);
    GtkContainer *content =
        GTK_CONTAINER(gtk_bin_get_child(GTK_BIN(gtk_bin_get_child(GTK_BIN(scrolled)))));

    gtk_container_set_focus_hadjustment(content, gtk_scrolled_window_get_hadjustment(window));
    gtk_container_set_focus_vadjustment(content, gtk_scrolled_window_get_vadjustment(window));
}

// Moves a child from one box into another, packed as it was.
static void move_child(GtkWidget *child, GtkBox *from, GtkBox *into)
{
    gboolean expand, fill;
    guint padding;
    GtkPackType end;

    gtk_box_query_child_packing(from, child, &expand, &fill, &padding, &end);
    g_object_ref(child);
    gtk_container_remove(GTK_CONTAINER(from), child);
    gtk_container_add(GTK_CONTAINER(into), child);
    gtk_box_set_child_packing(into, child, expand, fill, padding, end);
    g_object_unref(child);
}

// Puts all of a dialog but its buttons into a scrolled window.
static void scroll_content(GtkWidget *dialog)
{
    GtkBox *area = GTK_BOX(gtk_dialog_get_content_area(GTK_DIALOG(dialog)));
    GtkWidget *scrolled = gtk_scrolled_window_new(nullptr, nullptr);
    GtkWidget *content = gtk_vbox_new(FALSE, gtk_box_get_spacing(area));
    GtkWidget *focus = gtk_window_get_focus(GTK_WINDOW(dialog));
    g_autoptr(GList) children = gtk_container_get_children(GTK_CONTAINER(area));

    for (GList *at = children; at != nullptr; at = at->next) {
        GtkWidget *child = GTK_WIDGET(at->data);

        if (child != gtk_dialog_get_action_area(GTK_DIALOG(dialog)) && !GTK_IS_SEPARATOR(child))
            move_child(child, area, GTK_BOX(content));
    }
    gtk_scrolled_window_set_policy(GTK_SCROLLED_WINDOW(scrolled), GTK_POLICY_AUTOMATIC,
                                   GTK_POLICY_AUTOMATIC);
    gtk_scrolled_window_add_with_viewport(GTK_SCROLLED_WINDOW(scrolled), content);
    gtk_viewport_set_shadow_type(GTK_VIEWPORT(gtk_bin_get_child(GTK_BIN(scrolled))),
                                 GTK_SHADOW_NONE);
    follow_focus(scrolled);
    g_signal_connect(scrolled, "size-request", G_CALLBACK(cb_request_content), content);
    gtk_box_pack_start(area, scrolled, TRUE, TRUE, 0);
    gtk_widget_show(content);
    gtk_widget_show_all(scrolled);
    if (focus != nullptr && gtk_widget_is_ancestor(focus, content))
        gtk_widget_grab_focus(focus);
    kept(dialog)->content = content;
}

// Scrolls to the control with the focus, which was not possible before the dialog had its size.
static void reveal_focus(GtkWidget *dialog)
{
    GtkContainer *content = GTK_CONTAINER(kept(dialog)->content);

    gtk_container_set_focus_child(content, gtk_container_get_focus_child(content));
}

// Scrolls the content of a dialog once the work area cannot hold it.
static void fit_content(GtkWidget *dialog)
{
    const GtkRequisition largest = largest_size(dialog);
    GtkRequisition request;

    // Buttons with long words are stacked.
    gtk_widget_size_request(gtk_dialog_get_action_area(GTK_DIALOG(dialog)), &request);
    if (request.width > largest.width)
        gtk_orientable_set_orientation(
            GTK_ORIENTABLE(gtk_dialog_get_action_area(GTK_DIALOG(dialog))),
            GTK_ORIENTATION_VERTICAL);
    gtk_widget_size_request(dialog, &request);

    const kept_window *of = kept(dialog);

    if (of->content == nullptr &&
        (of->natural.width > largest.width || of->natural.height > largest.height))
        scroll_content(dialog);
}

static gboolean cb_turned(gpointer data)
{
    GtkWidget *window = GTK_WIDGET(data);

    if (!gtk_widget_get_mapped(window))
        return FALSE;
    kept(window)->tries = 0;
    if (GTK_IS_DIALOG(window))
        fit_content(window);
    fit_window(window, NO_REPORT);
    return FALSE;
}

static void cb_size_changed(GtkWidget *window)
{
    g_idle_add_full(G_PRIORITY_HIGH_IDLE, cb_turned, g_object_ref(window), g_object_unref);
}

static GdkFilterReturn cb_root_event(GdkXEvent *xevent, GdkEvent *, gpointer window)
{
    const XEvent *event = static_cast<const XEvent *>(xevent);

    if (event->type == PropertyNotify &&
        event->xproperty.atom == gdk_x11_get_xatom_by_name("_NET_WORKAREA"))
        cb_size_changed(GTK_WIDGET(window));
    return GDK_FILTER_CONTINUE;
}

static gboolean cb_mapped(GtkWidget *window, GdkEvent *, gpointer)
{
    fit_window(window, NO_REPORT);
    if (kept(window)->content != nullptr)
        reveal_focus(window);
    return FALSE;
}

// A window manager that is still placing the window may undo the size, and one that refuses it must
// not be asked for ever. When an older size is reported, GTK+ drops its request for a larger one.
static void fit_size(GtkWidget *window, GtkRequisition reported)
{
    const GtkRequisition largest = largest_size(window);
    kept_window *of = kept(window);
    gint width, height;

    if (!gtk_widget_get_mapped(window))
        return;
    shown_size(window, &width, &height);

    const gboolean grows =
        is_smaller({width, height}, of->growing) || is_smaller(reported, of->growing);

    if (width <= largest.width && height <= largest.height && !grows) {
        of->tries = 0;
        of->growing = {0, 0};
    } else if (of->tries++ < MAX_TRIES) {
        fit_window(window, reported);
    } else {
        of->growing = {0, 0};
    }
}

static gboolean cb_configured(GtkWidget *window, GdkEventConfigure *event, gpointer)
{
    kept_window *of = kept(window);
    const GtkRequisition reported = {event->width, event->height};

    // It comes late when a larger one has been asked for since.
    if (was_asked(of, reported) && is_smaller(reported, of->asked[0]))
        of->growing = of->asked[0];
    fit_size(window, reported);
    return FALSE;
}

// A window manager may report the frame only after it has shown the window.
static gboolean cb_property(GtkWidget *window, GdkEventProperty *event, gpointer)
{
    if (event->atom == gdk_atom_intern("_NET_FRAME_EXTENTS", FALSE))
        fit_size(window, NO_REPORT);
    return FALSE;
}

static void cb_gone(GtkWidget *window, gpointer)
{
    gdk_window_remove_filter(gtk_widget_get_root_window(window), cb_root_event, window);
}

void keep_in_work_area(GtkWidget *window)
{
    GdkScreen *screen = gtk_widget_get_screen(window);
    GdkWindow *root = gdk_screen_get_root_window(screen);
    kept_window *of = g_new0(kept_window, 1);
    const GtkRequisition largest = largest_size(window);

    g_object_set_data_full(G_OBJECT(window), KEPT_KEY, of, g_free);
    gtk_window_get_default_size(GTK_WINDOW(window), &of->opening.width, &of->opening.height);
    gtk_window_set_default_size(GTK_WINDOW(window), MIN(of->opening.width, largest.width),
                                MIN(of->opening.height, largest.height));
    g_signal_connect_after(window, "size-request", G_CALLBACK(cb_limit_request), nullptr);
    g_signal_connect(window, "map-event", G_CALLBACK(cb_mapped), nullptr);
    gtk_widget_add_events(window, GDK_PROPERTY_CHANGE_MASK);
    g_signal_connect(window, "configure-event", G_CALLBACK(cb_configured), nullptr);
    g_signal_connect(window, "property-notify-event", G_CALLBACK(cb_property), nullptr);
    g_signal_connect(window, "destroy", G_CALLBACK(cb_gone), nullptr);
    g_signal_connect_object(screen, "size-changed", G_CALLBACK(cb_size_changed), window,
                            G_CONNECT_SWAPPED);
    gdk_window_set_events(
        root, static_cast<GdkEventMask>(gdk_window_get_events(root) | GDK_PROPERTY_CHANGE_MASK));
    gdk_window_add_filter(root, cb_root_event, window);
}

void show_dialog(GtkWidget *dialog)
{
    gtk_widget_show_all(gtk_dialog_get_content_area(GTK_DIALOG(dialog)));
    keep_in_work_area(dialog);
    fit_content(dialog);
    gtk_widget_show(dialog);
}
