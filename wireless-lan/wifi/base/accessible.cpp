// SPDX-License-Identifier: MIT
#include "base/accessible.h"

// Whether GTK+ has been started for assistive technology. Otherwise an accessible object keeps what
// nobody asks for.
static gboolean somebody_listens()
{
    return atk_get_toolkit_name() != nullptr;
}

void name_for_ears(GtkWidget *widget, const gchar *name)
{
    if (!somebody_listens())
        return;
    atk_object_set_name(gtk_widget_get_accessible(widget), name);
}

void name_in_group(GtkWidget *widget, const gchar *group, const gchar *name)
{
    g_autofree gchar *whole = g_strdup_printf("%s: %s", group, name);

    name_for_ears(widget, whole);
}

void describe_for_ears(GtkWidget *widget, const gchar *description)
{
    if (!somebody_listens())
        return;
    atk_object_set_description(gtk_widget_get_accessible(widget), description);
}

void hide_from_ears(GtkWidget *image)
{
    if (!somebody_listens())
        return;

    AtkObject *accessible = gtk_widget_get_accessible(image);

    atk_object_set_name(accessible, "");
    atk_object_set_role(accessible, ATK_ROLE_REDUNDANT_OBJECT);
}

void announce_changes(GtkWidget *label)
{
    if (!somebody_listens())
        return;
    atk_object_set_role(gtk_widget_get_accessible(label), ATK_ROLE_STATUSBAR);
}
