// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <sys/stat.h>

#include <algorithm>

#include "support/commands.h"
#include "support/model.h"
#include "support/random_text.h"
#include "support/state.h"
#include "wifi.h"
#include "wifi_info/basic_settings.h"
#include "wifi_info/text.h"

using namespace std::string_literals;

static const char STATIC_STANZA[] = "iface wlan0\n"
                                    "addrtype static \n"
                                    "address 192.168.1.7\n"
                                    "netmask 255.255.255.0\n"
                                    "broadcast 192.168.1.255\n"
                                    "gateway 192.168.1.1\n"
                                    "wifigroup 1\n"
                                    "ESSID my own net\n"
                                    "MODE Ad-Hoc\n"
                                    "KEY se cret\n"
                                    "Encryption restricted\n";
static const char DHCP_STANZA[] = "iface wlan0\n"
                                  "addrtype dhcp\n"
                                  "dns auto\n"
                                  "wifigroup 0\n"
                                  "ESSID \n"
                                  "MODE Ad-Hoc\n"
                                  "KEY \n"
                                  "Encryption off\n";
// With both flags zero the writer says static and continues as for DHCP.
static const char NEITHER_STANZA[] = "iface wlan0\n"
                                     "addrtype static\n"
                                     "dns manual\n"
                                     "wifigroup 1\n"
                                     "ESSID home\n"
                                     "MODE Ad-Hoc\n"
                                     "KEY abc\n"
                                     "Encryption open\n";

class BasicSettings : public testing::Test
{
protected:
    std::string file = scratch_directory() + "/wireless.conf";
    WIFI_INTERFACE *iface = nullptr;

    void SetUp() override
    {
        fresh_state();
        iface = add_interface("wlan0");
        remove(file.c_str());
    }
    // What saving and reading print on standard output and standard error.
    std::string errors, output;
    gboolean whole = FALSE; // what the last reading returned

    gboolean save()
    {
        testing::internal::CaptureStderr();
        gboolean saved = save_basic_setting_to_file(file.c_str());
        errors = testing::internal::GetCapturedStderr();
        return saved;
    }
    void capture(gboolean (*reader)(const gchar *))
    {
        testing::internal::CaptureStderr();
        testing::internal::CaptureStdout();
        whole = reader(file.c_str());
        output = testing::internal::GetCapturedStdout();
        errors = testing::internal::GetCapturedStderr();
    }
    void read(const std::string &content)
    {
        write_file(file, content);
        capture(get_basic_setting_from_file);
    }
    void read_advanced(const std::string &content)
    {
        write_file(file, content);
        capture(get_basic_setting_from_file_Advanced);
    }
    void set_group(const char *essid, const char *key, t_encmode encmode)
    {
        copy_field(iface->wifi_group.essid, 128, essid);
        copy_field(iface->wifi_group.userkey, 128, key);
        iface->wifi_group.encmode = encmode;
    }
    void set_addresses()
    {
        copy_field(static_address, 32, "192.168.1.7");
        copy_field(static_netmask, 32, "255.255.255.0");
        copy_field(static_broadcast, 32, "192.168.1.255");
        copy_field(static_gateway, 32, "192.168.1.1");
    }
};

TEST_F(BasicSettings, WritesAStaticStanza)
{
    iface->isstatic = TRUE;
    iface->wifi_group_enable = TRUE;
    set_addresses();
    set_group("my own net", "se cret", ENC_RESTRICTED);
    EXPECT_TRUE(save());
    EXPECT_EQ(read_file(file), STATIC_STANZA);
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: isstatic\n");
}

TEST_F(BasicSettings, WritesADhcpStanza)
{
    iface->isdhcp = TRUE;
    iface->auto_dns = TRUE;
    EXPECT_TRUE(save());
    EXPECT_EQ(read_file(file), DHCP_STANZA);
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: isdhcp\n");
}

TEST_F(BasicSettings, WritesStaticWithDnsWhenBothFlagsAreZero)
{
    iface->wifi_group_enable = TRUE;
    set_group("home", "abc", ENC_OPEN);
    EXPECT_TRUE(save());
    EXPECT_EQ(read_file(file), NEITHER_STANZA);
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: isdhcp\n");
}

