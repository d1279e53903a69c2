// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <algorithm>

#include "support/commands.h"
#include "support/model.h"
#include "support/random_text.h"
#include "support/state.h"
#include "wifi.h"
#include "wifi_info/preferred_file.h"
#include "wifi_info/text.h"

using namespace std::string_literals;

class PreferredFile : public testing::Test
{
protected:
    std::string file = scratch_directory() + "/wireless-user.conf";
    std::string errors;
    gboolean read_whole = FALSE; // what the last reading returned

    void SetUp() override
    {
        fresh_state();
        remove(file.c_str());
    }
    gboolean save()
    {
        testing::internal::CaptureStderr();
        gboolean saved = save_preferred_network_to_file(file.c_str());
        errors = testing::internal::GetCapturedStderr();
        return saved;
    }
    void read()
    {
        testing::internal::CaptureStderr();
        read_whole = get_preferred_network_setting_from_file(file.c_str());
        errors = testing::internal::GetCapturedStderr();
    }
    void read(const std::string &content)
    {
        write_file(file, content);
        read();
    }
    static WIFI_CELL *add(const char *alias, const char *essid, t_encmode encmode, const char *key)
    {
        WIFI_CELL *cell = add_preferred();
        copy_field(cell->alias, 128, alias);
        copy_field(cell->essid, 128, essid);
        copy_field(cell->mode, 16, "Managed");
        cell->encmode = encmode;
        copy_field(cell->userkey, 128, key);
        return cell;
    }
};

TEST_F(PreferredFile, IsWrittenByteForByte)
{
    WIFI_CELL *first = add("my home", "home net", ENC_RESTRICTED, "secret");
    first->key_mgmt = 1;
    first->key_index = 3;
    add("", "", ENC_OPEN, "");
    add("cafe", "caf\xC3\xA9", ENC_OFF, "not written");
    EXPECT_TRUE(save());
    EXPECT_EQ(read_file(file), "USERCELL 0\nALIAS my home\nESSID home net\nMODE Managed\nKMGMT 1\n"
                               "KINDEX 3\nEncryption restricted\nKEY secret\n"
                               "USERCELL 1\nALIAS \nESSID \nMODE Managed\nKMGMT 0\nKINDEX 0\n"
                               "Encryption open\nKEY \n"
                               "USERCELL 2\nALIAS cafe\nESSID caf\xC3\xA9\nMODE Managed\nKMGMT 0\n"
                               "KINDEX 0\nEncryption off\nKEY off\n");
    EXPECT_EQ(errors, "");
}

TEST_F(PreferredFile, IsEmptyForAnEmptyList)
{
    write_file(file, "before");
    EXPECT_TRUE(save());
    EXPECT_EQ(read_file(file), "");
    my_wifi->user_cell_count = 5;
    read();
    EXPECT_EQ(my_wifi->user_cell_count, 0);
}

TEST_F(PreferredFile, HasNoLineOfAValuesOwn)
{
    add("a\nUSERCELL 9\nALIAS forged", "b\r\nc", ENC_OPEN, "k\nUSERCELL 8");
    save();
    EXPECT_EQ(read_file(file),
              "USERCELL 0\nALIAS a USERCELL 9 ALIAS forged\nESSID b  c\nMODE Managed\n"
              "KMGMT 0\nKINDEX 0\nEncryption open\nKEY k USERCELL 8\n");
    read();
    EXPECT_EQ(my_wifi->user_cell_count, 1);
}

TEST_F(PreferredFile, KeepsTheOldOneWhenItCannotBeWritten)
{
    file = scratch_directory() + "/missing/wireless-user.conf";
    EXPECT_FALSE(save());
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: " + file + ": No such file or directory\n");
    file = scratch_directory();
    EXPECT_FALSE(save());
    EXPECT_EQ(errors, "WIRELESS-LAN-DEBUG: " + file + ": Is a directory\n");
}

TEST_F(PreferredFile, WritesAnUnknownEncryptionAsOff)
{
    add("a", "b", static_cast<t_encmode>(7), "key");
    save();
    EXPECT_NE(read_file(file).find("Encryption off\nKEY key\n"), std::string::npos);
}

TEST_F(PreferredFile, KeepsBlanksInAliasAndName)
{
    add("my  old   home", "net with blanks", ENC_OFF, "");
    save();
    read();
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "my  old   home");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->essid, "net with blanks");
}

TEST_F(PreferredFile, ReadsTheKeyOfAnOpenNetworkAsTheWordOff)
{
    add("a", "b", ENC_OFF, "");
    save();
    read();
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->userkey, "off");
    EXPECT_EQ(my_wifi->user_wifi_cell[0]->encmode, ENC_OFF);
}

TEST_F(PreferredFile, ReadsAKeyAndAModeAsTheirFirstWords)
{
    WIFI_CELL *cell = add("a", "b", ENC_OPEN, "two words");
    copy_field(cell->mode, 16, "Ad Hoc");
    save();
    read();
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->userkey, "two");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->mode, "Ad");
}

