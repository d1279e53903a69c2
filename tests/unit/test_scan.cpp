// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "support/commands.h"
#include "support/goldens.h"
#include "support/model.h"
#include "support/state.h"
#include "wifi.h"
#include "wifi_info/scan.h"
#include "wifi_info/text.h"

static const char START[] = "WIRELESS-LAN-DEBUG: get cell start...\n";
static const char NETWORK[] = "          Cell 01 - Address: 00:11:22:33:44:55\n"
                              "                    ESSID:\"home net\"\n"
                              "                    Mode:Managed\n"
                              "                    Frequency:2.437 GHz (Channel 6)\n"
                              "                    Quality:70/100  Signal level:-50 dBm\n"
                              "                    Encryption key:on\n"
                              "                    Bit Rates:54 Mb/s\n";

static void set_scan(const std::string &output)
{
    write_file(scratch_directory() + "/scan", output);
    set_tool_output(scratch_directory() + "/scan");
}

// Scans with a new state and returns the text on standard error.
static std::string scan()
{
    fresh_state();
    WIFI_INTERFACE *iface = add_interface("wlan0");
    testing::internal::CaptureStderr();
    get_cell(iface);
    return testing::internal::GetCapturedStderr();
}

static std::string records()
{
    std::string text = golden_line("networks", std::to_string(my_wifi->cell_count));
    for (int i = 0; i < my_wifi->cell_count; i++) {
        const WIFI_CELL &cell = *my_wifi->wifi_cell[i];
        text += "\n" + golden_line("address", FIELD(cell, address)) +
                golden_line("essid", FIELD(cell, essid)) + golden_line("mode", FIELD(cell, mode)) +
                golden_line("channel", FIELD(cell, channel)) +
                golden_line("quality", FIELD(cell, quality)) +
                golden_line("key", FIELD(cell, key)) +
                golden_line("encmode", std::to_string(cell.encmode));
    }
    return text;
}

TEST(GetCell, AgreesWithEveryGolden)
{
    std::vector<golden> all = goldens("scan", ".cells");
    EXPECT_GE(all.size(), 80u);
    for (const golden &one : all) {
        set_tool_output(one.input);
        std::string printed, expected = START;
        printed = scan();
        EXPECT_EQ(records(), one.expected) << one.name;
        model::read_cells(read_file(one.input), &expected);
        EXPECT_EQ(printed, expected) << one.name;
        for (int i = 0; i < MAX_CELLS; i++)
            EXPECT_EQ(my_wifi->wifi_cell[i] != nullptr, i < my_wifi->cell_count) << one.name;
    }
}

TEST(GetCell, BringsTheInterfaceUpAndScans)
{
    set_scan("");
    scan();
    EXPECT_EQ(commands, std::vector<std::string>(
                            {"system: /sbin/ifconfig wlan0 up", "popen r: iwlist wlan0 scan"}));
}

TEST(GetCell, PrintsOneLineForEachValue)
{
    set_scan(NETWORK);
    EXPECT_EQ(scan(), "WIRELESS-LAN-DEBUG: get cell start...\n"
                      "WIRELESS-LAN-DEBUG: FIND CELL[0]\n"
                      "WIRELESS-LAN-DEBUG: Address:00:11:22:33:44:55\n"
                      "WIRELESS-LAN-DEBUG: ESSID:home net\n"
                      "WIRELESS-LAN-DEBUG: Mode:Managed\n"
                      "WIRELESS-LAN-DEBUG: Frequency:2.437\n"
                      "WIRELESS-LAN-DEBUG: quality:70/100\n"
                      "WIRELESS-LAN-DEBUG: key:1\n");
}

TEST(GetCell, FillsNothingButWhatTheScanSays)
{
    set_scan(NETWORK);
    scan();
    ASSERT_EQ(my_wifi->cell_count, 1);
    WIFI_CELL expected = {};
    copy_field(expected.address, 32, "00:11:22:33:44:55");
    copy_field(expected.essid, 128, "home net");
    copy_field(expected.mode, 16, "Managed");
    copy_field(expected.channel, 40, "2.437");
    copy_field(expected.quality, 16, "70/100");
    copy_field(expected.key, 4, "on");
    copy_field(expected.state, 128, "Disconnect");
    expected.encmode = ENC_OPEN;
    expected.linkstate = 2;
    EXPECT_EQ(memcmp(my_wifi->wifi_cell[0], &expected, sizeof expected), 0);
}

TEST(GetCell, TranslatesTheState)
{
    set_scan(NETWORK);
    disconnect_text = "Getrennt";
    scan();
    disconnect_text = nullptr;
    EXPECT_STREQ(my_wifi->wifi_cell[0]->state, "Getrennt");
}