TEST_F(BasicSettings, WritesTheEncryptionWordOfEveryMode)
{
    const char *const words[] = {"off", "open", "restricted", "restricted"};
    for (guint32 mode = 0; mode < 4; mode++) {
        set_group("", "key", static_cast<t_encmode>(mode));
        save();
        std::string text = read_file(file);
        EXPECT_NE(text.find(std::string("KEY key\nEncryption ") + words[mode] + "\n"),
                  std::string::npos);
    }
}

TEST_F(BasicSettings, WritesTheGroupSwitchAsANumber)
{
    for (int value : {0, 1, 7, -1}) {
        iface->wifi_group_enable = value;
        save();
        EXPECT_NE(read_file(file).find("\nwifigroup " + std::to_string(value) + "\n"),
                  std::string::npos);
    }
}

TEST_F(BasicSettings, WritesOnlyTheAddressesOfStatic)
{
    iface->isstatic = iface->isdhcp = TRUE;
    save();
    std::string text = read_file(file);
    EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), 11);
    EXPECT_EQ(text.find("dns"), std::string::npos);
    iface->isstatic = FALSE;
    save();
    text = read_file(file);
    EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), 8);
    EXPECT_EQ(text.find("\naddress"), std::string::npos);
}

TEST_F(BasicSettings, WritesNoLineOfAValuesOwn)
{
    set_group("a\nwifigroup 1\r\nKEY x", "k\ny", ENC_OFF);
    EXPECT_TRUE(save());
    EXPECT_NE(read_file(file).find("\nESSID a wifigroup 1  KEY x\nMODE Ad-Hoc\nKEY k y\n"),
              std::string::npos);
}

TEST_F(BasicSettings, SaysWhyAFileCannotBeWritten)
{
    file = scratch_directory() + "/missing/wireless.conf";
    EXPECT_FALSE(save());
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: File " + file +
                          " cannot be open.\nWIRELESS-LAN-DEBUG: " + file +
                          ": No such file or directory\n");
    file = scratch_directory();
    EXPECT_FALSE(save());
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: File " + file +
                          " cannot be open.\nWIRELESS-LAN-DEBUG: " + file + ": Is a directory\n");
}

TEST_F(BasicSettings, WritesNothingWithoutAnInterface)
{
    write_file(file, "as before");
    fresh_state();
    EXPECT_FALSE(save());
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: no interface, " + file + " is not written\n");
    EXPECT_EQ(read_file(file), "as before");
}

TEST_F(BasicSettings, ReadsAStaticStanza)
{
    iface->isdhcp = TRUE;
    read(STATIC_STANZA);
    EXPECT_EQ(iface->isstatic, 1);
    EXPECT_EQ(iface->isdhcp, 0);
    EXPECT_STREQ(static_address, "192.168.1.7");
    EXPECT_STREQ(static_netmask, "255.255.255.0");
    EXPECT_STREQ(static_broadcast, "192.168.1.255");
    EXPECT_STREQ(static_gateway, "192.168.1.1");
    EXPECT_EQ(iface->wifi_group_enable, 1);
    EXPECT_EQ(iface->wifi_group.encmode, ENC_RESTRICTED);
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: ifname:wlan0\n");
    EXPECT_EQ(output, "buffer=wifigroup 1\r\n");
}

TEST_F(BasicSettings, ReadsADhcpStanza)
{
    iface->isstatic = TRUE;
    read(DHCP_STANZA);
    EXPECT_EQ(iface->isstatic, 0);
    EXPECT_EQ(iface->isdhcp, 1);
    EXPECT_EQ(iface->auto_dns, 1);
    EXPECT_EQ(iface->wifi_group_enable, 0);
    EXPECT_EQ(output, "buffer=wifigroup 0\r\n");
}

// Of an ESSID or a key with several words only the first one is read back.
TEST_F(BasicSettings, DisagreeOnBlanksInNameAndKey)
{
    read(STATIC_STANZA);
    EXPECT_STREQ(iface->wifi_group.essid, "my");
    EXPECT_STREQ(iface->wifi_group.userkey, "se");
}