TEST_F(PreferredFile, ReadsAnEmptyKeyAsEmpty)
{
    add("a", "b", ENC_RESTRICTED, "");
    save();
    read();
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->userkey, "");
    EXPECT_EQ(my_wifi->user_wifi_cell[0]->encmode, ENC_RESTRICTED);
}

TEST_F(PreferredFile, IsReadByPositionAlone)
{
    read("USERCELL x\nKEY alias\nKEY essid\nKEY mode\nKEY 1\nKEY 2\nKEY open\nALIAS key\n");
    ASSERT_EQ(my_wifi->user_cell_count, 1);
    const WIFI_CELL &cell = *my_wifi->user_wifi_cell[0];
    EXPECT_STREQ(cell.alias, "alias");
    EXPECT_STREQ(cell.essid, "essid");
    EXPECT_STREQ(cell.mode, "mode");
    EXPECT_EQ(cell.key_mgmt, 1u);
    EXPECT_EQ(cell.key_index, 2u);
    EXPECT_EQ(cell.encmode, ENC_OPEN);
    EXPECT_STREQ(cell.userkey, "key");
    EXPECT_STREQ(cell.state, "");
    EXPECT_EQ(cell.linkstate, 0);
}

TEST_F(PreferredFile, ComparesTheEncryptionWordExactly)
{
    const struct {
        const char *line;
        t_encmode expected;
    } cases[] = {{"Encryption open", ENC_OPEN},  {"Encryption restricted", ENC_RESTRICTED},
                 {"Encryption off", ENC_OFF},    {"Encryption OPEN", ENC_OFF},
                 {"Encryption opened", ENC_OFF}, {"Encryption  \t open x", ENC_OPEN},
                 {"Encryption", ENC_OFF}};
    for (const auto &c : cases) {
        read(std::string("USERCELL\n1\n2\n3\n4\n5\n") + c.line + "\n7\n");
        EXPECT_EQ(my_wifi->user_wifi_cell[0]->encmode, c.expected) << c.line;
    }
}

TEST_F(PreferredFile, LimitsItsNumbers)
{
    const struct {
        const char *text;
        guint32 expected;
    } cases[] = {{"0", 0},
                 {"1", 1},
                 {"x", 0},
                 {"", 0},
                 {"-1", G_MAXUINT32},
                 {"3x", 3},
                 {"99999999999999999999999999", G_MAXINT32}};
    for (const auto &c : cases) {
        read(std::string("USERCELL\n1\n2\n3\nKMGMT ") + c.text + "\nKINDEX " + c.text + "\n");
        EXPECT_EQ(my_wifi->user_wifi_cell[0]->key_mgmt, c.expected) << c.text;
        EXPECT_EQ(my_wifi->user_wifi_cell[0]->key_index, c.expected) << c.text;
    }
}

TEST_F(PreferredFile, TakesOnlyAHeaderAtTheFirstColumn)
{
    read("# comment\n\n USERCELL 0\nALIAS no\nxUSERCELL 1\nusercell 2\nUSERCELLS 99\nALIAS yes\n");
    EXPECT_EQ(my_wifi->user_cell_count, 1);
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "yes");
}

TEST_F(PreferredFile, NumbersByOrder)
{
    std::string text;
    for (const char *number : {"7", "-1", "x"})
        text += std::string("USERCELL ") + number + "\nALIAS " + number + "\n\n\n\n\n\n\n";
    read(text);
    EXPECT_EQ(my_wifi->user_cell_count, 3);
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "7");
    EXPECT_STREQ(my_wifi->user_wifi_cell[2]->alias, "x");
}

// A file that is cut after any byte yields every record that has begun; the fields after the cut
// are zero.
TEST_F(PreferredFile, CutAnywhereYieldsWhatIsThere)
{
    add("alias one", "essid one", ENC_RESTRICTED, "key1");
    add("alias two", "essid two", ENC_OPEN, "key2");
    for (int i = 0; i < 2; i++)
        my_wifi->user_wifi_cell[i]->key_mgmt = my_wifi->user_wifi_cell[i]->key_index = 1;
    save();
    std::string whole = read_file(file);
    for (size_t length = 0; length <= whole.size(); length++) {
        read(whole.substr(0, length));
        ASSERT_TRUE(preferred_networks() == model::read_preferred(whole.substr(0, length)))
            << length;
    }
    read(whole.substr(0, whole.find("ESSID")));
    EXPECT_EQ(my_wifi->user_cell_count, 1);
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "alias one");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->essid, ""); // the last line is not read again
    read("USERCELL 0\n");
    EXPECT_EQ(my_wifi->user_cell_count, 1);
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "");
}

