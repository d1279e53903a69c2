// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "wifi_info/text.h"

// "é" is C3 A9, "☕" E2 98 95, U+1F4F6 is F0 9F 93 B6.
TEST(CopyField, CutsAtTheFieldAndNeverInsideACharacter)
{
    const struct {
        gsize size;
        const char *text, *expected;
    } cases[] = {
        {8, "", ""},
        {8, "seven b", "seven b"},
        {8, "eight by", "eight b"},
        {1, "x", ""},
        {2, "\xC3\xA9", ""},
        {3, "\xC3\xA9", "\xC3\xA9"},
        {4, "\xE2\x98\x95", "\xE2\x98\x95"},
        {4, "a\xE2\x98\x95", "a"},
        {5, "a\xE2\x98\x95z", "a\xE2\x98\x95"},
        {5, "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6", "\xF0\x9F\x93\xB6"},
        {6, "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6", "\xF0\x9F\x93\xB6"},
        {7, "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6", "\xF0\x9F\x93\xB6"},
        {8, "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6", "\xF0\x9F\x93\xB6"},
        {9, "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6", "\xF0\x9F\x93\xB6\xF0\x9F\x93\xB6"},
        {4, "\x80\x80\x80\x80\x80", "\x80\x80\x80"},
        {4, "\xFF\xFF\xFF\xFF", "\xFF\xFF\xFF"},
        {3, "\x80\x80\x80", "\x80\x80"},
        {3, "\xC3\xA9\xA9", "\xC3\xA9"},
        {4, "ab\xE9z", "ab\xE9"},
    };
    for (const auto &c : cases) {
        char field[10];
        memset(field, '#', sizeof field);
        copy_field(field, c.size, c.text);
        EXPECT_STREQ(field, c.expected) << c.text << " in " << c.size;
        EXPECT_EQ(field[c.size], '#');
    }
}

TEST(CopyField, TakesNoTextAsEmpty)
{
    char field[4] = "abc";
    copy_field(field, sizeof field, nullptr);
    EXPECT_STREQ(field, "");
}

TEST(CopyField, TakesATextInsideTheField)
{
    char field[8] = "  name ";
    copy_field(field, sizeof field, field + 2);
    EXPECT_STREQ(field, "name ");
    copy_field(field, sizeof field, field);
    EXPECT_STREQ(field, "name ");
}

TEST(SecondWord, IsTheOneAfterTheFirst)
{
    const char *const cases[][2] = {
        {"KEY secret", "secret"},
        {"KEY secret key", "secret"},
        {"  KEY\t\vsecret\r\n", "secret"},
        {"KEY", ""},
        {"KEY  \n", ""},
        {"", ""},
        {" \n", ""},
    };
    for (const auto &c : cases) {
        char word[16];
        copy_second_word(word, sizeof word, c[0]);
        EXPECT_STREQ(word, c[1]) << c[0];
    }
}

TEST(Decimal, IsLimitedToAnInt)
{
    const struct {
        const char *text;
        int expected;
    } cases[] = {{"0", 0},
                 {"12", 12},
                 {" 7x", 7},
                 {"-1", -1},
                 {"+3", 3},
                 {"", 0},
                 {"x1", 0},
                 {"2147483647", INT_MAX},
                 {"2147483648", INT_MAX},
                 {"-99999999999999999999999", INT_MIN},
                 {"99999999999999999999999", INT_MAX}};
    for (const auto &c : cases)
        EXPECT_EQ(decimal(c.text), c.expected) << c.text;
}

TEST(AppendLine, TurnsLineEndsIntoBlanks)
{
    g_autoptr(GString) text = g_string_new(nullptr);
    append_line(text, "ALIAS", "a\nUSERCELL 1\r\nb");
    append_number_line(text, "KMGMT", -1);
    EXPECT_STREQ(text->str, "ALIAS a USERCELL 1  b\nKMGMT -1\n");
}

static void keep_message(const gchar *, GLogLevelFlags level, const gchar *message, gpointer data)
{
    *static_cast<std::string *>(data) = std::to_string(level) + " " + message;
}

TEST(LogCritical, NamesThePlainFunctionAndTheExpression)
{
    std::string message;
    GLogFunc former = g_log_set_default_handler(keep_message, &message);
    log_critical("get_cell", "iface!=NULL");
    g_log_set_default_handler(former, nullptr);
    EXPECT_EQ(message,
              std::to_string(G_LOG_LEVEL_CRITICAL) + " get_cell: assertion 'iface!=NULL' failed");
}

TEST(OneLine, HasBlanksForLineEnds)
{
    for (const auto &[text, expected] :
         {std::pair("a\nb", "a b"), {"a\r\n", "a  "}, {"\n", " "}, {"a\tb", "a\tb"}, {"", ""}}) {
        g_autofree gchar *line = one_line(text);
        EXPECT_STREQ(line, expected);
    }
}

TEST(Printable, ShowsControlCharactersAndLeavesTheRestByteForByte)
{
    const char *const cases[][2] = {
        {"", ""},
        {"plain \\x41 ~", "plain \\x41 ~"},
        {"\x1B[2J\a\b", "\\x1b[2J\\x07\\x08"},
        {"a\tb\r\n", "a\\x09b\\x0d\\x0a"},
        {"\x01\x1F \x7F", "\\x01\\x1f \\x7f"},
        {"\xC3\xA9\xE2\x98\x95\xF0\x9F\x93\xB6", "\xC3\xA9\xE2\x98\x95\xF0\x9F\x93\xB6"},
        // U+009B begins a control sequence, as ESC [ does.
        {"\xC2\x80\xC2\x9B\xC2\x9F\xC2\xA0", "\\xc2\\x80\\xc2\\x9b\\xc2\\x9f\xC2\xA0"},
        {"\x9B\xE9\xFF\xA0\xC2", "\x9B\xE9\xFF\xA0\xC2"},
    };
    for (const auto &c : cases) {
        g_autofree gchar *shown = printable(c[0]);
        EXPECT_STREQ(shown, c[1]);
    }
}

TEST(WipeText, LeavesNoText)
{
    gchar *text = g_strdup("secret"), *none = nullptr;
    wipe_text(&text);
    EXPECT_EQ(text, nullptr);
    wipe_text(&none);
    EXPECT_EQ(none, nullptr);
}