TEST_F(BasicSettings, DisagreeOnTheMode)
{
    for (const char *stanza : {STATIC_STANZA, DHCP_STANZA, "iface wlan0\n"}) {
        read(stanza);
        EXPECT_STREQ(iface->wifi_group.mode, "Ad-Hos");
    }
}

TEST_F(BasicSettings, AStaticStanzaLeavesTheNameServers)
{
    for (int before : {1, 0}) {
        iface->auto_dns = before;
        read(STATIC_STANZA);
        EXPECT_EQ(iface->auto_dns, before);
    }
}

TEST_F(BasicSettings, ADhcpStanzaLeavesTheAddresses)
{
    set_addresses();
    read(DHCP_STANZA);
    EXPECT_STREQ(static_address, "192.168.1.7");
    EXPECT_STREQ(static_netmask, "255.255.255.0");
    EXPECT_STREQ(static_broadcast, "192.168.1.255");
    EXPECT_STREQ(static_gateway, "192.168.1.1");
}

// The four lines that are read as addresses are those of the group. Only the last line, read again
// at the end of the file, still counts.
TEST_F(BasicSettings, AStanzaWithBothFlagsZeroMeetsTheWrongLines)
{
    set_addresses();
    iface->auto_dns = TRUE;
    set_group("before", "before", ENC_OFF);
    read(NEITHER_STANZA);
    EXPECT_EQ(iface->isstatic, 1);
    EXPECT_EQ(iface->isdhcp, 0);
    EXPECT_EQ(iface->auto_dns, 1);
    EXPECT_STREQ(static_address, "192.168.1.7");
    EXPECT_STREQ(static_gateway, "192.168.1.1");
    EXPECT_EQ(iface->wifi_group_enable, 0);
    EXPECT_STREQ(iface->wifi_group.essid, "");
    EXPECT_STREQ(iface->wifi_group.mode, "Ad-Hos");
    EXPECT_STREQ(iface->wifi_group.userkey, "");
    EXPECT_EQ(iface->wifi_group.encmode, ENC_OPEN);
    EXPECT_EQ(output, "buffer=KEY abc\r\n");
}

TEST_F(BasicSettings, MeetTheLastLineAgainPastTheEnd)
{
    read("iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\nESSID net\n");
    EXPECT_STREQ(iface->wifi_group.essid, "net");
    EXPECT_STREQ(iface->wifi_group.userkey, "");
    read("iface wlan0\naddrtype dhcp\nwifigroup 1");
    EXPECT_EQ(iface->wifi_group_enable, 1);
    EXPECT_EQ(output, "buffer=wifigroup 1\r\n");
    read("iface wlan0\naddrtype dhcp\ndns manual\nwifigroup 0\nESSID a\nMODE x\nEncryption open");
    EXPECT_EQ(iface->wifi_group.encmode, ENC_OPEN);
}

TEST_F(BasicSettings, TakeAnyOtherAddressTypeAsDhcp)
{
    for (const char *type : {"dhcp", "Static", "staticx", "x", " static", ""}) {
        iface->isstatic = TRUE;
        iface->isdhcp = FALSE;
        read(std::string("iface wlan0\naddrtype ") + type + " x\n");
        EXPECT_EQ(iface->isstatic, 0) << type;
        EXPECT_EQ(iface->isdhcp, 1) << type;
    }
}

TEST_F(BasicSettings, AnAddressTypeWithoutAValueKeepsBothFlags)
{
    for (const char *line :
         {"addrtype", "addrtype ", "  addrtype\t", "addrtypo dhcp", "xaddrtype x"})
        for (int isstatic : {1, 0}) {
            iface->isstatic = isstatic;
            iface->isdhcp = TRUE;
            read(std::string("iface wlan0\n") + line + "\n");
            EXPECT_EQ(iface->isstatic, isstatic) << line;
            EXPECT_EQ(iface->isdhcp, 1) << line;
        }
}

