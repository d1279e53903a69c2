// SPDX-License-Identifier: MIT
// The settings dialogs from inside the program: what a user at the device cannot cause or see.

#include <gtest/gtest.h>
#include <gtk/gtk.h>

#include "base/registry.h"
#include "base/state.h"
#include "settings/adhoc_dialog.h"
#include "settings/wlan_dialog.h"
#include "wifi.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/text.h"

static void (*under_dialog)(GtkDialog *);

static GtkDialog *open_dialog()
{
    GList *windows = gtk_window_list_toplevels();
    GtkDialog *found = nullptr;

    for (GList *at = windows; at != nullptr; at = at->next)
        if (GTK_IS_DIALOG(at->data) && gtk_widget_get_visible(GTK_WIDGET(at->data)) &&
            (found == nullptr || GTK_IS_MESSAGE_DIALOG(at->data)))
            found = GTK_DIALOG(at->data);
    g_list_free(windows);
    return found;
}

// Two interfaces, DHCP, an empty main window.
static void start()
{
    ASSERT_TRUE(gtk_init_check(nullptr, nullptr)) << "no display";
    ASSERT_TRUE(my_wifi != nullptr || my_wifi_init());
    get_interface();
    ASSERT_EQ(my_wifi->interface_count, 2) << "cat is not the one of these tests";
    for (int i = 0; i < 2; i++) {
        my_wifi->wifi_interface[i]->isdhcp = TRUE;
        my_wifi->wifi_interface[i]->isstatic = FALSE;
        my_wifi->wifi_interface[i]->auto_dns = FALSE;
    }
    if (mainwindow == nullptr) {
        mainwindow = gtk_window_new(GTK_WINDOW_TOPLEVEL);
        g_signal_connect(mainwindow, "destroy", G_CALLBACK(gtk_widget_destroyed), &mainwindow);
    }
}

// Opens the dialog, calls `steps` while it runs, and cancels it if the main window still exists.
static void run_dialog(void (*steps)(GtkDialog *))
{
    under_dialog = steps;
    g_idle_add(
        [](gpointer) -> gboolean {
            GtkDialog *dialog = open_dialog();

            under_dialog(dialog);
            if (mainwindow != nullptr)
                gtk_dialog_response(dialog, GTK_RESPONSE_REJECT);
            return FALSE;
        },
        nullptr);
    cb_wifi_settings(nullptr, nullptr);
    EXPECT_EQ(open_dialog(), nullptr);
}

static GtkWidget *widget(const char *key)
{
    GtkWidget *found = find_widget(key);

    EXPECT_NE(found, nullptr) << key;
    return found;
}

static void choose(const char *key)
{
    gtk_toggle_button_set_active(GTK_TOGGLE_BUTTON(widget(key)), TRUE);
}

static gboolean is_chosen(const char *key)
{
    return gtk_toggle_button_get_active(GTK_TOGGLE_BUTTON(widget(key)));
}

static gboolean is_sensitive(const char *key)
{
    return gtk_widget_get_sensitive(widget(key));
}

static const char *entry_text(const char *key)
{
    return gtk_entry_get_text(GTK_ENTRY(widget(key)));
}

static guint born;
static guint alive;

// Counts `object` until it is finalized; destroying it is not enough.
static void count(gpointer object)
{
    born++;
    alive++;
    g_object_set_data_full(G_OBJECT(object), "counted", object, [](gpointer) { alive--; });
}

static void expect_flags(int index, gboolean isdhcp, gboolean isstatic)
{
    EXPECT_EQ(my_wifi->wifi_interface[index]->isdhcp, isdhcp) << index;
    EXPECT_EQ(my_wifi->wifi_interface[index]->isstatic, isstatic) << index;
}

