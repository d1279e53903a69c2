// SPDX-License-Identifier: MIT
#include "connection/flow.h"

#include <cstdio>
#include <cstring>

#include <glib/gi18n.h>

#include "base/controls.h"
#include "base/desktop.h"
#include "base/dialogs.h"
#include "base/list_keyboard.h"
#include "base/network_list.h"
#include "base/registry.h"
#include "base/state.h"
#include "base/work_area.h"
#include "connection/add_to_preferred.h"
#include "connection/chosen_network.h"
#include "connection/commands.h"
#include "connection/encrypted_dialog.h"
#include "connection/monitor.h"
#include "connection/question.h"
#include "wifi.h"
#include "wifi_info/debug.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/text.h"

// Long enough for the new status to be drawn before the commands block the window.
constexpr guint COMMAND_DELAY_MS = 100;

// Reports that the chosen network is no longer listed; its key must not be used for another one.
static void end_without_network()
{
    debug_line("the chosen network is gone, it is not connected");
    if (!controls_held(HOLD_REFRESH | HOLD_HOST))
        set_title_label(_("Wireless network selection"));
    give_controls_back();
}

// Without the files for the device's scripts /sbin/iwset would join with the name and key of
// another.
static void end_without_files()
{
    review_tree_vanpro(_("Not Connect"));

    WIFI_CELL *cell = scanned_cell(connect_index);

    if (cell != nullptr)
        cell->linkstate = 2;
    if (!controls_held(HOLD_REFRESH | HOLD_HOST))
        set_title_label(_("Wireless network selection"));
    give_controls_back();
    show_warring_dialog(mainwindow,
                        _("The name and the key cannot be left in /tmp for the device.\n"
                          "The network is not set up."));
}

static void show_connecting()
{
    connect_button_sensitive(FALSE);
    review_tree_vanpro(_("Connect network..."));
    set_title_label(_("Connect network..."));
}

// One-shot timer: finds the network that `data` (a WIFI_CELL) is a copy of, or with NULL takes the
// one at connect_index, joins it and starts the link poller. When the network is gone the connect
// ends. Always FALSE.
static gboolean do_connect(gpointer data)
{
    const WIFI_CELL *chosen = static_cast<const WIFI_CELL *>(data);

    if (chosen != nullptr) {
        WIFI_CELL *cell = find_chosen_network(chosen);

        if (cell == nullptr) {
            end_without_network();
            return FALSE;
        }
        take_answers_over(cell, chosen);
        // A refresh that has ended in the meantime has filled the list and released its controls.
        if (!controls_held(HOLD_CONNECT))
            show_connecting();
    }
    if (apply_configuration())
        g_timeout_add(POLL_MS, detect_network_link_state, nullptr);
    else
        end_without_files();
    return FALSE;
}

// One-shot timer: leaves the network. Always FALSE.
static gboolean do_disconnect(gpointer)
{
    leave_network();
    send_status_to_desktop(STATUS_DISCONNECTED);
    // A connect that has begun since then owns the list, the button and connect_index.
    if (controls_held(HOLD_CONNECT))
        return FALSE;
    review_tree_vanpro(_("Disconnect"));

    WIFI_CELL *cell = scanned_cell(connect_index);

    if (cell != nullptr)
        cell->linkstate = 2;
    set_connect_label(GTK_STOCK_CONNECT);
    connect_index = -1;
    return FALSE;
}

static void wipe_copy(gpointer copy)
{
    explicit_bzero(copy, sizeof(WIFI_CELL));
    g_free(copy);
}

static void start_connect(const WIFI_CELL *chosen)
{
    WIFI_CELL *copy = g_new(WIFI_CELL, 1);

    *copy = *chosen;
    send_status_to_desktop(STATUS_DISCONNECTED);
    g_timeout_add_full(G_PRIORITY_DEFAULT, COMMAND_DELAY_MS, do_connect, copy, wipe_copy);
    show_connecting();
    doubleclick = FALSE;
}

// Asks for the name of a hidden network. FALSE when the network is gone.
static gboolean ask_name(WIFI_CELL *chosen)
{
    // The parent of the question is a window of its own that is never shown.
    GtkWidget *parent = gtk_window_new(GTK_WINDOW_TOPLEVEL);
    g_autofree gchar *name = ask_text(parent, _("The essid is empty,Please input the Essid: "),
                                      _("Essid:"), ENTER_ANSWERS);

    gtk_widget_destroy(parent);

    WIFI_CELL *cell = find_chosen_network(chosen);

    if (cell == nullptr)
        return FALSE;
    if (name != nullptr) {
        copy_field(cell->essid, sizeof cell->essid, name);
        copy_field(chosen->essid, sizeof chosen->essid, name);

        g_autofree gchar *shown = printable(chosen->essid);

        printf("input essid = %s \n", shown);
    }
    return TRUE;
}