TEST_F(BasicSettings, TakeAnyOtherDnsAsManual)
{
    const struct {
        const char *line;
        gboolean expected;
    } cases[] = {{"dns auto", 1}, {"dns manual", 0},  {"dns AUTO", 0},  {"dns  auto", 0},
                 {"dns", 1},      {"dnsx auto", 1},   {"dn manual", 1}, {"\tdns auto  ", 1},
                 {"dns ", 1},     {"dns manual x", 0}};
    for (const auto &c : cases) {
        iface->auto_dns = TRUE;
        read(std::string("iface wlan0\naddrtype dhcp\n") + c.line + "\nwifigroup 1\n");
        EXPECT_EQ(iface->auto_dns, c.expected) << c.line;
        EXPECT_EQ(iface->wifi_group_enable, 1) << c.line;
    }
}

TEST_F(BasicSettings, TakeAnyOtherEncryptionAsRestricted)
{
    const struct {
        const char *line;
        t_encmode expected;
    } cases[] = {{"Encryption off", ENC_OFF},
                 {"Encryption open", ENC_OPEN},
                 {"Encryption restricted", ENC_RESTRICTED},
                 {"Encryption OFF", ENC_RESTRICTED},
                 {"Encryption  off", ENC_RESTRICTED},
                 {"Encryption", ENC_OFF},
                 {"encryption open", ENC_OFF},
                 {"Encryptions open", ENC_OPEN}};
    for (const auto &c : cases) {
        read(std::string(
                 "iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\nESSID e\nMODE m\nKEY k\n") +
             c.line);
        EXPECT_EQ(iface->wifi_group.encmode, c.expected) << c.line;
    }
}

TEST_F(BasicSettings, ReadTheGroupSwitchAsANumber)
{
    const struct {
        const char *value;
        int expected;
    } cases[] = {{"1", 1},   {"0", 0},   {"yes", 0}, {"7x", 7},
                 {"-1", -1}, {"\t5", 5}, {"", 0},    {"99999999999999", INT_MAX}};
    for (const auto &c : cases) {
        read(std::string("iface wlan0\naddrtype dhcp\ndns auto\nwifigroup ") + c.value + " x\n");
        EXPECT_EQ(iface->wifi_group_enable, c.expected) << c.value;
    }
}

TEST_F(BasicSettings, AcceptIndentedLinesAndTrailingBlanks)
{
    read("   iface wlan0 \t\n\taddrtype static\t\n  address 1.2.3.4  \n netmask 5\n broadcast 6\n"
         "\tgateway 7 \r\n  wifigroup 1\t\n ESSID x \n\n KEY y\r\n  Encryption open  ");
    EXPECT_EQ(iface->isstatic, 1);
    EXPECT_STREQ(static_address, "1.2.3.4");
    EXPECT_STREQ(static_gateway, "7");
    EXPECT_EQ(iface->wifi_group_enable, 1);
    EXPECT_STREQ(iface->wifi_group.essid, "x");
    EXPECT_STREQ(iface->wifi_group.userkey, "y");
    EXPECT_EQ(iface->wifi_group.encmode, ENC_OPEN);
    EXPECT_EQ(output, "buffer=wifigroup 1\r\n");
}

TEST_F(BasicSettings, PassOverAMisspeltAddressLine)
{
    set_addresses();
    read(
        "iface wlan0\naddrtype static\nadress 1\nnetmaskx 2\nbroadcast\ngateway  4\nwifigroup 1\n");
    EXPECT_STREQ(static_address, "192.168.1.7");     // misspelt
    EXPECT_STREQ(static_netmask, "2");               // begins with the keyword
    EXPECT_STREQ(static_broadcast, "192.168.1.255"); // no value
    EXPECT_STREQ(static_gateway, "");                // an empty value is a value
    EXPECT_EQ(iface->wifi_group_enable, 1);
}

TEST_F(BasicSettings, FindTheStanzaOfTheInterface)
{
    read("# comment\niface eth0\naddrtype dhcp\niface\nifacex wlan0\naddrtype static\n");
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: ifname:eth0\n"
                      "WIRELESS-LAN-DEBUG: ifname:eth0\n"
                      "WIRELESS-LAN-DEBUG: ifname:wlan0\n");
    EXPECT_EQ(iface->isstatic, 1);
}