TEST(SettingsDialog, Flags)
{
    for (const gboolean isdhcp : {0, 1})
        for (const gboolean isstatic : {0, 1})
            for (const gboolean auto_dns : {0, 1}) {
                start();
                my_wifi->wifi_interface[0]->isdhcp = isdhcp;
                my_wifi->wifi_interface[0]->isstatic = isstatic;
                my_wifi->wifi_interface[0]->auto_dns = auto_dns;
                copy_field(static_address, sizeof static_address, "192.168.1.2");
                run_dialog([](GtkDialog *) {
                    const WIFI_INTERFACE *iface = my_wifi->wifi_interface[0];

                    EXPECT_EQ(is_chosen("staticnone0"), iface->isstatic);
                    EXPECT_EQ(is_chosen("dhcpnone0"), !iface->isstatic);
                    EXPECT_EQ(is_chosen("auto_dnsnone0"), iface->isdhcp && iface->auto_dns);
                    EXPECT_EQ(is_sensitive("auto_dnsnone0"), iface->isdhcp);
                    EXPECT_STREQ(entry_text("addressnone0"), iface->isstatic ? "192.168.1.2" : "");
                    for (const char *key :
                         {"addressnone0", "netmasknone0", "broadcastnone0", "gatewaynone0"})
                        EXPECT_EQ(is_sensitive(key), iface->isstatic) << key;
                });
                expect_flags(0, isdhcp, isstatic);
            }
}

TEST(SettingsDialog, ChoosesOnTheSelectedInterface)
{
    start();
    run_dialog([](GtkDialog *) {
        choose("staticnone0");
        expect_flags(0, FALSE, TRUE);
        EXPECT_TRUE(is_sensitive("gatewaynone0"));
        choose("dhcpnone0");
        expect_flags(0, TRUE, FALSE);
        EXPECT_TRUE(is_chosen("auto_dnsnone0"));
        EXPECT_FALSE(is_sensitive("gatewaynone0"));
    });
    expect_flags(1, TRUE, FALSE);
}

// Another selected interface, a slot without one, indexes out of range.
TEST(SettingsDialog, AnotherSelectionMissesTheWidgets)
{
    for (int index : {1, 7, -1, MAX_INTERFACES, G_MAXINT, G_MININT}) {
        static int selected;

        start();
        selected = index;
        run_dialog([](GtkDialog *) {
            my_wifi->interface_index = selected;
            choose("staticnone0");
            EXPECT_TRUE(is_chosen("staticnone0"));
            EXPECT_TRUE(is_sensitive("auto_dnsnone0"));
            EXPECT_FALSE(is_sensitive("addressnone0"));
            choose("dhcpnone0");
            EXPECT_FALSE(is_chosen("auto_dnsnone0"));
        });
        expect_flags(0, TRUE, FALSE);
        expect_flags(1, TRUE, FALSE);
    }
}

TEST(SettingsDialog, RegistryHoldsTheRadiosAndLetsThemGo)
{
    static const char *const keys[] = {"dhcpnone0",     "staticnone0",    "addressnone0",
                                       "netmasknone0",  "broadcastnone0", "gatewaynone0",
                                       "auto_dnsnone0", "adhoc-hostnone0"};

    start();
    run_dialog([](GtkDialog *) {
        for (const char *key : {"dhcpnone0", "staticnone0"}) {
            GObject *radio = G_OBJECT(widget(key));
            const guint references = radio->ref_count;

            g_object_set_data(G_OBJECT(mainwindow), key, nullptr);
            EXPECT_EQ(radio->ref_count, references - 1) << key;
        }
    });
    run_dialog([](GtkDialog *) {
        for (const char *key : keys)
            count(widget(key));
    });
    EXPECT_EQ(alive, 0U);
    for (const char *key : keys)
        EXPECT_EQ(find_widget(key), nullptr) << key;
}

TEST(SettingsDialog, GoesWithTheMainWindow)
{
    start();
    run_dialog([](GtkDialog *) { gtk_widget_destroy(mainwindow); });
    EXPECT_EQ(mainwindow, nullptr);
}

// If the dialog ran again nobody could answer it.
TEST(SettingsDialog, GoesWithTheMainWindowUnderARefusal)
{
    start();
    my_wifi->wifi_interface[0]->isstatic = TRUE;
    my_wifi->wifi_interface[0]->isdhcp = FALSE;
    static_address[0] = '\0';
    under_dialog = [](GtkDialog *dialog) {
        g_idle_add(
            [](gpointer) -> gboolean {
                EXPECT_TRUE(GTK_IS_MESSAGE_DIALOG(open_dialog()));
                gtk_widget_destroy(mainwindow);
                return FALSE;
            },
            nullptr);
        gtk_dialog_response(dialog, GTK_RESPONSE_OK);
    };
    g_idle_add(
        [](gpointer) -> gboolean {
            under_dialog(open_dialog());
            return FALSE;
        },
        nullptr);
    cb_wifi_settings(nullptr, nullptr);
    EXPECT_EQ(mainwindow, nullptr);
    EXPECT_EQ(open_dialog(), nullptr);
}

