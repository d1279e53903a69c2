// Order and widths of the records, as programs outside know them.

#include <gtest/gtest.h>

#include "wifi.h"

#define AT(record, field, offset, size)                                                            \
    EXPECT_EQ(offsetof(record, field), size_t{offset}) << #field;                                  \
    EXPECT_EQ(sizeof(record::field), size_t{size}) << #field

TEST(Layout, OfANetwork)
{
    AT(WIFI_CELL, address, 0, 32);
    AT(WIFI_CELL, essid, 32, 128);
    AT(WIFI_CELL, mode, 160, 16);
    AT(WIFI_CELL, encmode, 176, 4);
    AT(WIFI_CELL, channel, 180, 40);
    AT(WIFI_CELL, key, 220, 4);
    AT(WIFI_CELL, userkey, 224, 128);
    AT(WIFI_CELL, surpport_rates, 352, 128);
    AT(WIFI_CELL, bit_rates, 480, 8);
    AT(WIFI_CELL, quality, 488, 16);
    AT(WIFI_CELL, signal_level, 504, 16);
    AT(WIFI_CELL, noise_level, 520, 16);
    AT(WIFI_CELL, state, 536, 128);
    AT(WIFI_CELL, alias, 664, 128);
    AT(WIFI_CELL, linkstate, 792, 4);
    AT(WIFI_CELL, key_mgmt, 796, 4);
    AT(WIFI_CELL, key_index, 800, 4);
    EXPECT_EQ(sizeof(WIFI_CELL), 804u);
}

TEST(Layout, OfAnInterface)
{
    AT(WIFI_INTERFACE, name, 0, 16);
    AT(WIFI_INTERFACE, type, 16, 16);
    AT(WIFI_INTERFACE, essid, 32, 128);
    AT(WIFI_INTERFACE, mode, 160, 4);
    AT(WIFI_INTERFACE, encmode, 164, 4);
    AT(WIFI_INTERFACE, channel, 168, 4);
    AT(WIFI_INTERFACE, key, 172, 32);
    AT(WIFI_INTERFACE, quality, 204, 8);
    AT(WIFI_INTERFACE, key1, 212, 128);
    AT(WIFI_INTERFACE, address, 340, 32);
    AT(WIFI_INTERFACE, netmask, 372, 32);
    AT(WIFI_INTERFACE, broadcast, 404, 32);
    AT(WIFI_INTERFACE, gateway, 436, 32);
    AT(WIFI_INTERFACE, isdhcp, 468, 4);
    AT(WIFI_INTERFACE, isstatic, 472, 4);
    AT(WIFI_INTERFACE, UP, 476, 4);
    AT(WIFI_INTERFACE, RUNNING, 480, 4);
    AT(WIFI_INTERFACE, auto_dns, 484, 4);
    AT(WIFI_INTERFACE, stats, 488, 16);
    AT(WIFI_INTERFACE, wifi_group_enable, 504, 4);
    AT(WIFI_INTERFACE, wifi_group, 508, 804);
    EXPECT_EQ(sizeof(WIFI_INTERFACE), 1312u);
}

TEST(Layout, OfTheStatistics)
{
    AT(iw_statics, status, 0, 4);
    AT(iw_statics, quality, 4, 4);
    AT(iw_statics, level, 8, 4);
    AT(iw_statics, noise, 12, 4);
    EXPECT_EQ(sizeof(iw_statics), 16u);
}

TEST(Layout, OfTheState)
{
    constexpr size_t pointer = sizeof(void *);
    AT(MY_WIFI, interface_index, 0, 4);
    AT(MY_WIFI, interface_count, 4, 4);
    AT(MY_WIFI, wifi_interface, 8, 16 * pointer);
    AT(MY_WIFI, cell_index, 8 + 16 * pointer, 4);
    AT(MY_WIFI, cell_count, 12 + 16 * pointer, 4);
    AT(MY_WIFI, user_cell_count, 16 + 16 * pointer, 4);
    AT(MY_WIFI, user_cell_index, 20 + 16 * pointer, 4);
    AT(MY_WIFI, wifi_cell, 24 + 16 * pointer, 128 * pointer);
    AT(MY_WIFI, user_wifi_cell, 24 + 144 * pointer, 64 * pointer);
    AT(MY_WIFI, wifi_view, 24 + 208 * pointer, pointer);
    AT(MY_WIFI, wifi_combo, 24 + 209 * pointer, pointer);
    AT(MY_WIFI, cell_type, 24 + 210 * pointer, 4);
}

TEST(Layout, OfTheEnumerations)
{
    EXPECT_EQ(MODE_MANAGED, 0u);
    EXPECT_EQ(MODE_ADHOC, 1u);
    EXPECT_EQ(ENC_OFF, 0u);
    EXPECT_EQ(ENC_OPEN, 1u);
    EXPECT_EQ(ENC_RESTRICTED, 2u);
    EXPECT_EQ(sizeof(t_wifimode), 4u);
    EXPECT_EQ(sizeof(t_encmode), 4u);
    EXPECT_EQ(sizeof(Link_AP_MAC), 48u);
    EXPECT_EQ(sizeof(static_address), 32u);
    EXPECT_EQ(sizeof(static_netmask), 32u);
    EXPECT_EQ(sizeof(static_broadcast), 32u);
    EXPECT_EQ(sizeof(static_gateway), 32u);
}
