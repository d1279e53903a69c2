// SPDX-License-Identifier: MIT
// A random user operates the preferred networks through the program's own callbacks and dialogs.
// After every step a simple model of the list predicts rows, selection, records and file. SEQUENCES
// and SEED in the environment give the number of sequences and the first one.

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <gtk/gtk.h>

#include "base/registry.h"
#include "base/state.h"
#include "preferred/list_dialog.h"
#include "preferred/store.h"
#include "support/model.h"
#include "wifi.h"
#include "wifi_info/preferred_file.h"
#include "wifi_info/replace_file.h"
#include "wifi_info/text.h"

using std::string;

// --- the model ----------------------------------------------------------------------------------

struct network {
    string alias, essid, mode, enc, key, key_mgmt, key_index;
};

struct form_state {
    string alias, essid, key;
    gboolean wpa, adhoc;
    int enc; // 0: off, 1: open, 2: restricted
    int key_index;
};

static const char *const enc_names[] = {"ENC_OFF", "ENC_OPEN", "ENC_RESTRICTED"};

static std::vector<network> rows;  // what the two lists must hold
static std::vector<network> saved; // what the records must hold
static string file_text;           // what the file must hold
static string written;             // what the program wrote to it
static int selected;
static gboolean file_fails; // the next save fails

// --- complaints ---------------------------------------------------------------------------------

static FILE *report; // standard error; the program's own lines go nowhere
static guint sequence_seed;
static string history;
static guint steps;

static void note(const char *format, ...) G_GNUC_PRINTF(1, 2);
static void note(const char *format, ...)
{
    va_list arguments;

    va_start(arguments, format);
    g_autofree gchar *text = g_strdup_vprintf(format, arguments);
    va_end(arguments);
    history += string(" ") + text;
    steps++;
}

[[noreturn]] static void fail(const char *what, const string &is, const string &wanted)
{
    fprintf(report, "%s is \"%s\", must be \"%s\"\nafter, with seed %u:%s\n", what, is.c_str(),
            wanted.c_str(), sequence_seed, history.c_str());
    // A dialog may be open, so the test cannot continue.
    exit(EXIT_FAILURE);
}

static void expect(const char *what, const string &is, const string &wanted)
{
    if (is != wanted)
        fail(what, is, wanted);
}

static void expect(const char *what, int is, int wanted)
{
    expect(what, std::to_string(is), std::to_string(wanted));
}

static void log_is_failure(const gchar *domain, GLogLevelFlags, const gchar *message, gpointer)
{
    fail(domain != nullptr ? domain : "a message", message, "");
}

// --- chance -------------------------------------------------------------------------------------

static GRand *chance;

static int below(int limit)
{
    return g_rand_int_range(chance, 0, limit);
}

static gboolean one_in(int times)
{
    return below(times) == 0;
}

static string some_text(gboolean typed)
{
    static const char *const texts[] = {
        "",
        "",
        "home",
        "a",
        "two words",
        "caf\xc3\xa9",
        "<b>&amp;",
        "\"$(x)\"",
        "%s%n",
        "\\",
        "a\nUSERCELL",
        "off",
        "100%",
        "12345",
        "_under",
        "\xe4\xbd\xa0\xe5\xa5\xbd",
    };
    static const char *const bytes[] = {"caf\xe9", "\xff\xfe", "ok\xc3"};
    const int choice = below(24);

    if (choice == 0)
        return string(static_cast<size_t>(120 + below(20)), 'x') + "\xc3\xa9\xc3\xa9";
    if (choice == 1 && !typed)
        return bytes[below(G_N_ELEMENTS(bytes))];
    if (choice < 6)
        return "net" + std::to_string(below(1000));
    return texts[below(G_N_ELEMENTS(texts))];
}

// --- what must follow from the model ------------------------------------------------------------

static string valid(const string &text)
{
    g_autofree gchar *made = g_utf8_make_valid(text.c_str(), -1);

    return made;
}

// At most 127 bytes, no part of a character at the end, as entries and records take them. Only long
// texts are cut here, and those are valid.
static string field(const string &text)
{
    const gchar *end = text.c_str() + 127;

    if (text.size() <= 127)
        return text;
    if ((static_cast<guchar>(*end) & 0xC0) == 0x80)
        end = g_utf8_find_prev_char(text.c_str(), end);
    return string(text.c_str(), end);
}

static string shown(const network &one)
{
    return valid(one.alias.empty() ? one.essid : one.alias);
}