TEST_F(BasicSettings, WithoutAStanzaEmptyTheGroupAlone)
{
    for (const char *content : {"", "iface eth0\naddrtype static\naddress 9\n", "iface wlan\n",
                                "iface  wlan0\n", "addrtype static\n", "iface wlan0x\n"}) {
        iface->isdhcp = iface->auto_dns = iface->wifi_group_enable = TRUE;
        set_group("e", "k", ENC_OPEN);
        set_addresses();
        read(content);
        EXPECT_EQ(iface->isdhcp, 1);
        EXPECT_EQ(iface->auto_dns, 1);
        EXPECT_STREQ(static_address, "192.168.1.7");
        EXPECT_EQ(iface->wifi_group_enable, 0);
        WIFI_CELL empty = {};
        EXPECT_EQ(memcmp(&iface->wifi_group, &empty, sizeof empty), 0);
        EXPECT_EQ(output, "");
    }
}

TEST_F(BasicSettings, AMissingFileOrAFolderChangesNothing)
{
    for (const std::string &path : {scratch_directory() + "/missing", scratch_directory()}) {
        iface->wifi_group_enable = TRUE;
        set_group("e", "k", ENC_OPEN);
        file = path;
        for (auto reader : {get_basic_setting_from_file, get_basic_setting_from_file_Advanced}) {
            capture(reader);
            EXPECT_EQ(errors, "Could not access file: " + path + "\n");
            // Only a missing file counts as an empty one.
            EXPECT_EQ(whole, path != scratch_directory());
        }
        EXPECT_EQ(iface->wifi_group_enable, 1);
        EXPECT_STREQ(iface->wifi_group.essid, "e");
    }
}

TEST_F(BasicSettings, WithoutAnInterfaceNothingMatches)
{
    fresh_state();
    read(STATIC_STANZA);
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: ifname:wlan0\n");
    read("iface\n");
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: ifname:\n");
    read_advanced("iface wlan0 inet static\n");
    EXPECT_STREQ(static_address, "");
}

TEST_F(BasicSettings, CutLongValuesToTheirFields)
{
    std::string big(400, 'x');
    read("iface wlan0\naddrtype static\naddress " + big.substr(0, 200) + "\n");
    EXPECT_EQ(std::string(static_address), std::string(31, 'x'));
    read("iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\nESSID " + big.substr(0, 200) +
         "\nMODE\nKEY " + big.substr(0, 248) + "\nEncryption open\n");
    EXPECT_EQ(std::string(iface->wifi_group.essid), std::string(127, 'x'));
    EXPECT_EQ(std::string(iface->wifi_group.userkey), std::string(127, 'x'));
    EXPECT_EQ(iface->wifi_group.encmode, ENC_OPEN);
}

// A line of 254 bytes and its newline take two reads.
TEST_F(BasicSettings, TakeTheRestOfALongLineAsALine)
{
    std::string name = "ESSID " + std::string(248, 'e');
    read("iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\n" + name + "\nKEY in time\nKEY k\n");
    EXPECT_STREQ(iface->wifi_group.userkey, "in");
    read("iface wlan0\naddrtype dhcp\ndns auto\nwifigroup 1\n" + name.substr(1) +
         "\nMODE\nKEY k\n");
    EXPECT_STREQ(iface->wifi_group.userkey, "k");
}

TEST_F(BasicSettings, TakeANulByteAsTheEndOfItsLine)
{
    read("iface wlan0\0 x\naddrtype static\0x\naddress 1\0002\n"s);
    EXPECT_EQ(iface->isstatic, 1);
    EXPECT_STREQ(static_address, "1");
}

