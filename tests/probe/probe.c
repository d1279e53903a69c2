// SPDX-License-Identifier: MIT
// Looks at the real program's widgets from outside: a GTK+ module that answers questions on a
// socket, from the program's own main loop (nested ones of dialogs too). It changes nothing, and
// answers only when the program has nothing more urgent to do: events handled, sizes settled, idle
// jobs done, all drawn, and that by the X server too.
//
// One question a line, one JSON value a line back. Texts keep their bytes, UTF-8 or not.
//   tree             every top-level window with all that is in it
//   props ID         all properties of a widget, and those that its container holds for it
//   registry KEY     the object the main window holds under the key, or null
//   rows ID|@KEY     rows of a GtkTreeView, a list store or a GtkCList
//   columns ID       columns of a GtkTreeView with their renderers
//   cell ID ROW COL  the place of a cell on the screen
// ID is the pointer that `tree` gives.
#include <errno.h>
#include <gtk/gtk.h>
#include <stdlib.h>
#include <string.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

static void put_text(GString *out, const char *text)
{
    if (text == NULL) {
        g_string_append(out, "null");
        return;
    }
    g_string_append_c(out, '"');
    for (const unsigned char *at = (const unsigned char *)text; *at != '\0'; at++) {
        if (*at < ' ' || *at == '"' || *at == '\\')
            g_string_append_printf(out, "\\u%04x", *at);
        else
            g_string_append_c(out, (char)*at);
    }
    g_string_append_c(out, '"');
}

static void put_name(GString *out, const char *name)
{
    put_text(out, name);
    g_string_append(out, ": ");
}

static void put_field(GString *out, const char *name, const char *text)
{
    g_string_append(out, ", ");
    put_name(out, name);
    put_text(out, text);
}

static void put_flag(GString *out, const char *name, gboolean flag)
{
    g_string_append(out, ", ");
    put_name(out, name);
    g_string_append(out, flag ? "true" : "false");
}

static void put_number(GString *out, const char *name, int number)
{
    g_string_append(out, ", ");
    put_name(out, name);
    g_string_append_printf(out, "%d", number);
}

static void put_value(GString *out, const GValue *value)
{
    GType type = G_VALUE_TYPE(value);
    if (G_VALUE_HOLDS_STRING(value)) {
        put_text(out, g_value_get_string(value));
    } else if (G_VALUE_HOLDS_BOOLEAN(value)) {
        g_string_append(out, g_value_get_boolean(value) ? "true" : "false");
    } else if (G_VALUE_HOLDS_ENUM(value)) {
        GEnumClass *class = g_type_class_ref(type);
        GEnumValue *entry = g_enum_get_value(class, g_value_get_enum(value));
        put_text(out, entry != NULL ? entry->value_nick : "?");
        g_type_class_unref(class);
    } else if (G_VALUE_HOLDS_FLAGS(value)) {
        g_string_append_printf(out, "%u", g_value_get_flags(value));
    } else if (G_VALUE_HOLDS_OBJECT(value)) {
        gpointer object = g_value_get_object(value);
        if (object == NULL)
            g_string_append(out, "null");
        else
            g_string_append_printf(out, "{\"type\": \"%s\", \"id\": \"%p\"}",
                                   G_OBJECT_TYPE_NAME(object), object);
    } else if (g_value_type_transformable(type, G_TYPE_DOUBLE)) {
        GValue number = G_VALUE_INIT;
        char text[G_ASCII_DTOSTR_BUF_SIZE];
        g_value_init(&number, G_TYPE_DOUBLE);
        g_value_transform(value, &number);
        double plain = g_value_get_double(&number);
        if (plain != plain || plain > 1e300 || plain < -1e300)
            g_string_append(out, "null");
        else
            g_string_append(out, g_ascii_dtostr(text, sizeof text, plain));
    } else {
        g_string_append_printf(out, "{\"type\": \"%s\"}", g_type_name(type));
    }
}

// The place of a window on the screen. Only that of a top-level window has to be asked of the X
// server, once for one answer.
static GdkWindow *located;
static gint located_x, located_y;

static void origin_of(GdkWindow *window, gint *x, gint *y)
{
    GdkWindow *top = gdk_window_get_toplevel(window);
    if (located != top) {
        gdk_window_get_origin(top, &located_x, &located_y);
        located = top;
    }
    *x = located_x;
    *y = located_y;
    for (; window != top; window = gdk_window_get_parent(window)) {
        gint inner_x, inner_y;
        gdk_window_get_position(window, &inner_x, &inner_y);
        *x += inner_x;
        *y += inner_y;
    }
}