static guint32 number(const string &text)
{
    return static_cast<guint32>(atoi(text.c_str()));
}

static t_encmode encryption(const network &one)
{
    return one.enc == "ENC_OFF" ? ENC_OFF : one.enc == "ENC_OPEN" ? ENC_OPEN : ENC_RESTRICTED;
}

static string file_of(const std::vector<network> &networks)
{
    std::vector<model::preferred> records;

    for (const network &one : networks)
        records.push_back({one.alias, one.essid, one.mode, one.key, number(one.key_mgmt),
                           number(one.key_index), encryption(one)});
    return model::write_preferred(records);
}

static std::vector<network> cut(std::vector<network> networks)
{
    for (network &one : networks) {
        one.alias = field(one.alias);
        one.essid = field(one.essid);
        one.key = field(one.key);
    }
    return networks;
}

static void model_save()
{
    saved = cut(rows);
    if (!file_fails)
        file_text = file_of(saved);
}

// --- what the program shows ---------------------------------------------------------------------

static string cell(const char *list, size_t row, gint column)
{
    return clist_text(find_widget(list), static_cast<gint>(row), column);
}

static void check_rows()
{
    const GtkCList *front = GTK_CLIST(find_widget(FRONT_KEY));

    expect("the count", user_wifi_count, static_cast<int>(rows.size()));
    expect("the front list's length", front->rows, static_cast<int>(rows.size()));
    expect("the hidden list's length", GTK_CLIST(find_widget(BACKEND_KEY))->rows,
           static_cast<int>(rows.size()));
    for (size_t i = 0; i < rows.size(); i++) {
        const network &one = rows[i];

        expect("the shown name", cell(FRONT_KEY, i, 0), shown(one));
        expect("the alias", cell(BACKEND_KEY, i, LIST_ALIAS), one.alias);
        expect("the name", cell(BACKEND_KEY, i, LIST_ESSID), one.essid);
        expect("the mode", cell(BACKEND_KEY, i, LIST_MODE), one.mode);
        expect("the encryption", cell(BACKEND_KEY, i, LIST_ENC), one.enc);
        expect("the key", cell(BACKEND_KEY, i, LIST_KEY), one.key);
        expect("the key management", cell(BACKEND_KEY, i, LIST_KEY_MGMT), one.key_mgmt);
        expect("the key index", cell(BACKEND_KEY, i, LIST_KEY_INDEX), one.key_index);
    }
    expect("the selection", my_wifi->user_cell_index, selected);
}

static void check_highlight()
{
    const GtkCList *front = GTK_CLIST(find_widget(FRONT_KEY));
    const GList *chosen = front->selection;

    expect("the highlight", chosen != nullptr ? GPOINTER_TO_INT(chosen->data) : -1, selected);
    expect("highlighted rows", static_cast<int>(g_list_length(front->selection)),
           selected >= 0 ? 1 : 0);
    if (front->focus_row >= MAX(front->rows, 1))
        fail("the keyboard's row", std::to_string(front->focus_row), "a row");
}

static void check_saved()
{
    expect("the number of records", my_wifi->user_cell_count, static_cast<int>(saved.size()));
    for (size_t i = 0; i < saved.size(); i++) {
        const WIFI_CELL *record = my_wifi->user_wifi_cell[i];
        const network &one = saved[i];

        expect("the record's alias", record->alias, one.alias);
        expect("the record's name", record->essid, one.essid);
        expect("the record's mode", record->mode, one.mode);
        expect("the record's encryption", enc_names[record->encmode], one.enc);
        expect("the record's key", record->userkey, one.key);
        expect("the record's key management", std::to_string(record->key_mgmt), one.key_mgmt);
        expect("the record's key index", std::to_string(record->key_index), one.key_index);
    }
    expect("the file", written, file_text);
}

// --- hands --------------------------------------------------------------------------------------

static std::function<void()> next;

// What the user does once the program waits again, in whichever dialog that is.
static void then(std::function<void()> action)
{
    next = std::move(action);
    // Most users act before a dialog is drawn, because drawing takes most of the time.
    g_idle_add_full(
        one_in(10) ? G_PRIORITY_DEFAULT_IDLE : G_PRIORITY_HIGH_IDLE,
        [](gpointer) -> gboolean {
            const std::function<void()> now = std::move(next);

            next = nullptr;
            now();
            return FALSE;
        },
        nullptr, nullptr);
}

static GtkWidget *top_dialog()
{
    GtkWidget *dialog = gtk_grab_get_current();

    if (!GTK_IS_DIALOG(dialog))
        fail("the window in front", "none", "a dialog");
    return dialog;
}

