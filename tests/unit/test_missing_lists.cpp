// SPDX-License-Identifier: MIT
// The combos of the key dialog before the preferred lists exist. This needs no display.

#include <string>

#include <gtest/gtest.h>

#include "base/state.h"
#include "connection/encrypted_dialog.h"
#include "wifi.h"

static const std::string MESSAGE = "WIRELESS-LAN-DEBUG: user_cell_list_backend get failed.\n";

struct MissingLists : testing::Test {
    void SetUp() override
    {
        ASSERT_TRUE(my_wifi_init());
        testing::internal::CaptureStderr();
    }

    void TearDown() override
    {
        EXPECT_EQ(testing::internal::GetCapturedStderr(), MESSAGE);
        g_free(my_wifi);
        my_wifi = nullptr;
    }
};

static const gpointer INVALID = GINT_TO_POINTER(1);

TEST_F(MissingLists, GiveTheInvalidWidgetForTheAuthentication)
{
    EXPECT_EQ(create_Authentication_ComboBox(), INVALID);
}

TEST_F(MissingLists, GiveTheInvalidWidgetForTheKeyIndex)
{
    EXPECT_EQ(create_Key_Index_ComboBox(), INVALID);
}

TEST_F(MissingLists, GiveTheInvalidWidgetForTheNetworksAndLeaveTheCount)
{
    int count = 77;

    EXPECT_EQ(create_ComboBox(&count), INVALID);
    EXPECT_EQ(count, 77);
}