static GdkRectangle on_screen(GtkWidget *widget)
{
    GtkAllocation at;
    GdkRectangle result = {0, 0, 0, 0};
    gint x, y;
    gtk_widget_get_allocation(widget, &at);
    result.width = at.width;
    result.height = at.height;
    if (!gtk_widget_get_realized(widget) || gtk_widget_get_window(widget) == NULL)
        return result;
    origin_of(gtk_widget_get_window(widget), &x, &y);
    result.x = x + (gtk_widget_get_has_window(widget) ? 0 : at.x);
    result.y = y + (gtk_widget_get_has_window(widget) ? 0 : at.y);
    return result;
}

static void put_rectangle(GString *out, const char *name, GdkRectangle at)
{
    g_string_append(out, ", ");
    put_name(out, name);
    g_string_append_printf(out, "[%d, %d, %d, %d]", at.x, at.y, at.width, at.height);
}

// What it takes to show the widget whole: its request, for a label its text.
static void put_needs(GString *out, GtkWidget *widget)
{
    GtkRequisition needs;
    gtk_widget_get_requisition(widget, &needs);
    if (GTK_IS_LABEL(widget)) {
        gint x, y;
        gtk_misc_get_padding(GTK_MISC(widget), &x, &y);
        pango_layout_get_pixel_size(gtk_label_get_layout(GTK_LABEL(widget)), &needs.width,
                                    &needs.height);
        needs.width += 2 * x;
        needs.height += 2 * y;
    }
    g_string_append_printf(out, ", \"needs\": [%d, %d]", needs.width, needs.height);
}

static void put_combo(GString *out, GtkComboBox *combo)
{
    GtkTreeModel *model = gtk_combo_box_get_model(combo);
    GtkTreeIter at;
    const char *between = "";
    put_number(out, "active", gtk_combo_box_get_active(combo));
    g_string_append(out, ", \"items\": [");
    if (model != NULL && gtk_tree_model_get_n_columns(model) > 0 &&
        gtk_tree_model_get_column_type(model, 0) == G_TYPE_STRING &&
        gtk_tree_model_get_iter_first(model, &at)) {
        do {
            g_autofree char *text = NULL;
            gtk_tree_model_get(model, &at, 0, &text, -1);
            g_string_append(out, between);
            put_text(out, text);
            between = ", ";
        } while (gtk_tree_model_iter_next(model, &at));
    }
    g_string_append_c(out, ']');
}

static void put_tree(GString *out, GtkWidget *widget);

static void put_child(GtkWidget *child, gpointer data)
{
    GString *out = data;
    if (out->str[out->len - 1] != '[')
        g_string_append(out, ", ");
    put_tree(out, child);
}

static void put_tree(GString *out, GtkWidget *widget)
{
    g_string_append_printf(out, "{\"id\": \"%p\"", (void *)widget);
    put_field(out, "type", G_OBJECT_TYPE_NAME(widget));
    put_field(out, "name", gtk_widget_get_name(widget));
    put_flag(out, "visible", gtk_widget_get_visible(widget));
    put_flag(out, "mapped", gtk_widget_get_mapped(widget));
    put_flag(out, "sensitive", gtk_widget_get_sensitive(widget));
    put_flag(out, "usable", gtk_widget_is_sensitive(widget));
    put_flag(out, "focus", gtk_widget_has_focus(widget));
    put_flag(out, "default", gtk_widget_has_default(widget));
    put_rectangle(out, "rect", on_screen(widget));
    put_needs(out, widget);
    if (GTK_IS_WINDOW(widget)) {
        GdkRectangle frame = {0, 0, 0, 0};
        if (gtk_widget_get_mapped(widget))
            gdk_window_get_frame_extents(gtk_widget_get_window(widget), &frame);
        put_rectangle(out, "frame", frame);
        put_field(out, "title", gtk_window_get_title(GTK_WINDOW(widget)));
        put_flag(out, "modal", gtk_window_get_modal(GTK_WINDOW(widget)));
        put_flag(out, "active", gtk_window_is_active(GTK_WINDOW(widget)));
        put_flag(out, "grab", gtk_grab_get_current() == widget);
    }
    if (GTK_IS_LABEL(widget)) {
        put_field(out, "text", gtk_label_get_text(GTK_LABEL(widget)));
        put_field(out, "label", gtk_label_get_label(GTK_LABEL(widget)));
    }
    if (GTK_IS_BUTTON(widget))
        put_field(out, "label", gtk_button_get_label(GTK_BUTTON(widget)));
    if (GTK_IS_FRAME(widget))
        put_field(out, "label", gtk_frame_get_label(GTK_FRAME(widget)));
    if (GTK_IS_ENTRY(widget)) {
        put_field(out, "text", gtk_entry_get_text(GTK_ENTRY(widget)));
        put_flag(out, "visibility", gtk_entry_get_visibility(GTK_ENTRY(widget)));
    }
    if (GTK_IS_TOGGLE_BUTTON(widget))
        put_flag(out, "active", gtk_toggle_button_get_active(GTK_TOGGLE_BUTTON(widget)));
    if (GTK_IS_COMBO_BOX(widget))
        put_combo(out, GTK_COMBO_BOX(widget));
    g_autofree char *tooltip = gtk_widget_get_tooltip_text(widget);
    if (tooltip != NULL)
        put_field(out, "tooltip", tooltip);
    g_string_append(out, ", \"children\": [");
    if (GTK_IS_CONTAINER(widget))
        gtk_container_forall(GTK_CONTAINER(widget), put_child, out);
    g_string_append(out, "]}");
}

