// SPDX-License-Identifier: MIT
#include <cerrno>
#include <cstring>
#include <string>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "connection/commands.h"
#include "wifi.h"
#include "wifi_info/encryption.h"
#include "wifi_info/shell.h"

static WIFI_CELL make_cell(const char *essid, const char *mode, const char *key)
{
    WIFI_CELL cell = {};

    g_strlcpy(cell.essid, essid, sizeof cell.essid);
    g_strlcpy(cell.mode, mode, sizeof cell.mode);
    g_strlcpy(cell.userkey, key, sizeof cell.userkey);
    return cell;
}

static std::string command_for(const WIFI_CELL &cell)
{
    g_autofree gchar *command = iwset_command("wlan0", &cell);

    return command;
}

TEST(EncryptionWord, KnowsThreeWords)
{
    EXPECT_STREQ(encryption_word(ENC_OFF, FILE_WORDS), "off");
    EXPECT_STREQ(encryption_word(ENC_OPEN, FILE_WORDS), "open");
    EXPECT_STREQ(encryption_word(ENC_RESTRICTED, FILE_WORDS), "restricted");
    EXPECT_STREQ(encryption_word(static_cast<t_encmode>(3), FILE_WORDS), "restricted");
    EXPECT_STREQ(encryption_word(static_cast<t_encmode>(0xFFFFFFFF), FILE_WORDS), "restricted");
}

TEST(ClientMode, TurnsMasterIntoManagedInAnyCase)
{
    for (const char *mode : {"Master", "MASTER", "master", "mAsTeR"})
        EXPECT_STREQ(client_mode(mode), "Managed") << mode;
    for (const char *mode : {"Ad-Hoc", "Managed", "managed", "Auto", "Maste", "Masters", ""})
        EXPECT_STREQ(client_mode(mode), mode);
}

TEST(KeyWord, IsOffForAnEmptyKeyOnly)
{
    const WIFI_CELL none = make_cell("cafe", "Managed", "");
    const WIFI_CELL some = make_cell("cafe", "Managed", " ");

    EXPECT_STREQ(key_word(&none), "off");
    EXPECT_STREQ(key_word(&some), " ");
}

TEST(IwsetCommand, OpenNetwork)
{
    EXPECT_EQ(command_for(make_cell("cafe", "Master", "")),
              "/sbin/iwset \"wlan0\" essid \"cafe\" mode \"Managed\" key \"off\" enc \"off\" "
              "\"[1]\"");
}

TEST(IwsetCommand, WepCountsItsKeysFromOne)
{
    WIFI_CELL cell = make_cell("old wep", "Ad-Hoc", "abcde");

    cell.encmode = ENC_OPEN;
    for (guint32 index = 0; index < 4; index++) {
        cell.key_index = index;
        EXPECT_EQ(command_for(cell),
                  "/sbin/iwset \"wlan0\" essid \"old wep\" mode \"Ad-Hoc\" key \"abcde\" enc "
                  "\"open\" \"[" +
                      std::to_string(index + 1) + "]\"");
    }
}

TEST(IwsetCommand, WpaHasTwoBlanksAndNoIndex)
{
    WIFI_CELL cell = make_cell("home net", "MASTER", "correct horse");

    cell.encmode = ENC_OPEN;
    cell.key_mgmt = 1;
    cell.key_index = 3;
    EXPECT_EQ(command_for(cell),
              "/sbin/iwset  wpa \"wlan0\" essid \"home net\" mode \"Managed\" key \"correct horse\""
              " enc \"open\"");
}

TEST(IwsetCommand, RestrictedAndBeyond)
{
    WIFI_CELL cell = make_cell("cafe", "Managed", "k");

    for (const guint32 value : {2u, 3u, 99u}) {
        cell.encmode = static_cast<t_encmode>(value);
        EXPECT_NE(command_for(cell).find("enc \"restricted\""), std::string::npos) << value;
    }
}

TEST(IwsetCommand, EmptyKeyIsOffWhateverTheEncryption)
{
    WIFI_CELL cell = make_cell("cafe", "Managed", "");

    for (const t_encmode encmode : {ENC_OFF, ENC_OPEN, ENC_RESTRICTED}) {
        cell.encmode = encmode;
        EXPECT_NE(command_for(cell).find("key \"off\""), std::string::npos);
    }
}

TEST(IwsetCommand, EscapesTheFourCharactersOfTheShell)
{
    EXPECT_EQ(command_for(make_cell("a\"b$(id)`\\", "Man$aged", "k\"")),
              "/sbin/iwset \"wlan0\" essid \"a\\\"b\\$(id)\\`\\\\\" mode \"Man\\$aged\" "
              "key \"k\\\"\" enc \"off\" \"[1]\"");
}

TEST(IwsetCommand, IsNeverCut)
{
    const std::string long_name(127, '"'), long_key(127, '$');
    const std::string command =
        command_for(make_cell(long_name.c_str(), "Managed", long_key.c_str()));

    EXPECT_GT(command.size(), 2 * 2 * 127u);
    EXPECT_EQ(command.substr(command.size() - 5), "\"[1]\"");
}

