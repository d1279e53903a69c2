// SPDX-License-Identifier: MIT
#include "base/unread_file.h"

#include <glib/gi18n.h>

#include "base/dialogs.h"
#include "wifi_info/debug.h"
#include "wifi_info/replace_file.h"

unread_answer ask_to_replace(GtkWidget *parent, const char *file)
{
    g_autofree gchar *question = g_strdup_printf(
        _("%s could not be read whole.\nReplace it? The old file is kept beside it, "
          "with \".old\" at the end of its name."),
        file);
    GtkWidget *dialog = begin_dialog(gtk_message_dialog_new(
        GTK_WINDOW(parent),
        static_cast<GtkDialogFlags>(GTK_DIALOG_MODAL | GTK_DIALOG_DESTROY_WITH_PARENT),
        GTK_MESSAGE_QUESTION, GTK_BUTTONS_YES_NO, "%s", question));
    g_autoptr(GError) error = nullptr;

    gtk_dialog_set_default_response(GTK_DIALOG(dialog), GTK_RESPONSE_NO);

    const gint answer = gtk_dialog_run(GTK_DIALOG(dialog));

    end_dialog(dialog);
    if (answer != GTK_RESPONSE_YES)
        return UNREAD_LEAVE;
    if (keep_old_file(file, &error))
        return UNREAD_REPLACE;
    debug_line("%s", error->message);
    return UNREAD_NOT_KEPT;
}