static void answer_tree(GString *out)
{
    GList *windows = gtk_window_list_toplevels();
    g_string_append_c(out, '[');
    for (GList *at = windows; at != NULL; at = at->next)
        put_child(at->data, out);
    g_string_append_c(out, ']');
    g_list_free(windows);
}

typedef struct {
    const char *id;
    GtkWidget *found;
} Search;

static void search_in(GtkWidget *widget, gpointer data)
{
    Search *search = data;
    char id[32];
    g_snprintf(id, sizeof id, "%p", (void *)widget);
    if (strcmp(id, search->id) == 0)
        search->found = widget;
    else if (search->found == NULL && GTK_IS_CONTAINER(widget))
        gtk_container_forall(GTK_CONTAINER(widget), search_in, search);
}

static GtkWidget *widget_of(const char *id)
{
    Search search = {id, NULL};
    GList *windows = gtk_window_list_toplevels();
    for (GList *at = windows; at != NULL && search.found == NULL; at = at->next)
        search_in(at->data, &search);
    g_list_free(windows);
    return search.found;
}

static gpointer registered(const char *key)
{
    gpointer found = NULL;
    GList *windows = gtk_window_list_toplevels();
    for (GList *at = windows; at != NULL; at = at->next)
        if (g_object_get_data(at->data, "button-refresh") != NULL)
            found = g_object_get_data(at->data, key);
    g_list_free(windows);
    return found;
}

static void answer_props(GString *out, const char *id)
{
    GtkWidget *widget = widget_of(id);
    guint count;
    if (widget == NULL) {
        g_string_append(out, "null");
        return;
    }
    GtkWidget *parent = gtk_widget_get_parent(widget);
    g_autofree GParamSpec **specs =
        g_object_class_list_properties(G_OBJECT_GET_CLASS(widget), &count);
    g_string_append(out, "{\"type\": ");
    put_text(out, G_OBJECT_TYPE_NAME(widget));
    gint width, height;
    gtk_widget_get_size_request(widget, &width, &height);
    g_string_append_printf(out, ", \"size-request\": [%d, %d], \"properties\": {", width, height);
    const char *between = "";
    for (guint i = 0; i < count; i++) {
        // Ubuntu's toolkit says of one of its own that it can be read, and cannot read it.
        if ((specs[i]->flags & G_PARAM_READABLE) == 0 ||
            g_str_has_prefix(specs[i]->name, "ubuntu-"))
            continue;
        GValue value = G_VALUE_INIT;
        g_value_init(&value, specs[i]->value_type);
        g_object_get_property(G_OBJECT(widget), specs[i]->name, &value);
        g_string_append(out, between);
        put_name(out, specs[i]->name);
        put_value(out, &value);
        g_value_unset(&value);
        between = ", ";
    }
    g_string_append(out, "}, \"packing\": {");
    between = "";
    if (parent != NULL) {
        g_autofree GParamSpec **packing =
            gtk_container_class_list_child_properties(G_OBJECT_GET_CLASS(parent), &count);
        for (guint i = 0; i < count; i++) {
            GValue value = G_VALUE_INIT;
            g_value_init(&value, packing[i]->value_type);
            gtk_container_child_get_property(GTK_CONTAINER(parent), widget, packing[i]->name,
                                             &value);
            g_string_append(out, between);
            put_name(out, packing[i]->name);
            put_value(out, &value);
            g_value_unset(&value);
            between = ", ";
        }
    }
    g_string_append(out, "}}");
}