// Another user, who makes a file of this name right before we can, so many times.
static std::string intruder;
static int intrusions = 0;

extern "C" int mknod(const char *path, mode_t mode, dev_t device)
{
    if (intruder == path && intrusions > 0) {
        intrusions--;
        EXPECT_TRUE(g_file_set_contents(path, "theirs", -1, nullptr));
        errno = EEXIST;
        return -1;
    }
    return mknodat(AT_FDCWD, path, mode, device);
}

struct LeaveText : testing::Test {
    std::string directory, path;

    void SetUp() override
    {
        char name[] = "/tmp/leave-text.XXXXXX";

        directory = mkdtemp(name);
        path = directory + "/key_tmp";
    }

    void TearDown() override
    {
        g_autofree gchar *command = g_strdup_printf("rm -rf %s", directory.c_str());

        run_command(command);
    }

    std::string content(const std::string &file)
    {
        g_autofree gchar *text = nullptr;

        return g_file_get_contents(file.c_str(), &text, nullptr, nullptr) ? text : "(none)";
    }

    mode_t permissions()
    {
        struct stat status = {};

        lstat(path.c_str(), &status);
        return status.st_mode;
    }
};

TEST_F(LeaveText, MakesThePrivateFile)
{
    leave_text_for_scripts("secret", path.c_str(), 0600);
    EXPECT_EQ(content(path), "secret\n");
    EXPECT_EQ(permissions(), static_cast<mode_t>(S_IFREG | 0600));
}

TEST_F(LeaveText, ReplacesAFileThatOthersCouldRead)
{
    ASSERT_TRUE(g_file_set_contents(path.c_str(), "old and longer", -1, nullptr));
    ASSERT_EQ(chmod(path.c_str(), 0666), 0);
    leave_text_for_scripts("new", path.c_str(), 0600);
    EXPECT_EQ(content(path), "new\n");
    EXPECT_EQ(permissions(), static_cast<mode_t>(S_IFREG | 0600));
}

TEST_F(LeaveText, DoesNotFollowALink)
{
    const std::string target = directory + "/target";

    ASSERT_TRUE(g_file_set_contents(target.c_str(), "untouched", -1, nullptr));
    ASSERT_EQ(symlink(target.c_str(), path.c_str()), 0);
    leave_text_for_scripts("secret", path.c_str(), 0600);
    EXPECT_EQ(content(target), "untouched");
    EXPECT_EQ(content(path), "secret\n");
    EXPECT_EQ(permissions(), static_cast<mode_t>(S_IFREG | 0600));
}

TEST_F(LeaveText, DoesNotFollowALinkToNowhere)
{
    const std::string target = directory + "/nowhere";

    ASSERT_EQ(symlink(target.c_str(), path.c_str()), 0);
    leave_text_for_scripts("secret", path.c_str(), 0600);
    EXPECT_NE(access(target.c_str(), F_OK), 0);
    EXPECT_EQ(content(path), "secret\n");
}

TEST_F(LeaveText, RemovesWhatAnotherUserMakesAgain)
{
    for (const int times : {1, 99, 100}) {
        intruder = path;
        intrusions = times;
        testing::internal::CaptureStderr();
        EXPECT_EQ(leave_text_for_scripts("secret", path.c_str(), 0600), times < 100);

        const std::string said = testing::internal::GetCapturedStderr();

        EXPECT_EQ(intrusions, 0);
        EXPECT_EQ(content(path), times < 100 ? "secret\n" : "theirs");
        EXPECT_EQ(said, times < 100
                            ? ""
                            : "WIRELESS-LAN-DEBUG: " + path + " is not written: File exists\n");
        intruder.clear();
    }
}

TEST_F(LeaveText, IsOneLine)
{
    EXPECT_TRUE(leave_text_for_scripts("a\nb\r\nc", path.c_str(), 0600));
    EXPECT_EQ(content(path), "a b  c\n");
}

TEST_F(LeaveText, SaysWhyAFileCannotBeMade)
{
    ASSERT_EQ(mkdir(path.c_str(), 0700), 0);
    testing::internal::CaptureStderr();
    leave_text_for_scripts("secret", path.c_str(), 0600);

    const std::string said = testing::internal::GetCapturedStderr();

    EXPECT_EQ(said.find("WIRELESS-LAN-DEBUG: " + path + " is not written: "), 0u) << said;
    EXPECT_EQ(said.find("secret"), std::string::npos);
}

TEST_F(LeaveText, KeepsTheBytesOfTextsThatFightBack)
{
    for (const char *text :
         {"", "-n", "-e", "--help", "\\t\\n\\c", "\"", "$HOME", "`id`", "$(touch x)", "%s%n",
          "\";touch x;\"", "!", "a  b", "\xff\xfe", "caf\xc3\xa9", "*", "~", "a;b", "'"}) {
        leave_text_for_scripts(text, path.c_str(), 0600);
        EXPECT_EQ(content(path), std::string(text) + "\n");
    }
    EXPECT_NE(access("x", F_OK), 0);
}
