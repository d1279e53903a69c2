// The settings dialog from inside the program: what no hand at the device can bring about.

#include <gtest/gtest.h>
#include <gtk/gtk.h>

#include "base/state.h"
#include "base/widgets.h"
#include "settings/wlan_dialog.h"

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

// Two interfaces, DHCP, a main window with nothing in it.
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

// Opens the dialog, calls `steps` under it, and cancels it if there still is a main window.
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

// Another selection, a slot that never held an interface, indexes beyond the table.
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
    static gpointer widgets[G_N_ELEMENTS(keys)];

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
        for (gsize i = 0; i < G_N_ELEMENTS(keys); i++) {
            widgets[i] = widget(keys[i]);
            g_object_add_weak_pointer(G_OBJECT(widgets[i]), &widgets[i]);
        }
    });
    for (gsize i = 0; i < G_N_ELEMENTS(keys); i++) {
        EXPECT_EQ(widgets[i], nullptr) << keys[i];
        EXPECT_EQ(find_widget(keys[i]), nullptr) << keys[i];
    }
}

TEST(SettingsDialog, GoesWithTheMainWindow)
{
    start();
    run_dialog([](GtkDialog *) { gtk_widget_destroy(mainwindow); });
    EXPECT_EQ(mainwindow, nullptr);
}

// Nobody could answer the dialog if it ran again.
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
