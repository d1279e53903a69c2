// SPDX-License-Identifier: MIT
// The text renderer of the network list.

#ifndef WIFI_WINDOW_ROW_TEXT_H
#define WIFI_WINDOW_ROW_TEXT_H

#include <gtk/gtk.h>

// A new GtkCellRendererText that asks for what its whole text needs, draws it with an ellipsis
// where it has got less, and remembers how large short texts are: most cells of a list repeat
// another one's text. The caller owns a floating reference.
GtkCellRenderer *row_text_new();

#endif
