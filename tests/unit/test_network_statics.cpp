// SPDX-License-Identifier: MIT
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "connection/interface_state.h"
#include "support/descriptors.h"
#include "wifi.h"

// The content of the kernel's list; NULL: it cannot be opened.
static const std::string *list = nullptr;

// Replaces fopen of the C library; the program opens nothing else here.
extern "C" FILE *fopen(const char *path, const char *mode)
{
    if (strcmp(path, "/proc/net/wireless") != 0) {
        const int fd = open(path, strchr(mode, 'w') != nullptr ? O_WRONLY : O_RDONLY);

        return fd < 0 ? nullptr : fdopen(fd, mode);
    }
    if (list == nullptr || list->empty())
        return nullptr;
    return fmemopen(const_cast<char *>(list->data()), list->size(), "r");
}

static std::string printed_for(const char *name, const std::string &text)
{
    WIFI_INTERFACE iface = {};

    g_strlcpy(iface.name, name, sizeof iface.name);
    list = &text;
    testing::internal::CaptureStderr();
    get_network_statics(&iface);
    list = nullptr;
    return testing::internal::GetCapturedStderr();
}

static const char HEADER[] =
    "Inter-| sta-|   Quality        |   Discarded packets               | Missed | WE\n"
    " face | tus | link level noise |  nwid  crypt   frag  retry   misc | beacon | 22\n";

static std::string values(const char *status_text, const char *status, int quality, int level,
                          int noise)
{
    g_autofree gchar *text =
        g_strdup_printf("WIRELESS-LAN-DEBUG: bp--->%s\nWIRELESS-LAN-DEBUG: status=%s\n"
                        "WIRELESS-LAN-DEBUG: link quality--->%d\nWIRELESS-LAN-DEBUG: level=%d\n"
                        "WIRELESS-LAN-DEBUG: noise=%d\n",
                        status_text, status, quality, level, noise);

    return text;
}

TEST(NetworkStatics, ReadsTheLineOfItsInterface)
{
    const std::string text =
        std::string(HEADER) +
        "wlan00: 0001   11.  -12.  -13.       0      0      0      0      0        0\n"
        " wlan0: 00ff   70.  -40.  -256       0      0      0      0      0        0\n"
        " wlan1: 0002    1.    2.    3.       0      0      0      0      0        0\n";

    EXPECT_EQ(printed_for("wlan0", text), values("00ff", "ff", 70, -40, -256));
    EXPECT_EQ(printed_for("wlan00", text), values("0001", "1", 11, -12, -13));
    EXPECT_EQ(printed_for("wlan1", text), values("0002", "2", 1, 2, 3));
}

TEST(NetworkStatics, PrintsNothingForAnInterfaceThatIsNotListed)
{
    const std::string text = std::string(HEADER) + " wlan0: 0000    0     0     0  0\n";

    EXPECT_EQ(printed_for("wlan1", text), "");
    EXPECT_EQ(printed_for("wlan", text), "");
    EXPECT_EQ(printed_for("wlan0", HEADER), "");
    EXPECT_EQ(printed_for("wlan0", ""), "");
}

TEST(NetworkStatics, TakesAnInterfaceWithoutBlanksAround)
{
    EXPECT_EQ(printed_for("w", "w:1 2 3 4"), values("1", "1", 2, 3, 4));
    EXPECT_EQ(printed_for("w", "\t w:   1 2 3 4\n"), values("1", "1", 2, 3, 4));
}

TEST(NetworkStatics, StopsWhereTheLineEnds)
{
    EXPECT_EQ(printed_for("w", "w:\n"), "");
    EXPECT_EQ(printed_for("w", "w: 1\n"),
              "WIRELESS-LAN-DEBUG: bp--->1\nWIRELESS-LAN-DEBUG: status=1\n");
    EXPECT_EQ(printed_for("w", "w: zz 7. x\n"),
              "WIRELESS-LAN-DEBUG: bp--->zz\nWIRELESS-LAN-DEBUG: status=0\n"
              "WIRELESS-LAN-DEBUG: link quality--->7\nWIRELESS-LAN-DEBUG: level=0\n");
}

// Whatever the list contains, at most five lines are printed and no descriptor stays open.
TEST(NetworkStatics, SurvivesDamagedLists)
{
    const std::string sound =
        std::string(HEADER) + " wlan0: 0000   70.  -40.  -256       0      0      0        0\n";
    const std::string bytes = std::string("\0\n\t :.-0f\xff", 10) + "9999999999999999999%s%n";
    const size_t before = open_descriptors();
    guint32 seed = 1;

    for (int round = 0; round < 3000; round++) {
        std::string text = sound;

        for (int change = 0; change < 1 + round % 7; change++) {
            seed = seed * 1664525 + 1013904223;

            const size_t at = (seed >> 8) % (text.size() + 1);
            const size_t what = (seed >> 4) % bytes.size();

            switch (seed >> 30) {
            case 0:
                text.resize(at);
                break;
            case 1:
                text.insert(at, 1, bytes[what]);
                break;
            case 2:
                text.insert(at, bytes.substr(what));
                break;
            default:
                text.insert(at, text.substr(at / 2, 300));
            }
        }

        const std::string said = printed_for("wlan0", text);
        size_t lines = 0;

        for (const char byte : said)
            lines += byte == '\n';
        ASSERT_LE(lines, 5u) << text;
        ASSERT_TRUE(said.empty() || said.find("WIRELESS-LAN-DEBUG: bp--->") == 0) << said;
    }
    EXPECT_EQ(open_descriptors(), before);
}