// Answers OK with the group as it is shown.
static void accept_group(WIFI_CELL *group)
{
    g_idle_add(
        [](gpointer) -> gboolean {
            gtk_dialog_response(open_dialog(), GTK_RESPONSE_OK);
            return FALSE;
        },
        nullptr);
    cb_adhoc_setup(nullptr, group);
    EXPECT_EQ(open_dialog(), nullptr);
}

TEST(GroupDialog, Stores)
{
    static const struct {
        guint32 encmode;
        guint32 stored;
    } rows[] = {{ENC_OFF, ENC_OFF},
                {ENC_OPEN, ENC_OPEN},
                {ENC_RESTRICTED, ENC_RESTRICTED},
                {3, ENC_OFF}, // it has no radio button, so the first one is active
                {G_MAXUINT32, ENC_OFF}};

    start();
    for (const auto &row : rows) {
        WIFI_CELL group = {};

        copy_field(group.essid, sizeof group.essid, "board \xff");
        copy_field(group.userkey, sizeof group.userkey, "key \xfe");
        copy_field(group.mode, sizeof group.mode, "Ad-Hos"); // as the reader of the file sets it
        group.encmode = static_cast<t_encmode>(row.encmode);
        accept_group(&group);
        EXPECT_STREQ(group.essid, "board \xff");
        EXPECT_STREQ(group.userkey, "key \xfe");
        EXPECT_STREQ(group.mode, "Ad-Hoc");
        EXPECT_EQ(group.encmode, row.stored);
    }
}

static gboolean cb_count(GSignalInvocationHint *, guint, const GValue *values, gpointer)
{
    GObject *object = static_cast<GObject *>(g_value_get_object(values));

    if ((GTK_IS_RADIO_BUTTON(object) || GTK_IS_ENTRY(object)) &&
        g_object_get_data(object, "counted") == nullptr)
        count(object);
    return TRUE;
}

// Only the dialog's handler owns the key entry and the radio buttons.
TEST(GroupDialog, LeavesNoWidget)
{
    WIFI_CELL group = {};

    start();
    copy_field(group.essid, sizeof group.essid, "board");
    copy_field(group.userkey, sizeof group.userkey, "secret");
    accept_group(&group); // from here on the signals exist
    born = 0;

    const guint packed = g_signal_lookup("parent-set", GTK_TYPE_WIDGET);
    const guint filled = g_signal_lookup("changed", GTK_TYPE_EDITABLE);
    const gulong packed_hook = g_signal_add_emission_hook(packed, 0, cb_count, nullptr, nullptr);
    const gulong filled_hook = g_signal_add_emission_hook(filled, 0, cb_count, nullptr, nullptr);

    accept_group(&group);
    g_signal_remove_emission_hook(packed, packed_hook);
    g_signal_remove_emission_hook(filled, filled_hook);
    EXPECT_EQ(born, 5U); // two entries, three radio buttons
    EXPECT_EQ(alive, 0U);
}

TEST(GroupDialog, OffSwitchesTheKeyEntry)
{
    start();

    GtkWidget *entry = GTK_WIDGET(g_object_ref_sink(gtk_entry_new()));
    GtkWidget *toggle = GTK_WIDGET(g_object_ref_sink(gtk_toggle_button_new()));

    for (const gboolean active : {1, 0, 1}) {
        gtk_toggle_button_set_active(GTK_TOGGLE_BUTTON(toggle), active);
        active_key_entry(GTK_TOGGLE_BUTTON(toggle), entry);
        EXPECT_EQ(gtk_widget_get_sensitive(entry), !active);
        cb_active_wifi_group(GTK_TOGGLE_BUTTON(toggle), entry);
        EXPECT_EQ(gtk_widget_get_sensitive(entry), active);
    }
    for (GtkWidget *used : {entry, toggle}) {
        gtk_widget_destroy(used);
        g_object_unref(used);
    }
}
