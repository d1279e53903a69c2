// SPDX-License-Identifier: MIT
// Which texts the settings dialog accepts as IPv4 addresses.

#include <cerrno>
#include <cstring>
#include <string>

#include <gtest/gtest.h>

#include "settings/apply.h"

static const std::string REASON = std::string("inet_pton: ") + strerror(EINVAL) + "\n";

// The result and the text on standard error.
static void expect_judgement(const char *text, gboolean valid)
{
    testing::internal::CaptureStderr();

    const gboolean judged = address_is_valid(text);

    EXPECT_EQ(testing::internal::GetCapturedStderr(), valid ? "" : REASON) << '"' << text << '"';
    EXPECT_EQ(judged, valid) << '"' << text << '"';
}

TEST(Address, Valid)
{
    for (const char *text :
         {"0.0.0.0",         "1.2.3.4",         "9.9.9.9",         "10.0.0.1",
          "10.10.10.10",     "99.99.99.99",     "100.100.100.100", "127.0.0.1",
          "169.254.0.1",     "172.16.31.255",   "192.168.1.1",     "192.168.1.2",
          "192.168.1.255",   "199.199.199.199", "200.200.200.200", "224.0.0.1",
          "249.249.249.249", "250.250.250.250", "255.0.255.0",     "255.255.255.0",
          "255.255.255.254", "255.255.255.255"})
        expect_judgement(text, TRUE);
}

TEST(Address, OutOfRange)
{
    for (const char *text :
         {"256.0.0.0", "0.256.0.0", "0.0.256.0", "0.0.0.256", "192.168.1.300", "999.999.999.999",
          "1.2.3.1000", "1.2.3.65537", "1.2.3.4294967296", "1.2.3.18446744073709551617"})
        expect_judgement(text, FALSE);
}

TEST(Address, WrongNumberOfParts)
{
    for (const char *text :
         {"", "1", "1.2", "192.168.1", "1.2.3.4.5", "1.2.3.4.", ".1.2.3.4", "1..2.3", "1.2..3.4",
          "1.2.3.", ".", "..", "...", "....", "3232235777", "0x7f000001", "1,2,3,4", "1.2.3,4"})
        expect_judgement(text, FALSE);
}

TEST(Address, LeadingZeros)
{
    for (const char *text : {"01.2.3.4", "1.02.3.4", "1.2.003.4", "1.2.3.04", "00.0.0.0",
                             "0.0.0.00", "192.168.001.001", "010.0.0.1", "000.000.000.000"})
        expect_judgement(text, FALSE);
}

TEST(Address, BlanksAndSigns)
{
    for (const char *text :
         {" 1.2.3.4", "1.2.3.4 ", "1. 2.3.4", "1 .2.3.4", "1.2.3.4\n", "\t1.2.3.4", " ", "\n",
          "-1.2.3.4", "+1.2.3.4", "1.2.3.-4", "1.2.3.+4", "1.2.3.4 5", "1.2.3.4/24", "1.2.3.4:80",
          "1.2.3.4%wlan0", "1.2.3.4;id", "$(id)", "%s%n"})
        expect_judgement(text, FALSE);
}

TEST(Address, OtherNotations)
{
    for (const char *text :
         {"::", "::1", "fe80::1", "2001:db8::1", "::ffff:1.2.3.4", "[1.2.3.4]", "localhost",
          "example.org", "a.b.c.d", "1.2.3.a", "0x1.2.3.4", "0x7f.0.0.1", "1e1.2.3.4", "1.2.3.4a",
          "١.٢.٣.٤", "1。2。3。4", "\xff.1.2.3", "1.2.3.\xc3"})
        expect_judgement(text, FALSE);
}

TEST(Address, Long)
{
    for (const char *piece : {"1", "0", ".", "1.", "255.", " ", "a"}) {
        std::string text;

        while (text.size() < 10000)
            text += piece;
        expect_judgement(text.c_str(), FALSE);
        expect_judgement(("1.2.3.4" + text).c_str(), FALSE);
    }
}

TEST(Address, Null)
{
    testing::internal::CaptureStderr();
    EXPECT_FALSE(address_is_valid(nullptr));
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

// The reason printed must not be that of an earlier error.
TEST(Address, ReasonIsItsOwn)
{
    errno = ENOENT;
    expect_judgement("1.2.3", FALSE);
}