static void answer_registry(GString *out, const char *key)
{
    gpointer object = registered(key);
    if (object == NULL) {
        g_string_append(out, "null");
        return;
    }
    g_string_append_printf(out, "{\"id\": \"%p\"", object);
    put_field(out, "type", G_OBJECT_TYPE_NAME(object));
    put_field(out, "name", GTK_IS_WIDGET(object) ? gtk_widget_get_name(object) : NULL);
    g_string_append_c(out, '}');
}

static void put_model(GString *out, GtkTreeModel *model, GtkTreeView *view)
{
    GtkTreeIter at;
    GtkTreeSelection *selection = view != NULL ? gtk_tree_view_get_selection(view) : NULL;
    g_string_append_c(out, '[');
    gboolean more = model != NULL && gtk_tree_model_get_iter_first(model, &at);
    while (more) {
        g_string_append(out, "{\"texts\": [");
        for (int column = 0; column < gtk_tree_model_get_n_columns(model); column++) {
            GValue value = G_VALUE_INIT;
            gtk_tree_model_get_value(model, &at, column, &value);
            g_string_append(out, column > 0 ? ", " : "");
            put_value(out, &value);
            g_value_unset(&value);
        }
        g_string_append_c(out, ']');
        put_flag(out, "selected",
                 selection != NULL && gtk_tree_selection_iter_is_selected(selection, &at));
        g_string_append_c(out, '}');
        more = gtk_tree_model_iter_next(model, &at);
        if (more)
            g_string_append(out, ", ");
    }
    g_string_append_c(out, ']');
}

static void put_clist(GString *out, GtkCList *list)
{
    g_string_append_c(out, '[');
    for (int row = 0; row < list->rows; row++) {
        g_string_append(out, row > 0 ? ", {\"texts\": [" : "{\"texts\": [");
        for (int column = 0; column < list->columns; column++) {
            gchar *text = NULL;
            g_string_append(out, column > 0 ? ", " : "");
            put_text(out, gtk_clist_get_text(list, row, column, &text) ? text : NULL);
        }
        g_string_append_c(out, ']');
        put_flag(out, "selected", g_list_find(list->selection, GINT_TO_POINTER(row)) != NULL);
        g_string_append_c(out, '}');
    }
    g_string_append_c(out, ']');
}

static void answer_rows(GString *out, const char *id)
{
    gpointer object = id[0] == '@' ? registered(id + 1) : (gpointer)widget_of(id);
    if (object == NULL)
        g_string_append(out, "null");
    else if (GTK_IS_TREE_VIEW(object))
        put_model(out, gtk_tree_view_get_model(object), object);
    else if (GTK_IS_TREE_MODEL(object))
        put_model(out, object, NULL);
    else if (GTK_IS_CLIST(object))
        put_clist(out, object);
    else
        g_string_append(out, "null");
}

static void answer_columns(GString *out, const char *id)
{
    GtkWidget *view = widget_of(id);
    GList *columns = GTK_IS_TREE_VIEW(view) ? gtk_tree_view_get_columns(GTK_TREE_VIEW(view)) : NULL;
    g_string_append_c(out, '[');
    for (GList *at = columns; at != NULL; at = at->next) {
        GList *renderers = gtk_cell_layout_get_cells(at->data);
        g_string_append(out, at != columns ? ", {\"title\": " : "{\"title\": ");
        put_text(out, gtk_tree_view_column_get_title(at->data));
        put_number(out, "width", gtk_tree_view_column_get_width(at->data));
        g_string_append(out, ", \"renderers\": [");
        for (GList *one = renderers; one != NULL; one = one->next) {
            g_string_append_printf(out, "%s{\"id\": \"%p\"", one != renderers ? ", " : "",
                                   one->data);
            put_field(out, "type", G_OBJECT_TYPE_NAME(one->data));
            if (GTK_IS_CELL_RENDERER_TEXT(one->data)) {
                GdkColor *color = NULL;
                g_object_get(one->data, "foreground-gdk", &color, NULL);
                g_autofree char *text = color != NULL ? gdk_color_to_string(color) : NULL;
                put_field(out, "foreground", text);
                if (color != NULL)
                    gdk_color_free(color);
            }
            g_string_append_c(out, '}');
        }
        g_string_append(out, "]}");
        g_list_free(renderers);
    }
    g_string_append_c(out, ']');
    g_list_free(columns);
}

