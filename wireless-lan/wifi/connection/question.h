// SPDX-License-Identifier: MIT
// A yes-or-no question with a text entry.

#ifndef WIFI_CONNECTION_QUESTION_H
#define WIFI_CONNECTION_QUESTION_H

#include <gtk/gtk.h>

// When Enter in the entry means Yes.
enum enter_answers { ENTER_ANSWERS, ENTER_ANSWERS_WITH_TEXT };

// Asks `message` over `parent`, with an entry after `label`. Returns the text of the entry on Yes
// (g_free it), NULL on any other answer.
gchar *ask_text(GtkWidget *parent, const gchar *message, const gchar *label, enter_answers enter);

#endif
