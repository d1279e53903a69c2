// SPDX-License-Identifier: MIT
#include "window/row_text.h"

#include <cstring>

constexpr gsize LONGEST = 16; // bytes of a text whose size is remembered, with its NUL
constexpr guint SLOTS = 64;

struct SizeOfText {
    char text[LONGEST];
    gint16 width, height; // pixels; both 0 in a free slot
};

struct RowText {
    GtkCellRendererText text;
    guint fonts; // pango_context_get_serial() of what has been measured
    SizeOfText sizes[SLOTS];
};

struct RowTextClass {
    GtkCellRendererTextClass text;
};

G_DEFINE_TYPE(RowText, row_text, GTK_TYPE_CELL_RENDERER_TEXT)

// Where a text is remembered; nullptr for a long one.
static SizeOfText *slot_of(RowText *row, GtkWidget *view)
{
    const gchar *text = row->text.text;
    const guint fonts = pango_context_get_serial(gtk_widget_get_pango_context(view));

    if (text == nullptr || strlen(text) >= LONGEST)
        return nullptr;
    if (row->fonts != fonts) {
        memset(row->sizes, 0, sizeof row->sizes);
        row->fonts = fonts;
    }

    SizeOfText *slot = &row->sizes[g_str_hash(text) % SLOTS];

    if (!g_str_equal(slot->text, text)) {
        strcpy(slot->text, text);
        slot->width = slot->height = 0;
    }
    return slot;
}

static void get_size(GtkCellRenderer *renderer, GtkWidget *view, GdkRectangle *area, gint *x,
                     gint *y, gint *width, gint *height)
{
    const auto *parent = GTK_CELL_RENDERER_CLASS(row_text_parent_class);
    gpointer row = renderer; // an object is aligned for every type
    SizeOfText *slot = area == nullptr ? slot_of(static_cast<RowText *>(row), view) : nullptr;
    gint wide, high;

    if (slot == nullptr) {
        parent->get_size(renderer, view, area, x, y, width, height);
        return;
    }
    if (slot->height == 0) {
        parent->get_size(renderer, view, nullptr, nullptr, nullptr, &wide, &high);
        slot->width = static_cast<gint16>(wide);
        slot->height = static_cast<gint16>(high);
    }
    if (x != nullptr)
        *x = 0;
    if (y != nullptr)
        *y = 0;
    if (width != nullptr)
        *width = slot->width;
    if (height != nullptr)
        *height = slot->height;
}

static void render(GtkCellRenderer *renderer, GdkDrawable *window, GtkWidget *view,
                   GdkRectangle *background, GdkRectangle *area, GdkRectangle *exposed,
                   GtkCellRendererState flags)
{
    gint wanted;

    get_size(renderer, view, nullptr, nullptr, nullptr, &wanted, nullptr);

    const gboolean cut = wanted > area->width;

    if (cut)
        g_object_set(renderer, "ellipsize", PANGO_ELLIPSIZE_END, nullptr);
    GTK_CELL_RENDERER_CLASS(row_text_parent_class)
        ->render(renderer, window, view, background, area, exposed, flags);
    if (cut)
        g_object_set(renderer, "ellipsize", PANGO_ELLIPSIZE_NONE, nullptr);
}

static void row_text_init(RowText *)
{
}

static void row_text_class_init(RowTextClass *type)
{
    type->text.parent_class.get_size = get_size;
    type->text.parent_class.render = render;
}

GtkCellRenderer *row_text_new()
{
    return GTK_CELL_RENDERER(g_object_new(row_text_get_type(), nullptr));
}
