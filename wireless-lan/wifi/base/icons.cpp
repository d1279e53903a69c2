// SPDX-License-Identifier: MIT
#include "base/icons.h"

#include <cstring>

#include <gtk/gtk.h>

static gchar **search_path = nullptr; // of the theme before it was emptied
static gint search_path_length = 0;

// GTK+'s default value names a theme that every system falls back to, not one that somebody chose.
static gboolean theme_chosen(GtkSettings *settings)
{
    GParamSpec *property =
        g_object_class_find_property(G_OBJECT_GET_CLASS(settings), "gtk-icon-theme-name");
    g_autofree gchar *name = nullptr;

    g_object_get(settings, "gtk-icon-theme-name", &name, nullptr);
    return g_strcmp0(name, G_PARAM_SPEC_STRING(property)->default_value) != 0;
}

static void cb_theme_named(GtkSettings *settings, GParamSpec *, gpointer)
{
    if (search_path == nullptr || !theme_chosen(settings))
        return;
    gtk_icon_theme_set_search_path(gtk_icon_theme_get_default(),
                                   const_cast<const gchar **>(search_path), search_path_length);
    g_strfreev(search_path);
    search_path = nullptr;
}

void use_built_in_icons()
{
    GtkSettings *settings = gtk_settings_get_default();
    GtkIconTheme *theme = gtk_icon_theme_get_default();

    if (theme_chosen(settings))
        return;
    gtk_icon_theme_get_search_path(theme, &search_path, &search_path_length);
    gtk_icon_theme_set_search_path(theme, nullptr, 0);
    g_signal_connect(settings, "notify::gtk-icon-theme-name", G_CALLBACK(cb_theme_named), nullptr);
}

// The picture of data/wireless-lan.svg, in quarters of its 48 units: what covers a point.
enum cover { NOTHING, GROUND, SIGN };

constexpr int ICON_SIZE = 48;
constexpr int SUB = 4; // points along each side of a pixel

static cover cover_at(int x, int y)
{
    const int edge = 2 * SUB;
    const int corner = 9 * SUB;
    const int far_x = MAX(MAX(edge + corner - x, x - (ICON_SIZE * SUB - edge - corner)), 0);
    const int far_y = MAX(MAX(edge + corner - y, y - (ICON_SIZE * SUB - edge - corner)), 0);
    const int across = ABS(x - 24 * SUB);
    const int above = 35 * SUB - y;
    const int distance = across * across + above * above;
    const auto between = [distance](int inner, int outer) {
        return distance >= inner * inner && distance <= outer * outer;
    };

    if (far_x * far_x + far_y * far_y > corner * corner)
        return NOTHING;
    if (between(0, 14) || (above > across && (between(42, 58) || between(76, 92))))
        return SIGN;
    return GROUND;
}

static void draw_pixel(int column, int row, guchar *pixel)
{
    static const guchar ground[] = {0x55, 0x6B, 0x2F};
    int covered = 0;
    int white = 0;

    for (int i = 0; i < SUB * SUB; i++) {
        const cover found = cover_at(column * SUB + i % SUB, row * SUB + i / SUB);

        covered += found != NOTHING;
        white += found == SIGN;
    }
    for (int channel = 0; channel < 3; channel++)
        pixel[channel] =
            static_cast<guchar>(ground[channel] + (0xFF - ground[channel]) * white / (SUB * SUB));
    pixel[3] = static_cast<guchar>(0xFF * covered / (SUB * SUB));
}

void use_program_icon(GtkWidget *window)
{
    g_autoptr(GdkPixbuf) icon = gdk_pixbuf_new(GDK_COLORSPACE_RGB, TRUE, 8, ICON_SIZE, ICON_SIZE);

    for (int i = 0; i < ICON_SIZE * ICON_SIZE; i++)
        draw_pixel(i % ICON_SIZE, i / ICON_SIZE,
                   gdk_pixbuf_get_pixels(icon) + i / ICON_SIZE * gdk_pixbuf_get_rowstride(icon) +
                       4 * (i % ICON_SIZE));

    GList icons = {icon, nullptr, nullptr};

    // gtk_window_set_icon() also makes a pixmap for window managers that know nothing better, with
    // 48 KiB of working memory that is never given back.
    gdk_window_set_icon_list(gtk_widget_get_window(window), &icons);
}