static void expect_title(const char *title)
{
    expect("the dialog", gtk_window_get_title(GTK_WINDOW(top_dialog())), title);
}

static void answer(int response)
{
    gtk_dialog_response(GTK_DIALOG(top_dialog()), response);
}

static int some_refusal()
{
    return one_in(4) ? GTK_RESPONSE_DELETE_EVENT : GTK_RESPONSE_REJECT;
}

static void find_label(GtkWidget *widget, gpointer found)
{
    if (GTK_IS_LABEL(widget) && !GTK_IS_BUTTON(gtk_widget_get_parent(widget)))
        *static_cast<string *>(found) += gtk_label_get_text(GTK_LABEL(widget));
    if (GTK_IS_CONTAINER(widget) && !GTK_IS_BUTTON_BOX(widget))
        gtk_container_forall(GTK_CONTAINER(widget), find_label, found);
}

// Closes a message box with this text.
static void dismiss(const char *text)
{
    string found;

    find_label(top_dialog(), &found);
    if (found.find(text) == string::npos)
        fail("the message", found, text);
    answer(GTK_RESPONSE_CLOSE);
}

// --- the form -----------------------------------------------------------------------------------

struct form_names {
    const char *title, *alias, *essid, *wep, *wpa, *modes, *managed, *adhoc, *states, *enc[3],
        *key_row, *key, *key_index;
};

static const form_names add_names = {
    "Add WiFi Network", "add_alias",
    "add_essid",        "add_wep",
    "add_wpa",          "mode_container",
    "add_mode_managed", "add_mode_ad-hoc",
    "wep_container",    {"add_enc_off", "add_enc_open", "add_enc_restricted"},
    "add_key_hbox",     "add_key",
    "add_key_index"};
static const form_names edit_names = {
    "Properties",
    "properties_alias",
    "properties_essid",
    "properties_add_wep",
    "properties_add_wpa",
    "properties_mode_container",
    "properties_mode_managed",
    "properties_mode_ad-hoc",
    "properties_wep_container",
    {"properties_enc_off", "properties_enc_open", "properties_enc_restricted"},
    "properties_key_hbox",
    "properties_key",
    "properties_key_index"};

static const form_names *names;
static form_state form;

static gboolean key_usable()
{
    return form.wpa || form.enc != 0;
}

static string entry(const char *key)
{
    return gtk_entry_get_text(GTK_ENTRY(find_widget(key)));
}

static int usable(const char *key)
{
    return gtk_widget_is_sensitive(find_widget(key)) ? 1 : 0;
}

static int chosen(const char *key)
{
    return gtk_toggle_button_get_active(GTK_TOGGLE_BUTTON(find_widget(key))) ? 1 : 0;
}

static void check_form()
{
    expect_title(names->title);
    expect("the alias entry", entry(names->alias), form.alias);
    expect("the name entry", entry(names->essid), form.essid);
    expect("the key entry", entry(names->key), form.key);
    expect("WEP", chosen(names->wep), !form.wpa);
    expect("WPA", chosen(names->wpa), form.wpa);
    expect("Managed", chosen(names->managed), !form.adhoc);
    expect("Ad-Hoc", chosen(names->adhoc), form.adhoc);
    for (int i = 0; i < 3; i++)
        expect(names->enc[i], chosen(names->enc[i]), i == form.enc);
    expect("the key index combo",
           gtk_combo_box_get_active(GTK_COMBO_BOX(find_widget(names->key_index))), form.key_index);
    expect("the mode row usable", usable(names->modes), !form.wpa);
    expect("the key state row usable", usable(names->states), !form.wpa);
    expect("the key row usable", usable(names->key), key_usable());
    expect("the key index usable", usable(names->key_index), !form.wpa && form.enc != 0);
}

static void enter(const char *key, string &value)
{
    value = field(some_text(TRUE));
    note("%s:=%s", key, value.c_str());
    gtk_entry_set_text(GTK_ENTRY(find_widget(key)), value.c_str());
}

static void pick(const char *key)
{
    note("%s", key);
    gtk_button_clicked(GTK_BUTTON(find_widget(key)));
}

