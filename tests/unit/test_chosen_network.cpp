// SPDX-License-Identifier: MIT
#include <cstring>

#include <gtest/gtest.h>

#include "base/state.h"
#include "connection/chosen_network.h"
#include "wifi.h"

struct ChosenNetwork : testing::Test {
    WIFI_CELL chosen = {};

    void SetUp() override
    {
        ASSERT_TRUE(my_wifi_init());
        connect_index = -1;
        add("02:00:00:00:00:01", "cafe");
        add("02:00:00:00:00:02", "home net");
        add("02:00:00:00:00:03", "");
    }

    void TearDown() override
    {
        forget_cells();
        g_free(my_wifi);
        my_wifi = nullptr;
    }

    void add(const char *address, const char *essid)
    {
        WIFI_CELL *cell = g_new0(WIFI_CELL, 1);

        g_strlcpy(cell->address, address, sizeof cell->address);
        g_strlcpy(cell->essid, essid, sizeof cell->essid);
        my_wifi->wifi_cell[my_wifi->cell_count++] = cell;
    }

    void forget_cells()
    {
        for (int i = 0; i < my_wifi->cell_count; i++)
            g_free(my_wifi->wifi_cell[i]);
        my_wifi->cell_count = 0;
    }

    void choose(int index)
    {
        connect_index = index;
        chosen = *my_wifi->wifi_cell[index];
        g_strlcpy(chosen.userkey, "secret", sizeof chosen.userkey);
        chosen.encmode = ENC_OPEN;
        chosen.key_mgmt = 1;
        chosen.key_index = 2;
    }

    gboolean take_up()
    {
        WIFI_CELL *cell = find_chosen_network(&chosen);

        if (cell != nullptr)
            take_answers_over(cell, &chosen);
        return cell != nullptr;
    }

    void expect_keys_nowhere_but(int index)
    {
        for (int i = 0; i < my_wifi->cell_count; i++)
            EXPECT_STREQ(my_wifi->wifi_cell[i]->userkey, i == index ? "secret" : "") << i;
    }
};

TEST_F(ChosenNetwork, GetsItsAnswers)
{
    choose(1);
    ASSERT_TRUE(take_up());
    EXPECT_EQ(connect_index, 1);
    expect_keys_nowhere_but(1);
    EXPECT_EQ(my_wifi->wifi_cell[1]->encmode, ENC_OPEN);
    EXPECT_EQ(my_wifi->wifi_cell[1]->key_mgmt, 1u);
    EXPECT_EQ(my_wifi->wifi_cell[1]->key_index, 2u);
}

TEST_F(ChosenNetwork, IsFoundWhereARefreshPutIt)
{
    choose(1);
    forget_cells();
    add("02:00:00:00:00:09", "home net");
    add("02:00:00:00:00:01", "cafe");
    add("02:00:00:00:00:04", "new");
    add("02:00:00:00:00:02", "home net");
    connect_index = 1; // as a refresh that matched the access point leaves it
    ASSERT_TRUE(take_up());
    EXPECT_EQ(connect_index, 3);
    expect_keys_nowhere_but(3);
}

TEST_F(ChosenNetwork, OfAShorterScanIsNoOther)
{
    choose(1);
    forget_cells();
    add("02:00:00:00:00:01", "cafe");
    connect_index = -1;
    EXPECT_FALSE(take_up());
    EXPECT_EQ(connect_index, -1);
    expect_keys_nowhere_but(-1);
}

TEST_F(ChosenNetwork, IsNotItsNamesakeNorWhatItsAccessPointBecame)
{
    choose(1);
    forget_cells();
    add("02:00:00:00:00:05", "home net");
    add("02:00:00:00:00:02", "other");
    connect_index = 1;
    EXPECT_FALSE(take_up());
    expect_keys_nowhere_but(-1);
}

TEST_F(ChosenNetwork, IsGoneWithAnEmptyList)
{
    choose(2);
    forget_cells();
    EXPECT_FALSE(take_up());
}

TEST_F(ChosenNetwork, ListedTwiceKeepsItsRow)
{
    add("02:00:00:00:00:02", "home net");
    choose(3);
    ASSERT_TRUE(take_up());
    EXPECT_EQ(connect_index, 3);
    expect_keys_nowhere_but(3);
}
