// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <sys/wait.h>

#include "support/commands.h"
#include "support/goldens.h"
#include "support/state.h"
#include "wifi.h"
#include "wifi_info/interfaces.h"
#include "wifi_info/scan.h"
#include "wifi_info/text.h"

static const char HEADER[] = "Inter-| sta-|\n face | tus | link\n";

static void set_list(const std::string &list)
{
    write_file(scratch_directory() + "/list", list);
    set_tool_output(scratch_directory() + "/list");
}

TEST(GetInterface, AgreesWithEveryGolden)
{
    std::vector<golden> all = goldens("interfaces", ".names");
    EXPECT_GE(all.size(), 30u);
    for (const golden &one : all) {
        set_tool_output(one.input);
        fresh_state();
        EXPECT_EQ(get_interface(), 0);
        std::string records = golden_line("interfaces", std::to_string(my_wifi->interface_count));
        for (const WIFI_INTERFACE *iface : my_wifi->wifi_interface)
            if (iface)
                records += golden_line("name", FIELD(*iface, name));
        EXPECT_EQ(records, one.expected) << one.name;
        EXPECT_EQ(my_wifi->interface_index, 0);
        EXPECT_EQ(commands, std::vector<std::string>({"popen r: cat /proc/net/wireless"}));
    }
}

TEST(GetInterface, AllocatesAFirstRecordForAListWithoutInterfaces)
{
    fresh_state();
    set_list(HEADER);
    get_interface();
    EXPECT_EQ(my_wifi->interface_count, 0);
    ASSERT_NE(my_wifi->wifi_interface[0], nullptr);
    EXPECT_STREQ(my_wifi->wifi_interface[0]->name, "face | tus | li");
    EXPECT_EQ(my_wifi->wifi_interface[1], nullptr);
}

TEST(GetInterface, FillsTheSlotAfterTheLastInterface)
{
    fresh_state();
    set_list(std::string(HEADER) + " wlan0: 0\n");
    get_interface();
    EXPECT_EQ(my_wifi->interface_count, 1);
    ASSERT_NE(my_wifi->wifi_interface[1], nullptr);
    EXPECT_STREQ(my_wifi->wifi_interface[1]->name, "wlan0");
    EXPECT_EQ(my_wifi->wifi_interface[2], nullptr);
}

TEST(GetInterface, KeepsARecordAndItsSettings)
{
    fresh_state();
    set_list(std::string(HEADER) + " wlan0: 0\n");
    get_interface();
    WIFI_INTERFACE *first = my_wifi->wifi_interface[0];
    WIFI_INTERFACE before = *first;
    memset(&before, 0x5A, sizeof before);
    copy_field(before.name, sizeof before.name, "old");
    *first = before;
    get_interface();
    EXPECT_EQ(my_wifi->wifi_interface[0], first);
    copy_field(before.name, sizeof before.name, "wlan0");
    EXPECT_STREQ(first->name, "wlan0");
    EXPECT_EQ(memcmp(first->type, before.type, sizeof before - sizeof before.name), 0);
}

TEST(GetInterface, TouchesNoRecordWithoutAHeader)
{
    fresh_state();
    WIFI_INTERFACE *first = add_interface("old");
    for (const char *list : {"", "Inter-| sta-|\n", "face\n", " fac\n", "wlan0: 0\n"}) {
        set_list(list);
        EXPECT_EQ(get_interface(), 0);
        EXPECT_EQ(my_wifi->interface_count, -1);
        EXPECT_EQ(my_wifi->interface_index, 0);
        EXPECT_EQ(my_wifi->wifi_interface[0], first);
        EXPECT_STREQ(first->name, "old");
        EXPECT_EQ(my_wifi->wifi_interface[1], nullptr);
    }
}

TEST(GetInterface, ReturnsTheStatusOfTheCommand)
{
    fresh_state();
    set_tool_script("exit 3");
    int status = get_interface();
    EXPECT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 3);
    EXPECT_EQ(my_wifi->interface_count, -1);
}