static void touch_form()
{
    const int choice = below(9);

    if (choice == 0) {
        enter(names->alias, form.alias);
    } else if (choice <= 2) {
        enter(names->essid, form.essid);
    } else if (choice <= 4 && key_usable()) {
        enter(names->key, form.key);
    } else if (choice == 5) {
        const gboolean wpa = one_in(2);

        pick(wpa ? names->wpa : names->wep);
        if (wpa != form.wpa)
            form.enc = wpa ? 1 : 0;
        form.wpa = wpa;
    } else if (choice == 6 && !form.wpa) {
        form.adhoc = one_in(2);
        pick(form.adhoc ? names->adhoc : names->managed);
    } else if (choice == 7 && !form.wpa) {
        form.enc = below(3);
        pick(names->enc[form.enc]);
    } else if (choice == 8 && !form.wpa && form.enc != 0) {
        form.key_index = below(4);
        note("key index %d", form.key_index);
        gtk_combo_box_set_active(GTK_COMBO_BOX(find_widget(names->key_index)), form.key_index);
    }
    check_form();
}

// The text of an entry, or the bytes of the column if the entry still shows them.
static void model_store(string &column, const string &text)
{
    if (text != valid(column))
        column = text;
}

// The effect of OK on the model, and the message that it must show (NULL: none).
static const char *model_form_ok()
{
    const gboolean editing = names == &edit_names;
    network added;
    network &one = editing ? rows[static_cast<size_t>(selected)] : added;

    model_store(one.alias, form.alias);
    if (form.essid.empty())
        return "Please enter the ESSID.";
    model_store(one.essid, form.essid);
    one.key_mgmt = form.wpa ? "1" : "0";
    one.key_index = std::to_string(form.key_index);
    one.mode = form.adhoc ? "Ad-Hoc" : "Managed";
    one.enc = enc_names[form.enc];
    if (form.key.empty() && key_usable())
        return "Please enter the Key.";
    model_store(one.key, form.key);
    if (editing)
        return nullptr;
    if (rows.size() == MAX_USER_CELLS)
        return "The list is full";
    rows.push_back(added);
    selected = static_cast<int>(rows.size()) - 1;
    return nullptr;
}

// The text of the front list is updated only when there is an ESSID.
static void check_refused(const char *warning, const string &before)
{
    if (names == &edit_names && string(warning) == "Please enter the ESSID.") {
        expect("the shown name", cell(FRONT_KEY, static_cast<size_t>(selected), 0), before);
        expect("the alias", cell(BACKEND_KEY, static_cast<size_t>(selected), LIST_ALIAS),
               rows[static_cast<size_t>(selected)].alias);
    } else {
        check_rows();
    }
}

// After a refused attempt without an ESSID the front list is unchanged until the next accepted one.
static gboolean front_stale;
static string stale_text;

static void use_form()
{
    check_form();
    for (int touches = below(7); touches > 0; touches--)
        touch_form();
    if (one_in(4)) {
        note("cancel");
        answer(some_refusal());
        return;
    }

    const string before =
        names == &edit_names ? cell(FRONT_KEY, static_cast<size_t>(selected), 0) : "";
    const char *warning = model_form_ok();

    note("ok(%s)", warning != nullptr ? warning : "");
    if (warning != nullptr) {
        if (names == &edit_names)
            front_stale = string(warning) == "Please enter the ESSID.";
        stale_text = before;
        then([warning, before] {
            check_refused(warning, before);
            then(use_form);
            dismiss(warning);
        });
    } else {
        front_stale = FALSE;
    }
    answer(GTK_RESPONSE_OK);
}

// --- the list dialog ----------------------------------------------------------------------------

static void press(const char *key)
{
    gtk_button_clicked(GTK_BUTTON(find_widget(key)));
}

static void add()
{
    note("add");
    names = &add_names;
    form = {"", "", "", FALSE, FALSE, 0, 0};
    then(use_form);
    press("preferred_button_add");
}

static void edit()
{
    note("properties");
    if (selected < 0) {
        press("preferred_button_properties");
        return;
    }

    const network &one = rows[static_cast<size_t>(selected)];

    names = &edit_names;
    form.alias = valid(one.alias);
    form.essid = valid(one.essid);
    form.key = valid(one.key);
    form.wpa = one.key_mgmt == "1";
    form.adhoc = one.mode == "Ad-Hoc";
    form.enc = form.wpa || one.enc == "ENC_OPEN" ? 1 : one.enc == "ENC_OFF" ? 0 : 2;
    form.key_index = one.key_index.size() == 1 && one.key_index < "4" ? one.key_index[0] - '0' : 0;
    front_stale = FALSE;
    then(use_form);
    press("preferred_button_properties");
    if (!front_stale)
        return;
    // The rest of the test compares names, but here the row keeps what the user left, with the old
    // name shown.
    expect("the shown name", cell(FRONT_KEY, static_cast<size_t>(selected), 0), stale_text);
    gtk_clist_set_text(GTK_CLIST(find_widget(FRONT_KEY)), selected, 0,
                       shown(rows[static_cast<size_t>(selected)]).c_str());
}