// One stream stays open across calls, close-on-exec.
TEST_F(BasicSettings, LeaveOneStreamOpen)
{
    read(DHCP_STANZA);
    std::vector<std::string> before = open_descriptors();
    EXPECT_EQ(std::count_if(before.begin(), before.end(),
                            [&](const std::string &fd) {
                                return fd.find("/wireless.conf") != std::string::npos;
                            }),
              1);
    for (const std::string &fd : before)
        if (fd.find("/wireless.conf") != std::string::npos) {
            std::string flags = read_file("/proc/self/fdinfo/" + fd.substr(0, fd.find(' ')));
            EXPECT_NE(flags.find("flags:\t02"), std::string::npos) << flags; // O_CLOEXEC
        }
    for (int i = 0; i < 1000; i++) {
        testing::internal::CaptureStdout();
        testing::internal::CaptureStderr();
        get_basic_setting_from_file(file.c_str());
        get_basic_setting_from_file_Advanced(file.c_str());
        testing::internal::GetCapturedStderr();
        testing::internal::GetCapturedStdout();
    }
    EXPECT_EQ(open_descriptors(), before);
}

TEST_F(BasicSettings, ComeBackAsAnIndependentReadingHasThem)
{
    file = memory_directory() + "/wireless.conf";
    std::mt19937 source(20240601);
    for (int round = 0; round < 3000; round++) {
        fresh_state();
        iface = add_interface("wlan0");
        iface->isstatic = random_number(source, 2) == 0;
        iface->isdhcp = random_number(source, 2) == 0;
        iface->auto_dns = random_number(source, 2) == 0;
        iface->wifi_group_enable = static_cast<int>(random_number(source, 3));
        set_group(random_text(source, 128).c_str(), random_text(source, 128).c_str(),
                  static_cast<t_encmode>(random_number(source, 3)));
        for (gchar *address : {static_address, static_netmask, static_broadcast, static_gateway})
            copy_field(address, 32, random_text(source, 32).c_str());
        model::basic before = basic_settings();
        ASSERT_TRUE(save());
        std::string text = read_file(file);
        ASSERT_EQ(text, model::write_basic("wlan0", before));
        iface->isstatic = random_number(source, 2) == 0;
        iface->auto_dns = random_number(source, 2) == 0;
        before = basic_settings();
        capture(get_basic_setting_from_file);
        ASSERT_TRUE(basic_settings() == model::read_basic(text, "wlan0", before)) << text;
    }
}

TEST_F(BasicSettings, AdvancedReadsTheMethodFromTheFirstLine)
{
    set_group("e", "k", ENC_OPEN);
    iface->auto_dns = TRUE;
    read_advanced(
        "auto lo\niface lo inet loopback\n iface wlan0 inet static \naddress 1\nnetmask 2\n"
        "broadcast 3\ngateway 4\ndns manual\n");
    EXPECT_EQ(iface->isstatic, 1);
    EXPECT_EQ(iface->isdhcp, 0);
    EXPECT_STREQ(static_address, "1");
    EXPECT_STREQ(static_netmask, "2");
    EXPECT_STREQ(static_broadcast, "3");
    EXPECT_STREQ(static_gateway, "4");
    EXPECT_EQ(iface->auto_dns, 1);
    EXPECT_STREQ(iface->wifi_group.essid, "e");
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: ifname:lo\nWIRELESS-LAN-DEBUG: ifname:wlan0\n");
    EXPECT_EQ(output, "");
}

TEST_F(BasicSettings, AdvancedReadsAddressesWhateverTheMethod)
{
    iface->isstatic = TRUE;
    read_advanced("iface wlan0 inet dhcp\naddress 1\nx\nbroadcast 3\n");
    EXPECT_EQ(iface->isstatic, 0);
    EXPECT_EQ(iface->isdhcp, 1);
    EXPECT_STREQ(static_address, "1");
    EXPECT_STREQ(static_netmask, "");
    EXPECT_STREQ(static_broadcast, "3");
}

TEST_F(BasicSettings, AdvancedKeepsTheFlagsWithoutAMethod)
{
    iface->isstatic = TRUE;
    for (const char *line : {"iface wlan0", "iface wlan0 inet"}) {
        read_advanced(line);
        EXPECT_EQ(iface->isstatic, 1);
        EXPECT_EQ(iface->isdhcp, 0);
    }
    read_advanced("iface wlan0  static"); // the third word is empty
    EXPECT_EQ(iface->isstatic, 1);
    read_advanced("iface wlan0 inet  static"); // the fourth is
    EXPECT_EQ(iface->isstatic, 0);
}

