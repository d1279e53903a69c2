// SPDX-License-Identifier: MIT
#include "connection/encrypted_dialog.h"

#include <cstdio>
#include <cstring>
#include <initializer_list>

#include <glib/gi18n.h>

#include "base/accessible.h"
#include "base/dialogs.h"
#include "base/entries.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/work_area.h"
#include "preferred/store.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/device.h"
#include "wifi_info/text.h"

constexpr guint PADDING = 5;

// Registry keys of the dialog's controls.
constexpr char AUTHENTICATION_KEY[] = "Authentication_ComboBox";
constexpr char KEY_INDEX_KEY[] = "Key_Index_ComboBox";
constexpr char ENTRY_KEY[] = "connect_key";

// The stored key that the dialog was filled with, NULL: none.
static gchar *sel_key = nullptr;
// The key management and key index that came with it.
static int key_mgmt = 0;
static int key_index = 0;

// The name of the network that the dialog was built for; connect_index may change while it is open.
static char sought_essid[sizeof(WIFI_CELL::essid)] = "";

static GtkWidget *backend_list()
{
    GtkWidget *backend = find_widget(BACKEND_KEY);

    if (backend == nullptr)
        debug_line("user_cell_list_backend get failed.");
    return backend;
}

// What the combo builders return without the preferred lists.
static GtkWidget *invalid_widget()
{
    return static_cast<GtkWidget *>(GINT_TO_POINTER(1));
}

// The first preferred network with the sought name from `row` on, -1 when there is none. Row and
// record are the same network only as far as both exist: rows can have been edited without being
// saved.
static int next_match(GtkWidget *backend, int row)
{
    const int records = MIN(MIN(user_wifi_count, my_wifi->user_cell_count), MAX_USER_CELLS);
    const int rows = MIN(records, GTK_CLIST(backend)->rows);

    for (; row < rows; row++) {
        const WIFI_CELL *record = my_wifi->user_wifi_cell[row];

        if (record != nullptr && strcmp(record->essid, sought_essid) == 0)
            return row;
    }
    return -1;
}

static gboolean wep_active(GtkWidget *authentication)
{
    return gtk_combo_box_get_active(GTK_COMBO_BOX(authentication)) == 0;
}

// "changed" of the authentication combo: only a WEP key has an index.
static void cb_key_index_stat(GtkWidget *, gpointer)
{
    GtkWidget *authentication = find_widget(AUTHENTICATION_KEY);

    if (authentication != nullptr)
        set_widget_sensitive(KEY_INDEX_KEY, wep_active(authentication));
}

// Stores the active item of the combo under `key` in a record and in a variable.
static void take_active(const char *key, guint32 *field, int *global)
{
    GtkWidget *combo = find_widget(key);

    if (combo == nullptr)
        return;
    *global = gtk_combo_box_get_active(GTK_COMBO_BOX(combo));
    *field = static_cast<guint32>(*global);
}

// "changed" of the preferred combo: fills in the stored key of the chosen network, hidden, and
// stores the shown key management and key index in its record, key_mgmt and key_index.
static void cb_change_network(GtkWidget *combobox, gpointer)
{
    GtkWidget *backend = backend_list();
    const int position = gtk_combo_box_get_active(GTK_COMBO_BOX(combobox));

    if (backend == nullptr || position < 0)
        return;

    int row = next_match(backend, 0);

    for (int i = 0; i < position && row >= 0; i++)
        row = next_match(backend, row + 1);
    if (row < 0)
        return;

    WIFI_CELL *record = my_wifi->user_wifi_cell[row];
    GtkWidget *entry = find_widget(ENTRY_KEY);

    if (entry != nullptr) {
        // Visible while it is filled, so that filling it does not count as touching a hidden key.
        gtk_entry_set_visibility(GTK_ENTRY(entry), TRUE);
        fill_text_entry(entry, record->userkey);
        gtk_entry_set_visibility(GTK_ENTRY(entry), FALSE);
        wipe_text(&sel_key);
        sel_key = g_strdup(record->userkey);
    }
    // From the combos to the record, not the other way round: the combos show the last network of
    // the name, and is_new_configuration compares against these two.
    take_active(AUTHENTICATION_KEY, &record->key_mgmt, &key_mgmt);
    take_active(KEY_INDEX_KEY, &record->key_index, &key_index);
}

