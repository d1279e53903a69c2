// SPDX-License-Identifier: MIT
#include "window/halves.h"

// The least that is left of a half that has to scroll, in pixels.
constexpr gint LEAST_WIDTH = 96;

enum arrangement { UNARRANGED, AS_REQUESTED, NARROW, STACKED };

static GtkWidget *content_of(GtkWidget *scrolled)
{
    return gtk_bin_get_child(GTK_BIN(gtk_bin_get_child(GTK_BIN(scrolled))));
}

// What a widget itself asks for, without the size that is set for it.
static GtkRequisition natural_size(GtkWidget *widget)
{
    GtkRequisition size;

    gtk_widget_get_requisition(widget, &size);
    return size;
}

// What a half needs to show its content whole, with the shadow around it.
static GtkRequisition needed_size(GtkWidget *half)
{
    const GtkStyle *style = gtk_widget_get_style(gtk_bin_get_child(GTK_BIN(half)));
    GtkRequisition needs = natural_size(content_of(half));

    needs.width += 2 * style->xthickness;
    needs.height += 2 * style->ythickness;
    return needs;
}

gint left_half_width(GtkWidget *pane)
{
    GtkWidget *left = gtk_paned_get_child1(GTK_PANED(pane));
    gint width;

    gtk_widget_get_size_request(left, &width, nullptr);
    return MAX(width, needed_size(left).width);
}

static gint handle_size(GtkWidget *pane)
{
    gint size;

    gtk_widget_style_get(pane, "handle-size", &size, nullptr);
    return size;
}

static arrangement choose_arrangement(GtkWidget *pane, gint width, gint height)
{
    GtkWidget *right = gtk_paned_get_child2(GTK_PANED(pane));
    gint least;

    gtk_widget_get_size_request(right, &least, nullptr);
    if (left_half_width(pane) + handle_size(pane) + MIN(least, needed_size(right).width) <= width)
        return AS_REQUESTED;
    return width < height ? STACKED : NARROW;
}

// The position of the handle in a pane of that size.
static gint choose_position(GtkWidget *pane, arrangement arranged, gint width, gint height)
{
    const GtkRequisition left = needed_size(gtk_paned_get_child1(GTK_PANED(pane)));
    const GtkRequisition right = needed_size(gtk_paned_get_child2(GTK_PANED(pane)));

    switch (arranged) {
    case UNARRANGED:
    case AS_REQUESTED:
        break;
    case NARROW:
        return MAX(width - handle_size(pane) - right.width, LEAST_WIDTH);
    case STACKED:
        return MIN(left.height, (height - handle_size(pane)) / 2);
    }
    return left_half_width(pane);
}

// A frame that is given less than its texts need has to ask for it, to be scrolled to.
static void set_frame_request(GtkWidget *half, gboolean whole)
{
    const GtkRequisition needs = natural_size(content_of(half));

    gtk_widget_set_size_request(content_of(half),
                                whole ? SETTINGS_WIDTH : MAX(SETTINGS_WIDTH, needs.width),
                                whole ? SETTINGS_HEIGHT : MAX(SETTINGS_HEIGHT, needs.height));
}

static void share(GtkWidget *pane, gint width, gint height)
{
    static arrangement before = UNARRANGED;
    GtkWidget *left = gtk_paned_get_child1(GTK_PANED(pane));
    const arrangement now = choose_arrangement(pane, width, height);

    set_frame_request(left, now == AS_REQUESTED && needed_size(left).height <= height);
    // While there is enough space the handle stays where the user's hand has put it.
    if (now != AS_REQUESTED || now != before) {
        gtk_orientable_set_orientation(GTK_ORIENTABLE(pane), now == STACKED
                                                                 ? GTK_ORIENTATION_VERTICAL
                                                                 : GTK_ORIENTATION_HORIZONTAL);
        gtk_paned_set_position(GTK_PANED(pane), choose_position(pane, now, width, height));
    }
    before = now;
}

static void share_window(GtkWidget *window, GtkWidget *pane, gint width, gint height)
{
    const gint borders =
        2 * static_cast<gint>(gtk_container_get_border_width(GTK_CONTAINER(window)));

    share(pane, width - borders, height - borders);
}

static gboolean cb_configure(GtkWidget *window, GdkEventConfigure *event, gpointer pane)
{
    static gint width = 0;
    static gint height = 0;

    if (event->width != width || event->height != height)
        share_window(window, GTK_WIDGET(pane), event->width, event->height);
    width = event->width;
    height = event->height;
    return FALSE;
}

void share_room(GtkWidget *window, GtkWidget *pane)
{
    GtkRequisition request;
    gint width, height;

    gtk_widget_size_request(window, &request);
    gtk_window_get_default_size(GTK_WINDOW(window), &width, &height);
    share_window(window, pane, MAX(width, request.width), MAX(height, request.height));
    g_signal_connect(window, "configure-event", G_CALLBACK(cb_configure), pane);
}
