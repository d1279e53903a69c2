// SPDX-License-Identifier: MIT
#include "window/columns.h"

constexpr gint NAME_COLUMN = 0;
constexpr gint LEAST_NAME_WIDTH = 64;  // pixels
constexpr double LEAST_CONTRAST = 4.5; // Web Content Accessibility Guidelines 2, level AA

// What the texts of a column and its title ask for.
static gint wanted_width(GtkTreeViewColumn *column)
{
    return MAX(column->requested_width, column->button_request);
}

// The name gives up what the other columns need. A width that the user has set stays.
static void cb_room_changed(GtkWidget *viewport, GtkAllocation *room, gpointer data)
{
    GtkTreeView *view = GTK_TREE_VIEW(data);
    GtkTreeViewColumn *name = gtk_tree_view_get_column(view, NAME_COLUMN);
    gint limit = room->width - 2 * gtk_widget_get_style(viewport)->xthickness;
    g_autoptr(GList) columns = gtk_tree_view_get_columns(view);

    for (GList *at = columns; at != nullptr; at = at->next) {
        GtkTreeViewColumn *column = GTK_TREE_VIEW_COLUMN(at->data);

        if (column != name)
            limit -= column->use_resized_width ? column->resized_width : wanted_width(column);
    }
    limit = MAX(limit, MAX(LEAST_NAME_WIDTH, name->button_request));
    if (name->use_resized_width || wanted_width(name) <= limit)
        limit = -1;
    if (limit != gtk_tree_view_column_get_max_width(name))
        gtk_tree_view_column_set_max_width(name, limit);
}

// The whole name, where the column does not show it.
static gboolean cb_tooltip(GtkWidget *view, gint x, gint y, gboolean keyboard, GtkTooltip *tooltip,
                           gpointer)
{
    GtkTreeViewColumn *name = gtk_tree_view_get_column(GTK_TREE_VIEW(view), NAME_COLUMN);
    GtkTreeModel *model;
    GtkTreePath *path;
    GtkTreeIter row;
    gint width;

    if (!gtk_tree_view_get_tooltip_context(GTK_TREE_VIEW(view), &x, &y, keyboard, &model, &path,
                                           &row))
        return FALSE;

    g_autofree gchar *text = nullptr;

    gtk_tree_model_get(model, &row, NAME_COLUMN, &text, -1);

    g_autoptr(PangoLayout) layout = gtk_widget_create_pango_layout(view, text);

    pango_layout_get_pixel_size(layout, &width, nullptr);
    gtk_tree_path_free(path);
    gtk_tooltip_set_text(tooltip, text);
    return width > gtk_tree_view_column_get_width(name) - 4;
}

// One channel of sRGB as light, by the usual polynomial.
static double light(guint16 channel)
{
    const double value = channel / 65535.0;

    return value * (value * (value * 0.305306011 + 0.682171111) + 0.012522878);
}

static double luminance(const GdkColor *color)
{
    return 0.2126 * light(color->red) + 0.7152 * light(color->green) + 0.0722 * light(color->blue);
}

static double contrast(const GdkColor *a, const GdkColor *b)
{
    const double one = luminance(a);
    const double other = luminance(b);

    return (MAX(one, other) + 0.05) / (MIN(one, other) + 0.05);
}

// The colour of the rows is fixed; on a base colour that hides it they get a light one of their
// own.
static void cb_style(GtkWidget *view, GtkStyle *, gpointer renderer)
{
    GdkColor *foreground = nullptr;

    g_object_get(renderer, "foreground-gdk", &foreground, nullptr);

    const gboolean hidden =
        contrast(foreground, &gtk_widget_get_style(view)->base[GTK_STATE_NORMAL]) < LEAST_CONTRAST;

    gdk_color_free(foreground);
    if (hidden)
        g_object_set(renderer, "cell-background", "white", nullptr);
    g_object_set(renderer, "cell-background-set", hidden, nullptr);
}

void fit_columns(GtkWidget *view, GtkCellRenderer *renderer)
{
    g_autoptr(GList) columns = gtk_tree_view_get_columns(GTK_TREE_VIEW(view));

    for (GList *at = columns; at != nullptr; at = at->next)
        gtk_tree_view_column_set_resizable(GTK_TREE_VIEW_COLUMN(at->data), TRUE);
    g_signal_connect_after(gtk_widget_get_parent(view), "size-allocate",
                           G_CALLBACK(cb_room_changed), view);
    gtk_widget_set_has_tooltip(view, TRUE);
    g_signal_connect(view, "query-tooltip", G_CALLBACK(cb_tooltip), nullptr);
    g_signal_connect(view, "style-set", G_CALLBACK(cb_style), renderer);
}