static GtkWidget *text_combo(std::initializer_list<const char *> items)
{
    GtkWidget *combo = gtk_combo_box_new_text();

    for (const char *item : items)
        gtk_combo_box_append_text(GTK_COMBO_BOX(combo), item);
    gtk_combo_box_set_active(GTK_COMBO_BOX(combo), 0);
    return combo;
}

GtkWidget *create_Authentication_ComboBox()
{
    GtkWidget *backend = backend_list();

    if (backend == nullptr)
        return invalid_widget();

    GtkWidget *combo = text_combo({"WEP", "WPA-PSK/WPA2-PSK"});
    const WIFI_CELL *cell = scanned_cell(connect_index);

    if (has_device_path() && cell != nullptr)
        gtk_combo_box_set_active(GTK_COMBO_BOX(combo), static_cast<gint>(cell->key_mgmt));
    for (int row = next_match(backend, 0); row >= 0; row = next_match(backend, row + 1)) {
        const gchar *number = clist_text(backend, row, LIST_KEY_MGMT);

        printf("%s\n", number);
        set_active_number(combo, number);
    }
    g_signal_connect(combo, "changed", G_CALLBACK(cb_key_index_stat), nullptr);
    return combo;
}

GtkWidget *create_Key_Index_ComboBox()
{
    GtkWidget *backend = backend_list();

    if (backend == nullptr)
        return invalid_widget();

    GtkWidget *combo = create_normal_ComboBox();

    for (int row = next_match(backend, 0); row >= 0; row = next_match(backend, row + 1))
        set_active_number(combo, clist_text(backend, row, LIST_KEY_INDEX));
    return combo;
}

GtkWidget *create_ComboBox(int *n)
{
    GtkWidget *backend = backend_list();

    if (backend == nullptr)
        return invalid_widget();

    GtkWidget *combo = gtk_combo_box_new_text();

    *n = 0;
    for (int row = next_match(backend, 0); row >= 0; row = next_match(backend, row + 1)) {
        const gchar *alias = clist_text(backend, row, LIST_ALIAS);
        g_autofree gchar *item =
            displayable(alias[0] != '\0' ? alias : clist_text(backend, row, LIST_ESSID));

        gtk_combo_box_append_text(GTK_COMBO_BOX(combo), item);
        ++*n;
    }
    gtk_widget_set_sensitive(combo, *n > 0);
    g_signal_connect(combo, "changed", G_CALLBACK(cb_change_network), nullptr);
    return combo;
}

static void remove_hidden_key(GtkEditable *editable)
{
    gtk_entry_set_visibility(GTK_ENTRY(editable), TRUE);
    gtk_editable_delete_text(editable, 0, -1);
}

// "insert-text" and "delete-text" of the key entry: any edit of a hidden key first removes all of
// it, so that a stored key and typed text never mix.
static void cb_key_inserted(GtkEditable *editable, const gchar *, gint, gint *position, gpointer)
{
    if (gtk_entry_get_visibility(GTK_ENTRY(editable)))
        return;
    remove_hidden_key(editable);
    *position = 0;
}

static void cb_key_deleted(GtkEditable *editable, gint, gint, gpointer)
{
    if (gtk_entry_get_visibility(GTK_ENTRY(editable)))
        return;
    remove_hidden_key(editable);
    g_signal_stop_emission_by_name(editable, "delete-text");
}

// "backspace" of the key entry, before the entry's own handler: removes a hidden key as a whole and
// shows what is typed next. Always FALSE.
static gboolean connect_key_cb(GdkEventKey *)
{
    GtkEntry *entry = GTK_ENTRY(find_widget(ENTRY_KEY));

    if (entry == nullptr)
        return FALSE;
    if (!gtk_entry_get_visibility(entry)) {
        // The backspace being handled deletes this space if the cursor is after it.
        gtk_entry_set_text(entry, " ");
        gtk_editable_set_position(GTK_EDITABLE(entry), -1);
    }
    gtk_entry_set_visibility(entry, TRUE);
    return FALSE;
}