// Runs the dialog of an encrypted network and connects on OK. A refresh may remove the network
// while a dialog is open, so it is looked up again after each.
static void connect_encrypted(WIFI_CELL *chosen)
{
    int match_count = 0;
    GtkWidget *dialog = begin_dialog(create_encrypted_dialog(&match_count));

    show_dialog(dialog);
    if (gtk_dialog_run(GTK_DIALOG(dialog)) == GTK_RESPONSE_OK) {
        read_answers(chosen);

        WIFI_CELL *cell = find_chosen_network(chosen);

        if (cell != nullptr) {
            take_answers_over(cell, chosen);
            if (is_new_configuration(chosen, match_count))
                Add2Preferred(dialog);
        }
        if (find_chosen_network(chosen) != nullptr)
            start_connect(chosen);
        else
            end_without_network();
    }
    forget_stored_key();
    end_dialog(dialog);
}

static void connect_network(WIFI_CELL *chosen)
{
    if (chosen->essid[0] == '\0' && !ask_name(chosen)) {
        end_without_network();
        return;
    }
    if (strcmp(chosen->key, "on") == 0) {
        connect_encrypted(chosen);
        return;
    }
    chosen->encmode = ENC_OFF;
    start_connect(chosen);
}

static void connect_selected()
{
    debug_line("Choice to Connect index[%d],count[%d]", my_wifi->cell_index, my_wifi->cell_count);
    get_interface();
    // No message: the list shows that there is no device, and the next refresh says why.
    if (my_wifi->interface_count < 1)
        return;
    if (my_wifi->cell_count < 1) {
        show_warring_dialog(mainwindow, _("No Network in Local Area"));
        return;
    }

    const WIFI_CELL *cell = scanned_cell(my_wifi->cell_index);

    if (cell == nullptr) {
        show_warring_dialog(mainwindow, _("Select a Network First"));
        return;
    }
    connect_index = my_wifi->cell_index;
    if (cell->linkstate == 1) {
        g_timeout_add(COMMAND_DELAY_MS, do_disconnect, nullptr);
        debug_line("now is link down.");
        return;
    }

    // A copy, because the records may be replaced while a dialog is open.
    WIFI_CELL chosen = *cell;

    connect_network(&chosen);
    explicit_bzero(&chosen, sizeof chosen);
}

void cb_connect(GtkWidget *, gpointer)
{
    static gboolean running = FALSE;

    // Only one connect at a time may have a dialog open. A double click does not go through the
    // button, so what keeps the button grey is checked here.
    if (running || controls_held(HOLD_CHECK | HOLD_REFRESH | HOLD_CONNECT | HOLD_HOST))
        return;
    running = TRUE;
    connect_selected();
    running = FALSE;
}

// Selects the network under the pointer; a row that is selected already is selected again.
static void follow_pointer(GtkTreeView *view, const GdkEventButton *event)
{
    GtkTreePath *path = nullptr;

    if (!gtk_tree_view_get_path_at_pos(view, static_cast<gint>(event->x),
                                       static_cast<gint>(event->y), &path, nullptr, nullptr,
                                       nullptr))
        return;

    GtkTreeSelection *selection = gtk_tree_view_get_selection(view);

    my_wifi->cell_index = gtk_tree_path_get_indices(path)[0];
    if (gtk_tree_selection_path_is_selected(selection, path)) {
        gtk_tree_selection_unselect_all(selection);
        gtk_tree_selection_select_path(selection, path);
    }
    gtk_tree_path_free(path);
}

gboolean cb_view_sel(GtkWidget *widget, GdkEventButton *event, void *)
{
    // The toolkit would select the first row when it gives the list the focus.
    focus_list(widget);
    if (!(my_wifi->cell_count > 0 && my_wifi->interface_count > 0)) {
        log_critical("cb_view_sel", "my_wifi->cell_count>0&&my_wifi->interface_count>0");
        return FALSE;
    }
    debug_line("Cell count %d index %d interface count %d", my_wifi->cell_count,
               my_wifi->cell_index, my_wifi->interface_count);
    follow_pointer(GTK_TREE_VIEW(widget), event);
    if (my_wifi->cell_index <= -1) {
        log_critical("cb_view_sel", "my_wifi->cell_index>-1");
        return FALSE;
    }

    const WIFI_CELL *cell = scanned_cell(my_wifi->cell_index);

    if (cell == nullptr) {
        log_critical("cb_view_sel", "my_wifi->wifi_cell[my_wifi->cell_index]!=NULL");
        return FALSE;
    }
    debug_line("connect_index=%d,my_wifi->cell_index=[%d]", connect_index, my_wifi->cell_index);

    const gboolean connected = cell->linkstate == 1;

    if (event->type == GDK_BUTTON_PRESS) {
        set_connect_label(connected ? GTK_STOCK_DISCONNECT : GTK_STOCK_CONNECT);
    } else if (event->type == GDK_2BUTTON_PRESS) {
        printf("double click the button");
        fflush(stdout); // it has no line end
        if (connected) {
            set_connect_label(GTK_STOCK_DISCONNECT);
        } else if (doubleclick) {
            set_connect_label(GTK_STOCK_CONNECT);
            cb_connect(nullptr, nullptr);
        }
    }
    return FALSE;
}
