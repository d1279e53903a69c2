// SPDX-License-Identifier: MIT
// A question with room for a text.

#ifndef WIFI_CONNECTION_QUESTION_H
#define WIFI_CONNECTION_QUESTION_H

#include <gtk/gtk.h>

// When Enter in the entry of a question is Yes.
enum enter_answers { ENTER_ANSWERS, ENTER_ANSWERS_WITH_TEXT };

// Asks `message` over `parent` with Yes and No and an entry behind `label`. Returns the entry's
// text on Yes (g_free it), NULL on any other answer.
gchar *ask_text(GtkWidget *parent, const gchar *message, const gchar *label, enter_answers enter);

#endif