// The key in the dialog, NULL when the dialog is gone. An untouched stored key is returned byte for
// byte, even if it is not UTF-8. g_free it.
static gchar *entered_key()
{
    GtkEntry *entry = GTK_ENTRY(find_widget(ENTRY_KEY));

    if (entry == nullptr)
        return nullptr;
    if (sel_key != nullptr && !gtk_entry_get_visibility(entry)) {
        WIPED gchar *shown = displayable(sel_key);

        if (strcmp(gtk_entry_get_text(entry), shown) == 0)
            return g_strdup(sel_key);
    }
    return g_strdup(gtk_entry_get_text(entry));
}

// Reads the active item of the combo under `key` into `field` and prints it after `name`.
static void read_active(const char *key, guint32 *field, const char *name)
{
    GtkWidget *combo = find_widget(key);

    if (combo == nullptr)
        return;
    *field = static_cast<guint32>(gtk_combo_box_get_active(GTK_COMBO_BOX(combo)));
    printf("%s=%d\n", name, static_cast<int>(*field));
}

void read_answers(WIFI_CELL *chosen)
{
    WIPED gchar *key = entered_key();

    read_active(AUTHENTICATION_KEY, &chosen->key_mgmt, "key_mgmt");
    read_active(KEY_INDEX_KEY, &chosen->key_index, "do connect key_index");
    if (key != nullptr)
        copy_field(chosen->userkey, sizeof chosen->userkey, key);
    chosen->encmode = ENC_OPEN;
}

gboolean is_new_configuration(const WIFI_CELL *chosen, int match_count)
{
    if (match_count == 0)
        return TRUE;
    if (sel_key == nullptr)
        return FALSE;
    return strcmp(sel_key, chosen->userkey) != 0 ||
           key_mgmt != static_cast<int>(chosen->key_mgmt) ||
           key_index != static_cast<int>(chosen->key_index);
}

void forget_stored_key()
{
    wipe_text(&sel_key);
}

static void attach(GtkWidget *table, GtkWidget *widget, guint left, guint row)
{
    gtk_table_attach(GTK_TABLE(table), widget, left, 2, row, row + 1, EXPAND_FILL, GTK_FILL,
                     PADDING, PADDING);
}

// Adds a frame across `row` and returns the box in it.
static GtkWidget *attach_frame(GtkWidget *table, const gchar *title, guint row)
{
    GtkWidget *frame = gtk_frame_new(title);
    GtkWidget *box = gtk_hbox_new(FALSE, 0);

    gtk_frame_set_shadow_type(GTK_FRAME(frame), GTK_SHADOW_ETCHED_OUT);
    gtk_container_set_border_width(GTK_CONTAINER(box), PADDING);
    gtk_container_add(GTK_CONTAINER(frame), box);
    attach(table, frame, 0, row);
    return box;
}

// Fills the rest of `box` with a combo; one that could not be built is left out. `name` is read out
// for it; NULL: a label names it.
static void pack_combo(GtkWidget *box, GtkWidget *combo, const gchar *name)
{
    if (combo == invalid_widget())
        return;
    if (name != nullptr)
        name_for_ears(combo, name);
    gtk_box_pack_start(GTK_BOX(box), combo, TRUE, TRUE, 0);
}

static void attach_notice(GtkWidget *table)
{
    GtkWidget *image =
        gtk_image_new_from_stock(GTK_STOCK_DIALOG_AUTHENTICATION, GTK_ICON_SIZE_DIALOG);
    GtkWidget *label = gtk_label_new(_("Encrypted Network,Please enter the key."));

    hide_from_ears(image);
    gtk_table_attach(GTK_TABLE(table), image, 0, 1, 0, 1, GTK_FILL, GTK_FILL, PADDING, PADDING);
    gtk_label_set_line_wrap(GTK_LABEL(label), TRUE);
    gtk_misc_set_alignment(GTK_MISC(label), 0, 0.5);
    attach(table, label, 1, 0);
}