TEST_F(BasicSettings, AdvancedChangesNothingWithoutAStanza)
{
    iface->isdhcp = TRUE;
    read_advanced("iface eth0 inet static\naddress 1\n");
    EXPECT_EQ(iface->isdhcp, 1);
    EXPECT_STREQ(static_address, "");
}

TEST_F(BasicSettings, FileVarTakesTheFirstLineThatHoldsTheVariable)
{
    const struct {
        const char *content, *var, *expected; // NULL: none
    } cases[] = {
        {"# MODE = no\nMODE = yes\n", "MODE", " yes"},
        {"MODE=yes  \n", "MODE", "yes"},
        {"a=b=c", "a", "c"},
        {"MODE one two \n", "MODE", "two"},
        {"MODE\n", "MODE", nullptr},
        {"MODE=\n", "MODE", ""},
        {"  # MODE=x\n", "MODE", "x"},
        {"xMODEx=1\nMODE=2\n", "MODE", "1"},
        {"value MODE\n", "MODE", "MODE"},
        {"other=1\n", "MODE", ""},
        {"", "MODE", ""},
        {"\n\nMODE=1\r\n", "MODE", "1"},
        {"= MODE x", "MODE", " MODE x"},
    };
    for (const auto &c : cases) {
        write_file(file, c.content);
        g_autofree gchar *value = get_file_var(file.c_str(), c.var);
        EXPECT_STREQ(value, c.expected) << c.content;
    }
}

TEST_F(BasicSettings, FileVarCutsTheFileInto2048Lines)
{
    std::string lines;
    for (int i = 0; i < 2047; i++)
        lines += "x\n";
    write_file(file, lines + "MODE=1\nlast=2\n");
    g_autofree gchar *rest = get_file_var(file.c_str(), "MODE");
    EXPECT_STREQ(rest, "2"); // the rest is one line
    write_file(file, lines.substr(2) + "MODE=1\nlast=2\n");
    g_autofree gchar *line = get_file_var(file.c_str(), "MODE");
    EXPECT_STREQ(line, "1");
}

TEST_F(BasicSettings, FileVarSaysThatAFileCannotBeRead)
{
    for (const std::string &path : {scratch_directory() + "/missing", scratch_directory()}) {
        testing::internal::CaptureStderr();
        EXPECT_EQ(get_file_var(path.c_str(), "MODE"), nullptr);
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "Could not access file: " + path + ".\n");
    }
}

TEST(GetParamval, CopiesTheSecondWord)
{
    const std::string big(300, 'b');
    const std::string cases[][2] = {
        {"KEY value", "value"},
        {"KEY  two words", "two"},
        {"\t KEY\tvalue\n", "value"},
        {"KEY", ""},
        {"", ""},
        {big + " x", "x"},
        {"x " + big, big.substr(173)},
    };
    for (const auto &c : cases) {
        g_autofree gchar *source = g_strdup(c[0].c_str());
        gchar keyword[] = "never looked at";
        gchar ret[128] = "before";
        testing::internal::CaptureStderr();
        get_paramval(source, keyword, ret);
        EXPECT_EQ(testing::internal::GetCapturedStderr(),
                  "WIRELESS-LAN-DEBUG: paramval:" + c[1] + "\n");
        EXPECT_EQ(ret, c[1]);
    }
}

static void keep_message(const gchar *, GLogLevelFlags, const gchar *message, gpointer data)
{
    *static_cast<std::string *>(data) += message;
}

TEST(GetParamval, WantsAllThree)
{
    gchar text[] = "KEY value", ret[128] = "before";
    gchar *const cases[][3] = {{nullptr, text, ret}, {text, nullptr, ret}, {text, text, nullptr}};
    for (const auto &c : cases) {
        std::string message;
        testing::internal::CaptureStderr();
        GLogFunc former = g_log_set_default_handler(keep_message, &message);
        get_paramval(c[0], c[1], c[2]);
        g_log_set_default_handler(former, nullptr);
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
        EXPECT_EQ(message,
                  "get_paramval: assertion 'source!=NULL&&keyword!=NULL&&ret!=NULL' failed");
        EXPECT_STREQ(ret, "before");
    }
}
