// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "support/commands.h"
#include "wifi_info/shell.h"

static const char *const HOSTILE[] = {
    "",          "home net",     "a\"b",        "a\\b",        "$HOME",        "$(id)",
    "`id`",      "\";reboot;\"", "\\",          "\\\\",        "-n",           "-e a\\nb",
    "--help",    "\\c",          "%s%n%p",      "'quoted'",    "a'b",          "!history !!",
    "~ * ? [a]", "#comment",     "a;b&c|d>e<f", "${IFS}",      "$((1+1))",     "trailing\\",
    " blanks ",  "tab\there",    "line\nend",   "caf\xC3\xA9", "\xFF\xFE\x80", "-",
    "\\0101",    "\\x41",        "a\rb",        "\x01\x7F",    "$'x'",         "\"\"\"",
};

TEST(ShellEscape, PutsABackslashBeforeFourCharacters)
{
    const char *const cases[][2] = {
        {"", ""},
        {"home net", "home net"},
        {"a\"b\\c$d`e", "a\\\"b\\\\c\\$d\\`e"},
        {"';!*~#%&|<>(){}", "';!*~#%&|<>(){}"},
        {"caf\xC3\xA9\n", "caf\xC3\xA9\n"},
    };
    for (const auto &c : cases) {
        g_autofree gchar *escaped = shell_escape(c[0]);
        EXPECT_STREQ(escaped, c[1]);
    }
}

TEST(EchoCommand, IsByteForByte)
{
    const char *const cases[][2] = {
        {"home net", "echo \"home net\" >/tmp/x"},     {"", "echo \"\" >/tmp/x"},
        {"$a`b\"c", "echo \"\\$a\\`b\\\"c\" >/tmp/x"}, {"-n", "printf '%s\\n' \"-n\" >/tmp/x"},
        {"a\\b", "printf '%s\\n' \"a\\\\b\" >/tmp/x"}, {"a-n", "echo \"a-n\" >/tmp/x"},
    };
    for (const auto &c : cases) {
        g_autofree gchar *command = echo_command(c[0], "/tmp/x");
        EXPECT_STREQ(command, c[1]);
    }
}

TEST(EchoCommand, IsNeverCut)
{
    std::string text(100000, '"');
    g_autofree gchar *command = echo_command(text.c_str(), "/tmp/x");
    EXPECT_EQ(strlen(command), strlen("echo \"\" >/tmp/x") + 200000);
}

// Every installed shell writes the text and a newline.
TEST(EchoCommand, WritesTheTextInRealShells)
{
    int shells = 0;
    std::string script = scratch_directory() + "/script", target = scratch_directory() + "/written";
    for (const char *shell : {"dash", "bash", "busybox sh", "zsh", "ksh"}) {
        if (real_system(std::string("command -v ") + shell + " >/dev/null 2>&1") != 0)
            continue;
        shells++;
        for (const char *text : HOSTILE) {
            g_autofree gchar *command = echo_command(text, target.c_str());
            write_file(script, command);
            write_file(target, "old");
            EXPECT_EQ(real_system(std::string(shell) + " " + script), 0);
            EXPECT_EQ(read_file(target), std::string(text) + "\n") << shell;
        }
    }
    EXPECT_GE(shells, 1);
}

TEST(ShellEscape, MakesOneArgumentInRealShells)
{
    std::string target = scratch_directory() + "/written";
    for (const char *text : HOSTILE) {
        g_autofree gchar *escaped = shell_escape(text);
        std::string command = std::string("printf '%s|' \"") + escaped + "\" >" + target;
        EXPECT_EQ(real_system(command), 0);
        EXPECT_EQ(read_file(target), std::string(text) + "|");
    }
}

TEST(RunCommand, HandsTheLineToTheShellAsItIs)
{
    commands.clear();
    run_command("/sbin/iwset wlan0 essid off");
    EXPECT_EQ(commands, std::vector<std::string>({"system: /sbin/iwset wlan0 essid off"}));
}

TEST(InterfaceUsable, TakesNamesThatTheKernelCouldGive)
{
    for (const char *name : {"wlan0", "eth0", "w", "fifteen-bytes-x", "wlp3s0", "br0.100",
                             "wl_an-1", "wlan@0", "a+b", "%d"})
        EXPECT_TRUE(interface_usable(name, "a test")) << name;
}

TEST(InterfaceUsable, RefusesAllOthersWithOneLine)
{
    for (const char *name : {"",
                             "sixteen-bytes-xx",
                             "face | tus | li",
                             "a b",
                             "a\tb",
                             "a/b",
                             "a:b",
                             ".",
                             "..",
                             "$(id)",
                             "a;b",
                             "a&b",
                             "`a`",
                             "a|b",
                             "a>b",
                             "a\"b",
                             "a'b",
                             "a*",
                             "a?",
                             "[a]",
                             "~a",
                             "#a",
                             "a\\b",
                             "a\nb",
                             "a\x01",
                             "a\x7F",
                             "\xA0",
                             "-a",
                             "{a,b}",
                             "!a",
                             "a=b",
                             "^a"}) {
        testing::internal::CaptureStderr();
        EXPECT_FALSE(interface_usable(name, "the test")) << name;
        EXPECT_EQ(testing::internal::GetCapturedStderr(),
                  "WIRELESS-LAN-DEBUG: no usable interface name, skipping the test\n");
    }
}

TEST(BringInterfaceUp, RunsIfconfigForAUsableNameAlone)
{
    commands.clear();
    bring_interface_up("wlan0");
    testing::internal::CaptureStderr();
    bring_interface_up("face | tus | li");
    testing::internal::GetCapturedStderr();
    EXPECT_EQ(commands, std::vector<std::string>({"system: /sbin/ifconfig wlan0 up"}));
}