static void remove()
{
    note("delete");
    if (selected < 0) {
        press("preferred_button_delete");
        return;
    }

    const gboolean yes = !one_in(3);
    const string name = shown(rows[static_cast<size_t>(selected)]);

    then([yes, name] {
        string question;

        expect_title("Delete Network");
        find_label(top_dialog(), &question);
        expect("the question", question, "Do you want to detele the network\n" + name + "?");
        answer(yes ? static_cast<int>(GTK_RESPONSE_OK) : some_refusal());
    });
    if (yes) {
        note("yes");
        rows.erase(rows.begin() + selected);
        selected = MIN(selected, static_cast<int>(rows.size()) - 1);
    }
    press("preferred_button_delete");
}

static void move(int step)
{
    const int to = selected + step;

    note(step < 0 ? "up" : "down");
    if (step < 0)
        cb_user_list_up(nullptr, nullptr);
    else
        cb_user_list_down(nullptr, nullptr);
    if (selected < 0 || to < 0 || to >= static_cast<int>(rows.size()))
        return;
    std::swap(rows[static_cast<size_t>(selected)], rows[static_cast<size_t>(to)]);
    selected = to;
}

static void choose_row()
{
    if (rows.empty())
        return;

    GtkCList *front = GTK_CLIST(find_widget(FRONT_KEY));
    const int row = below(static_cast<int>(rows.size()));

    note("row %d", row);
    if (row != selected) {
        gtk_clist_select_row(front, row, 0);
        selected = row;
        return;
    }
    // As a second click does.
    gtk_clist_unselect_row(front, row, 0);
    while (front->selection == nullptr && g_main_context_iteration(nullptr, FALSE)) {
    }
}

static void use_list()
{
    expect_title("Preferred Network Setting");
    check_rows();
    check_highlight();
    for (int actions = 1 + below(6); actions > 0; actions--) {
        switch (below(8)) {
        case 0:
        case 1:
            choose_row();
            break;
        case 2:
            move(-1);
            break;
        case 3:
            move(1);
            break;
        case 4:
        case 5:
            add();
            break;
        case 6:
            remove();
            break;
        case 7:
            edit();
            break;
        }
        check_rows();
        check_highlight();
        check_saved();
    }
    if (one_in(3)) {
        note("CANCEL");
        rows = saved;
        selected = -1;
        answer(some_refusal());
        return;
    }
    file_fails = one_in(12);
    note(file_fails ? "OK, disk full" : "OK");
    model_save();
    if (file_fails)
        then([] { dismiss("could not be saved"); });
    answer(GTK_RESPONSE_OK);
}

// Between two openings a network is added from outside, like one whose key is kept after
// connecting.
static void keep_network()
{
    const network one = {some_text(TRUE), "kept", "Managed", "ENC_OPEN", "k", "1", "0"};
    const gchar *const texts[LIST_COLUMNS] = {
        one.alias.c_str(), one.essid.c_str(),    one.mode.c_str(),     one.enc.c_str(),
        one.key.c_str(),   one.key_mgmt.c_str(), one.key_index.c_str()};

    note("keep");
    file_fails = FALSE;
    expect("room for a network", append_user_cell_row(texts), rows.size() < MAX_USER_CELLS);
    if (rows.size() == MAX_USER_CELLS)
        return;
    rows.push_back(one);
    selected = static_cast<int>(rows.size()) - 1;
    save_user_cell_clist();
    model_save();
}

// --- sequences ----------------------------------------------------------------------------------