static void answer_cell(GString *out, const char *id, int row, int column)
{
    GtkWidget *widget = widget_of(id);
    GdkRectangle at = {0, 0, 0, 0};
    gint x = 0, y = 0;
    if (GTK_IS_TREE_VIEW(widget)) {
        GtkTreeView *view = GTK_TREE_VIEW(widget);
        GtkTreePath *path = gtk_tree_path_new_from_indices(row, -1);
        gtk_tree_view_get_background_area(view, path, gtk_tree_view_get_column(view, column), &at);
        gtk_tree_path_free(path);
        origin_of(gtk_tree_view_get_bin_window(view), &x, &y);
    } else if (GTK_IS_CLIST(widget)) {
        GtkCList *list = GTK_CLIST(widget);
        origin_of(list->clist_window, &x, &y);
        // Rows are one under the other, each with a line of one pixel above it.
        at.x = list->column[column].area.x + list->hoffset;
        at.y = (list->row_height + 1) * row + 1 + list->voffset;
        at.width = list->column[column].area.width;
        at.height = list->row_height;
    }
    g_string_append_printf(out, "[%d, %d, %d, %d]", at.x + x, at.y + y, at.width, at.height);
}

static void answer(GString *out, char *question)
{
    g_auto(GStrv) words = g_strsplit(question, " ", 4);
    guint count = g_strv_length(words);
    located = NULL;
    if (strcmp(words[0], "tree") == 0)
        answer_tree(out);
    else if (strcmp(words[0], "props") == 0 && count == 2)
        answer_props(out, words[1]);
    else if (strcmp(words[0], "registry") == 0)
        answer_registry(out, question + strlen("registry "));
    else if (strcmp(words[0], "rows") == 0)
        answer_rows(out, question + strlen("rows "));
    else if (strcmp(words[0], "columns") == 0 && count == 2)
        answer_columns(out, words[1]);
    else if (strcmp(words[0], "cell") == 0 && count == 4)
        answer_cell(out, words[1], atoi(words[2]), atoi(words[3]));
    else
        g_string_append(out, "{\"error\": \"no such question\"}");
    g_string_append_c(out, '\n');
}

static gboolean send_all(int fd, const char *text, gsize length)
{
    while (length > 0) {
        ssize_t sent = send(fd, text, length, MSG_NOSIGNAL);
        if (sent < 0 && errno == EINTR)
            continue;
        if (sent <= 0)
            return FALSE;
        text += sent;
        length -= (gsize)sent;
    }
    return TRUE;
}

static gboolean cb_question(GIOChannel *channel, GIOCondition condition, gpointer data)
{
    GString *pending = data;
    char block[512];
    char *end;
    (void)condition;
    gdk_flush();
    if (gdk_events_pending())
        return TRUE;
    int fd = g_io_channel_unix_get_fd(channel);
    ssize_t got = recv(fd, block, sizeof block, 0);
    gboolean open = got > 0;
    if (open)
        g_string_append_len(pending, block, got);
    while (open && (end = memchr(pending->str, '\n', pending->len)) != NULL) {
        GString *reply = g_string_new(NULL);
        *end = '\0';
        answer(reply, pending->str);
        open = send_all(fd, reply->str, reply->len);
        g_string_free(reply, TRUE);
        g_string_erase(pending, 0, end + 1 - pending->str);
    }
    if (!open) {
        g_string_free(pending, TRUE);
        close(fd);
    }
    return open;
}

static gboolean cb_connection(GIOChannel *channel, GIOCondition condition, gpointer data)
{
    (void)condition, (void)data;
    int fd = accept4(g_io_channel_unix_get_fd(channel), NULL, NULL, SOCK_CLOEXEC);
    if (fd >= 0) {
        GIOChannel *connection = g_io_channel_unix_new(fd);
        g_io_add_watch_full(connection, G_PRIORITY_LOW, G_IO_IN | G_IO_HUP, cb_question,
                            g_string_new(NULL), NULL);
        g_io_channel_unref(connection);
    }
    return TRUE;
}

G_MODULE_EXPORT int gtk_module_init(gint *argc, char ***argv);
int gtk_module_init(gint *argc, char ***argv)
{
    (void)argc, (void)argv;
    struct sockaddr_un at = {.sun_family = AF_UNIX};
    const char *path = g_getenv("PROBE_SOCKET");
    if (path == NULL)
        return 0;
    g_strlcpy(at.sun_path, path, sizeof at.sun_path);
    unlink(path);
    int fd = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (fd < 0 || bind(fd, (struct sockaddr *)&at, sizeof at) != 0 || listen(fd, 4) != 0) {
        g_printerr("probe: %s: %s\n", path, g_strerror(errno));
        return 0;
    }
    GIOChannel *channel = g_io_channel_unix_new(fd);
    g_io_add_watch_full(channel, G_PRIORITY_LOW, G_IO_IN, cb_connection, NULL, NULL);
    g_io_channel_unref(channel);
    return 0;
}