static void pack_key(GtkWidget *box, GtkWidget *entry, GtkWidget *index)
{
    GtkWidget *index_box = gtk_hbox_new(FALSE, 0);
    GtkWidget *label = gtk_label_new(_(" Key index: "));

    name_for_ears(entry, _("Key"));
    request_at_least(entry, 280, 30);
    gtk_widget_set_size_request(index_box, 120, 30);
    gtk_box_pack_start(GTK_BOX(box), entry, TRUE, TRUE, 0);
    gtk_box_pack_start(GTK_BOX(box), index_box, FALSE, FALSE, 0);
    gtk_box_pack_start(GTK_BOX(index_box), label, FALSE, FALSE, 0);
    pack_combo(index_box, index, nullptr);
    if (index != invalid_widget()) {
        GtkRequisition words, needs;

        // The designed sizes stand while they hold the texts.
        gtk_widget_size_request(label, &words);
        gtk_widget_size_request(index, &needs);
        needs.height = MAX(30, needs.height);
        gtk_widget_set_size_request(index, 40, needs.height);
        gtk_widget_set_size_request(
            index_box, words.width + 40 > 120 ? words.width + needs.width : 120, needs.height);
        gtk_label_set_mnemonic_widget(GTK_LABEL(label), index);
    }
}

static GtkWidget *create_dialog_window()
{
    GtkWidget *dialog = create_dialog(_("Encrypted Network"), nullptr, DEFAULT_NONE);

    gtk_window_set_default_size(GTK_WINDOW(dialog), 400, 320);
    gtk_window_set_policy(GTK_WINDOW(dialog), FALSE, FALSE, TRUE);
    gtk_window_set_keep_above(GTK_WINDOW(dialog), TRUE);
    return dialog;
}

static void cb_key_entered(GtkEntry *, gpointer dialog)
{
    gtk_dialog_response(GTK_DIALOG(dialog), GTK_RESPONSE_OK);
}

static GtkWidget *create_key_entry(GtkWidget *dialog, gboolean hidden)
{
    GtkWidget *entry = gtk_entry_new();

    register_named_widget(entry, ENTRY_KEY);
    gtk_entry_set_visibility(GTK_ENTRY(entry), !hidden);
    g_signal_connect(entry, "insert-text", G_CALLBACK(cb_key_inserted), nullptr);
    g_signal_connect(entry, "delete-text", G_CALLBACK(cb_key_deleted), nullptr);
    limit_text_entry(entry);
    g_signal_connect(entry, "backspace", G_CALLBACK(connect_key_cb), nullptr);
    g_signal_connect(entry, "activate", G_CALLBACK(cb_key_entered), dialog);
    return entry;
}

GtkWidget *create_encrypted_dialog(int *match_count)
{
    const WIFI_CELL *cell = scanned_cell(connect_index);

    copy_field(sought_essid, sizeof sought_essid, cell != nullptr ? cell->essid : "");
    forget_stored_key();

    GtkWidget *dialog = create_dialog_window();
    g_autofree gchar *network = displayable(sought_essid);
    GtkWidget *table = gtk_table_new(4, 2, FALSE);
    GtkWidget *authentication = create_Authentication_ComboBox();
    GtkWidget *preferred = create_ComboBox(match_count);
    GtkWidget *entry = create_key_entry(dialog, *match_count > 0);
    GtkWidget *index = create_Key_Index_ComboBox();

    debug_line("create_ComboBox match_count=%d", *match_count);
    describe_for_ears(dialog, network);
    gtk_container_set_border_width(GTK_CONTAINER(table), 5);
    gtk_container_add(GTK_CONTAINER(gtk_dialog_get_content_area(GTK_DIALOG(dialog))), table);
    attach_notice(table);
    pack_combo(attach_frame(table, _("Authentication"), 1), authentication, _("Authentication"));
    pack_combo(attach_frame(table, _("Preferred Network"), 2), preferred, _("Preferred Network"));
    pack_key(attach_frame(table, _("Key"), 3), entry, index);

    if (authentication != invalid_widget())
        register_named_widget(authentication, AUTHENTICATION_KEY);
    if (index != invalid_widget())
        register_named_widget(index, KEY_INDEX_KEY);
    cb_key_index_stat(nullptr, nullptr);
    // Emits "changed", which fills in the first network: everything else must exist by now.
    if (preferred != invalid_widget() && *match_count > 0)
        gtk_combo_box_set_active(GTK_COMBO_BOX(preferred), 0);
    // Last, because focusing selects the whole key, so that typing replaces it.
    gtk_widget_grab_focus(entry);
    return dialog;
}