TEST(GetCell, ReplacesTheFormerNetworks)
{
    set_scan(std::string(NETWORK) + NETWORK);
    scan();
    EXPECT_EQ(my_wifi->cell_count, 2);
    set_scan(NETWORK);
    get_cell(my_wifi->wifi_interface[0]);
    EXPECT_EQ(my_wifi->cell_count, 1);
    EXPECT_EQ(my_wifi->wifi_cell[1], nullptr);
    set_scan("wlan0     No scan results\n");
    get_cell(my_wifi->wifi_interface[0]);
    EXPECT_EQ(my_wifi->cell_count, 0);
    EXPECT_EQ(my_wifi->wifi_cell[0], nullptr);
}

TEST(GetCell, KeepsTheFormerNetworksWhenThereIsNoPipe)
{
    set_scan(NETWORK);
    scan();
    WIFI_CELL *former = my_wifi->wifi_cell[0];
    refuse_pipes = true;
    testing::internal::CaptureStderr();
    get_cell(my_wifi->wifi_interface[0]);
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              std::string(START) + "pipe: Too many open files\n");
    EXPECT_EQ(my_wifi->cell_count, 1);
    EXPECT_EQ(my_wifi->wifi_cell[0], former);
}

TEST(GetCell, RunsNothingForANameThatNoInterfaceHas)
{
    set_scan(NETWORK);
    scan();
    copy_field(my_wifi->wifi_interface[0]->name, 16, "a;reboot");
    commands.clear();
    testing::internal::CaptureStderr();
    get_cell(my_wifi->wifi_interface[0]);
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              std::string(START) +
                  "WIRELESS-LAN-DEBUG: no usable interface name, skipping the scan\n");
    EXPECT_TRUE(commands.empty());
    EXPECT_EQ(my_wifi->cell_count, 0);
}

TEST(GetCell, RunsNothingWithoutARecord)
{
    set_scan(NETWORK);
    scan();
    commands.clear();
    testing::internal::CaptureStderr();
    get_cell(nullptr);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), START);
    EXPECT_TRUE(commands.empty());
    EXPECT_EQ(my_wifi->cell_count, 0);
}

TEST(GetCell, PrintsNoControlCharacterOfAName)
{
    set_scan("Cell 01 - Address: 00:11:22:33:44:01\nESSID:\"a\x1B]0;x\a\xC2\x9B"
             "2J\xC3\xA9\xE9\"\n"
             "Bit Rates:54\n");
    EXPECT_EQ(scan(), std::string(START) + "WIRELESS-LAN-DEBUG: FIND CELL[0]\n"
                                           "WIRELESS-LAN-DEBUG: Address:00:11:22:33:44:01\n"
                                           "WIRELESS-LAN-DEBUG: ESSID:a\\x1b]0;x\\x07\\xc2\\x9b"
                                           "2J\xC3\xA9\xE9\n");
    EXPECT_EQ(FIELD(*my_wifi->wifi_cell[0], essid), "a\x1B]0;x\a\xC2\x9B"
                                                    "2J\xC3\xA9\xE9");
}

TEST(GetCell, IgnoresHowTheToolEnds)
{
    set_tool_script("echo 'Cell 01 - Address: A'; echo 'Bit Rates:1'; exit 255");
    scan();
    EXPECT_EQ(my_wifi->cell_count, 1);
    set_tool_script("kill -9 $$");
    scan();
    EXPECT_EQ(my_wifi->cell_count, 0);
}

// The tool never stops printing; the scan ends at the 129th network.
TEST(GetCell, StopsAtTheEndOfThe129thNetwork)
{
    set_tool_script("while echo 'Cell - Address: A' && echo 'Bit Rates:1'; do :; done 2>/dev/null");
    std::string printed = scan();
    EXPECT_EQ(my_wifi->cell_count, 128);
    EXPECT_NE(printed.find("FIND CELL[128]\n"), std::string::npos);
    EXPECT_EQ(printed.find("FIND CELL[129]\n"), std::string::npos);
}

TEST(GetCell, LeavesNoDescriptorOpen)
{
    set_scan(NETWORK);
    scan();
    std::vector<std::string> before = open_descriptors();
    for (int i = 0; i < 500; i++) {
        testing::internal::CaptureStderr();
        get_cell(my_wifi->wifi_interface[0]);
        testing::internal::GetCapturedStderr();
    }
    EXPECT_EQ(open_descriptors(), before);
    EXPECT_EQ(my_wifi->cell_count, 1);
}
