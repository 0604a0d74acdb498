#include <gtest/gtest.h>

#include "MwAvrcp.h"
#include "fakes/Fakes.h"

namespace {

using fakes::calls;

TEST(MwAvrcpTest, DeliversStatesInOrderAndShutsDown)
{
    fakes::reset();
    {
        MwAvrcp remote;
        for (const int state : {1, 2, 1, 3, -1})
            remote.setAvrcpState(state);
    }
    EXPECT_EQ((std::vector<std::string>{"bt_initialize", "bt_avrcp_target_initialize",
                  "bt_avrcp_target_notify_player_state 1", "bt_avrcp_target_notify_player_state 2",
                  "bt_avrcp_target_notify_player_state 1", "bt_avrcp_target_deinitialize", "bt_deinitialize"}),
        calls.all());
    EXPECT_EQ(2u, fakes::log.count("Unhandled state"));
}

TEST(MwAvrcpTest, WithoutBluetoothNothingIsReported)
{
    for (const char* call : {"bt_initialize", "bt_avrcp_target_initialize"}) {
        fakes::reset();
        calls.failWith(call, -1);
        {
            MwAvrcp remote;
            remote.setAvrcpState(1);
        }
        EXPECT_FALSE(calls.has("bt_avrcp_target_notify")) << call;
        EXPECT_EQ(std::string(call) != "bt_initialize", calls.has("bt_deinitialize"));
    }
}

}
