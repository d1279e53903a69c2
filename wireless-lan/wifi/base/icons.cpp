// SPDX-License-Identifier: MIT
#include "base/icons.h"

#include <cstring>

#include <gtk/gtk.h>

static gchar **search_path = nullptr; // of the theme before it was emptied
static gint search_path_length = 0;

// The toolkit's default names a theme that every system falls back to, not one that somebody chose.
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