static void start_up()
{
    const int count = one_in(20) ? 62 + below(3) : below(5);

    rows.clear();
    for (int i = 0; i < count; i++) {
        const string key = some_text(FALSE);
        network one = {some_text(FALSE),
                       some_text(FALSE),
                       one_in(4)    ? "Ad-Hoc"
                       : one_in(10) ? "Master"
                                    : "Managed",
                       enc_names[below(3)],
                       key,
                       std::to_string(below(2)),
                       std::to_string(below(5))};

        rows.push_back(one);
    }
    rows = cut(rows);
    for (int i = 0; i < MAX_USER_CELLS; i++) {
        g_free(my_wifi->user_wifi_cell[i]);
        my_wifi->user_wifi_cell[i] = nullptr;
    }
    for (size_t i = 0; i < rows.size(); i++) {
        WIFI_CELL *record = g_new0(WIFI_CELL, 1);
        const network &one = rows[i];

        g_strlcpy(record->alias, one.alias.c_str(), sizeof record->alias);
        g_strlcpy(record->essid, one.essid.c_str(), sizeof record->essid);
        g_strlcpy(record->mode, one.mode.c_str(), sizeof record->mode);
        g_strlcpy(record->userkey, one.key.c_str(), sizeof record->userkey);
        record->encmode = encryption(one);
        record->key_mgmt = number(one.key_mgmt);
        record->key_index = number(one.key_index);
        my_wifi->user_wifi_cell[i] = record;
    }
    my_wifi->user_cell_count = count;
    saved = rows;
    written = file_text = file_of(saved);
    selected = -1;
    global_build_list = build_user_cell_clist();
}

static void run_sequence()
{
    history.clear();
    file_fails = FALSE;
    start_up();
    for (int openings = 1 + below(2); openings > 0; openings--) {
        note("| open");
        rows = saved;
        selected = -1;
        then(use_list);
        cb_preferred_network_setting(nullptr, nullptr);
        check_rows();
        check_saved();
        if (one_in(3)) {
            keep_network();
            check_rows();
            check_saved();
        }
    }
}

static int living = 0; // widgets seen and not finalized yet

static void count_finalized(gpointer, GObject *)
{
    living--;
}

static void count_living(GtkWidget *widget, gpointer)
{
    living++;
    g_object_weak_ref(G_OBJECT(widget), count_finalized, nullptr);
    if (GTK_IS_CONTAINER(widget))
        gtk_container_forall(GTK_CONTAINER(widget), count_living, nullptr);
}

// Opening the list leaves no widget behind. The leak sanitizer watches other memory; the heap in
// use says little, because GTK+ keeps some bytes for every dialog.
static void check_growth()
{
    for (int i = 0; i < 1000; i++) {
        g_idle_add_full(
            G_PRIORITY_HIGH_IDLE,
            [](gpointer) -> gboolean {
                count_living(top_dialog(), nullptr);
                expect("widgets of the open list", living > 20 ? "many" : "few", "many");
                answer(GTK_RESPONSE_REJECT);
                return FALSE;
            },
            nullptr, nullptr);
        cb_preferred_network_setting(nullptr, nullptr);
        while (gtk_events_pending())
            gtk_main_iteration();
        expect("widgets left by an opening", std::to_string(living), "0");
    }
}

// Replace the program's functions: the file is a text.
gboolean replace_file(const char *path, const char *content, gsize length, GError **error)
{
    expect("the file's name", path, USER_FILE);
    if (file_fails) {
        g_set_error(error, G_FILE_ERROR, G_FILE_ERROR_NOSPC, "No space left on device");
        return FALSE;
    }
    written.assign(content, length);
    return TRUE;
}

// No file in this test is one that could not be read whole.
gboolean keep_old_file(const char *path, GError **)
{
    fail("the file to keep", path, "none");
}

static int from_environment(const char *name, int otherwise)
{
    const gchar *value = g_getenv(name);

    return value != nullptr ? atoi(value) : otherwise;
}

struct PreferredModel : testing::Test {
    FILE *output = stdout;

    static void SetUpTestSuite()
    {
        gtk_init(nullptr, nullptr);
        report = stderr;
        g_log_set_default_handler(log_is_failure, nullptr);
        my_wifi_init();
        mainwindow = gtk_window_new(GTK_WINDOW_TOPLEVEL);
    }

    void SetUp() override
    {
        stdout = stderr = fopen("/dev/null", "w");
    }

    void TearDown() override
    {
        fclose(stderr);
        stdout = output;
        stderr = report;
    }
};

TEST_F(PreferredModel, RandomSequences)
{
    const int sequences = from_environment("SEQUENCES", 2000);
    const auto first_seed = static_cast<guint>(from_environment("SEED", 1));

    for (int i = 0; i < sequences; i++) {
        sequence_seed = first_seed + static_cast<guint>(i);
        chance = g_rand_new_with_seed(sequence_seed);
        run_sequence();
        g_rand_free(chance);
    }
    fprintf(report, "%d sequences, %u steps\n", sequences, steps);
}

TEST_F(PreferredModel, OpeningsLeaveNoWidget)
{
    check_growth();
}