TEST_F(PreferredFile, KeepsAFullAlias)
{
    std::string full(127, 'a'), line(240, 'b'), character = std::string(126, 'c') + "\xC3\xA9";
    read("USERCELL\nALIAS " + full + "\nESSID " + line + "\n");
    EXPECT_EQ(my_wifi->user_wifi_cell[0]->alias, full);
    EXPECT_EQ(my_wifi->user_wifi_cell[0]->essid, line.substr(0, 127));
    read("USERCELL\nALIAS " + character + "\nESSID " + std::string(150, ' ') + "far\n");
    EXPECT_EQ(my_wifi->user_wifi_cell[0]->alias, character.substr(0, 126));
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->essid, "far");
}

// A line of 254 bytes and its newline take two reads.
TEST_F(PreferredFile, TakesTheRestOfALongLineAsALine)
{
    read("USERCELL\nALIAS " + std::string(247, 'a') + "\nESSID e\n");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->essid, "e");
    read("USERCELL\nALIAS " + std::string(248, 'a') + "\nESSID e\nMODE m\n");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->essid, "");
    EXPECT_STREQ(my_wifi->user_wifi_cell[0]->mode, "e");
}

TEST_F(PreferredFile, StopsAt64Networks)
{
    for (int count : {63, 64, 65, 200}) {
        std::string text;
        for (int i = 0; i < count; i++)
            text += "USERCELL " + std::to_string(i) + "\nALIAS n" + std::to_string(i) +
                    "\n\n\n\n\n\nKEY USERCELL\n";
        read(text);
        EXPECT_EQ(my_wifi->user_cell_count, std::min(count, 64));
        EXPECT_EQ(read_whole, count <= 64);
        EXPECT_EQ(my_wifi->user_wifi_cell[62]->alias, std::string("n62"));
        EXPECT_EQ(errors, count > 64 ? "WIRELESS-LAN-DEBUG: only the first 64 preferred networks "
                                       "are kept\n"
                                     : "");
    }
}

TEST_F(PreferredFile, MissingOrAFolderChangesNothing)
{
    add("before", "b", ENC_OFF, "");
    for (const std::string &path : {scratch_directory() + "/missing", scratch_directory()}) {
        file = path;
        read();
        EXPECT_EQ(errors, "Could not access file: " + path + "\n");
        // Only a missing file counts as an empty one.
        EXPECT_EQ(read_whole, path != scratch_directory());
        EXPECT_EQ(my_wifi->user_cell_count, 1);
        EXPECT_STREQ(my_wifi->user_wifi_cell[0]->alias, "before");
    }
}

TEST_F(PreferredFile, LeavesNothingOfAFormerRecord)
{
    WIFI_CELL *cell = add("long alias before", "long name before", ENC_OPEN, "key");
    cell->linkstate = 1;
    read("USERCELL\nALIAS a\n");
    WIFI_CELL expected = {};
    copy_field(expected.alias, 128, "a");
    EXPECT_EQ(memcmp(my_wifi->user_wifi_cell[0], &expected, sizeof expected), 0);
}

TEST_F(PreferredFile, TakesCarriageReturnsAndNulBytes)
{
    read("USERCELL\r\nALIAS a b\r\nESSID c\0d\r\nMODE m\r\nKMGMT 1\r\nKINDEX 2\r\n"
         "Encryption open\r\nKEY k\r\n"s);
    const WIFI_CELL &cell = *my_wifi->user_wifi_cell[0];
    EXPECT_STREQ(cell.alias, "a b");
    EXPECT_STREQ(cell.essid, "c");
    EXPECT_STREQ(cell.mode, "m");
    EXPECT_EQ(cell.encmode, ENC_OPEN);
    EXPECT_STREQ(cell.userkey, "k");
}

TEST_F(PreferredFile, ComesBackAsAnIndependentReadingHasIt)
{
    file = memory_directory() + "/wireless-user.conf";
    std::mt19937 source(19991231);
    int networks = 0;
    for (int round = 0; round < 300; round++) {
        fresh_state();
        for (unsigned count = random_number(source, 65); count > 0; count--, networks++) {
            WIFI_CELL *cell = add(
                random_text(source, 128).c_str(), random_text(source, 128).c_str(),
                static_cast<t_encmode>(random_number(source, 3)), random_text(source, 128).c_str());
            copy_field(cell->mode, 16, random_text(source, 16).c_str());
            cell->key_mgmt = static_cast<guint32>(source());
            cell->key_index = random_number(source, 4);
        }
        ASSERT_TRUE(save());
        std::string text = read_file(file);
        ASSERT_EQ(text, model::write_preferred(preferred_networks()));
        int before = my_wifi->user_cell_count;
        read();
        ASSERT_EQ(my_wifi->user_cell_count, before);
        ASSERT_TRUE(preferred_networks() == model::read_preferred(text)) << text;
    }
    EXPECT_GT(networks, 5000);
}
