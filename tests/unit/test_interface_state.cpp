// SPDX-License-Identifier: MIT
#include <cstring>
#include <string>

#include <gtest/gtest.h>

#include "base/state.h"
#include "connection/interface_state.h"
#include "support/descriptors.h"
#include "wifi.h"

static WIFI_INTERFACE named(const char *name)
{
    WIFI_INTERFACE iface = {};

    g_strlcpy(iface.name, name, sizeof iface.name);
    g_strlcpy(iface.address, "10.9.8.7", sizeof iface.address);
    return iface;
}

TEST(InterfaceState, NoInterfaceHasNoAddress)
{
    WIFI_INTERFACE missing = named("no-such-if");

    EXPECT_FALSE(address_valid(nullptr));
    EXPECT_FALSE(address_valid(&missing));
}

TEST(InterfaceState, AFailedRequestEmptiesTheAddress)
{
    WIFI_INTERFACE missing = named("no-such-if");

    testing::internal::CaptureStderr();
    get_interface_statistics_data(&missing);

    const std::string said = testing::internal::GetCapturedStderr();

    EXPECT_STREQ(missing.address, "");
    EXPECT_EQ(said.find("ioctl: "), 0u) << said;
}

TEST(InterfaceState, ReadsTheAddressAsDottedText)
{
    WIFI_INTERFACE loopback = named("lo");

    ASSERT_TRUE(address_valid(&loopback)) << "the loopback interface has to be up";
    testing::internal::CaptureStderr();
    get_interface_statistics_data(&loopback);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "WIRELESS-LAN-DEBUG: address:127.0.0.1\n");
    EXPECT_STREQ(loopback.address, "127.0.0.1");
}

TEST(InterfaceState, AFailedRequestLeavesNoAccessPointAndNoDescriptors)
{
    WIFI_INTERFACE missing = named("no-such-if");

    ASSERT_TRUE(my_wifi_init());
    g_strlcpy(Link_AP_MAC, "02:00:00:00:00:01", sizeof Link_AP_MAC);
    get_ap_mac(); // without an interface record
    EXPECT_STREQ(Link_AP_MAC, "");
    my_wifi->wifi_interface[0] = &missing;
    g_strlcpy(Link_AP_MAC, "02:00:00:00:00:01", sizeof Link_AP_MAC);
    get_ap_mac();
    for (const char byte : Link_AP_MAC)
        EXPECT_EQ(byte, '\0');

    const size_t before = open_descriptors();

    for (int i = 0; i < 1000; i++) {
        get_ap_mac();
        address_valid(&missing);
    }
    EXPECT_EQ(open_descriptors(), before);
    g_free(my_wifi);
    my_wifi = nullptr;
}