TEST(GetInterface, LeavesTheTableWhenThereIsNoPipe)
{
    fresh_state();
    WIFI_INTERFACE *first = add_interface("old");
    my_wifi->interface_index = -1;
    set_list(HEADER);
    refuse_pipes = true;
    testing::internal::CaptureStderr();
    EXPECT_EQ(get_interface(), FALSE);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "pipe: Too many open files\n");
    EXPECT_EQ(my_wifi->interface_count, 1);
    EXPECT_EQ(my_wifi->interface_index, -1);
    EXPECT_EQ(my_wifi->wifi_interface[0], first);
    EXPECT_STREQ(first->name, "old");
}

TEST(GetInterface, LeavesNoDescriptorOpen)
{
    fresh_state();
    set_list(std::string(HEADER) + " wlan0: 0\n");
    get_interface();
    std::vector<std::string> before = open_descriptors();
    for (int i = 0; i < 20; i++)
        get_interface();
    EXPECT_EQ(open_descriptors(), before);
}

struct extraction {
    const char *src, *target;
    int unit;
    const char *expected; // NULL: none
};

static void check(gchar *(*extract)(gchar *, const gchar *, int), const extraction &c)
{
    g_autofree gchar *src = g_strdup(c.src);
    g_autofree gchar *value = extract(src, c.target, c.unit);
    EXPECT_STREQ(value, c.expected) << c.src;
}

TEST(GetStringValue, TakesOneOrTwoWords)
{
    const extraction cases[] = {
        {"Frequency:2.437 GHz (Channel 6)\n", "Frequency:", 0, "2.437"},
        {"Frequency:2.437 GHz (Channel 6)\n", "Frequency:", 1, "2.437 GHz"},
        {"Frequency:2.437 GHz (Channel 6)\n", "Frequency:", -1, "2.437 GHz"},
        {"Frequency:2.437\n", "Frequency:", 1, "2.437"},
        {"a: one  three", "a:", 1, "one "},
        {"a: one  three", "a:", 0, "one"},
        {"Encryption key:\n", "Encryption key:", 0, nullptr},
        {"Encryption key:  \t\r\n", "Encryption key:", 1, nullptr},
        {"Mode:Managed", "Quality:", 0, nullptr},
        {"", "Mode:", 0, nullptr},
        {"Mode:a Mode:b", "Mode:", 0, "a"},
        {"Mode:\ttab\tinside ", "Mode:", 0, "tab\tinside"},
    };
    for (const extraction &c : cases)
        check(get_string_value, c);
}

TEST(GetEssidValue, CutsAtEightBlanks)
{
    const extraction cases[] = {
        {"ESSID:\"my home net\"\n", "ESSID:", 0, "\"my home net\""},
        {"ESSID:\"seven       blanks\"", "ESSID:", 0, "\"seven       blanks\""},
        {"ESSID:\"eight        blanks\"", "ESSID:", 0, "\"eight"},
        {"ESSID:\"eight        blanks\"", "ESSID:", 1, "\"eight blanks\""},
        {"ESSID:\"nine         blanks\"", "ESSID:", 1, "\"nine  blanks\""},
        {"ESSID:a        b        c", "ESSID:", 1, "a b"},
        {"ESSID:\"\"\n", "ESSID:", 0, "\"\""},
        {"ESSID:  \n", "ESSID:", 0, nullptr},
    };
    for (const extraction &c : cases)
        check(get_essid_value, c);
}

TEST(GetStringValue, TrimsTheTextInPlace)
{
    gchar src[] = "Mode:  Managed  \n";
    g_autofree gchar *value = get_string_value(src, "Mode:", 0);
    EXPECT_STREQ(value, "Managed");
    EXPECT_STREQ(src, "Mode:Managed");
}
