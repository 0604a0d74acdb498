#include "support/PulseServer.h"
#include "support/RunUntil.h"

#include "host/PulseWatch.h"

#include <sound_manager.h>

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>

using support::runUntil;

class SoundTest : public testing::Test {
protected:
    ~SoundTest() override { support::runFor(0.02); }

    support::PulseServer server;
    support::TempDir directory;
};

TEST_F(SoundTest, RefusesARecordingSessionDuringCallAndAlarm)
{
    support::writeTone(directory.file("ring.wav"), 20, 0.2);
    sound_multi_session_h session = nullptr;
    ASSERT_EQ(0, sound_manager_multi_session_create(1, &session));
    for (const auto& [role, error] : {std::pair{"phone", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL},
             {"alarm", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM}, {"music", SOUND_MANAGER_ERROR_NONE}}) {
        SCOPED_TRACE(role);
        {
            const auto ring = server.playAs(role, directory.file("ring.wav"));
            EXPECT_TRUE(runUntil([&] { return server.control("list short sink-inputs").size() > 1; }));
            EXPECT_TRUE(runUntil([&] { return sound_manager_multi_session_set_option(session, 2) == error; }));
            EXPECT_EQ(error, sound_manager_multi_session_set_mode(session, 12));
        }
        EXPECT_TRUE(runUntil([&] { return sound_manager_multi_session_set_option(session, 2) == 0; }));
    }
    EXPECT_EQ(0, sound_manager_multi_session_destroy(session));
    EXPECT_NE(0, sound_manager_multi_session_set_mode(nullptr, 12));
}

TEST_F(SoundTest, FollowsTheRouteAndTheEarjack)
{
    static std::atomic<int> earjack = -1;
    earjack = -1;
    static std::vector<sound_device_out_e> routes;
    routes.clear();
    EXPECT_FALSE(host::PulseWatch::instance().refresh().isHeadsetPlugged);
    host::PulseWatch::instance().addListener(
        [](const auto&, const auto& now) { earjack = now.isHeadsetPlugged ? 1 : 0; });
    ASSERT_EQ(0,
        sound_manager_set_active_device_changed_cb(
            [](sound_device_in_e, sound_device_out_e out, void*) { routes.push_back(out); }, nullptr));
    sound_device_out_e out = SOUND_DEVICE_OUT_NONE;
    sound_device_in_e in = SOUND_DEVICE_IN_NONE;
    EXPECT_EQ(0, sound_manager_get_active_route(&in, &out));
    EXPECT_EQ(SOUND_DEVICE_OUT_SPEAKER, out);
    EXPECT_EQ(SOUND_DEVICE_IN_MIC, in);

    const std::string headset
        = server.load("module-null-sink sink_name=headset norewinds=1 sink_properties=device.form_factor=headphone");
    EXPECT_TRUE(runUntil([] { return earjack == 1; }));
    (void)server.control("set-default-sink headset");
    EXPECT_TRUE(runUntil([] { return routes == std::vector{SOUND_DEVICE_OUT_WIRED_ACCESSORY}; }));
    EXPECT_EQ(0, sound_manager_get_active_route(nullptr, &out));
    EXPECT_EQ(SOUND_DEVICE_OUT_WIRED_ACCESSORY, out);
    server.unload(headset);
    EXPECT_TRUE(runUntil([] { return earjack == 0 && routes.size() == 2; }));

    EXPECT_EQ(0, sound_manager_unset_active_device_changed_cb());
    (void)server.load("module-null-sink sink_name=again norewinds=1 sink_properties=device.form_factor=headphone");
    (void)server.control("set-default-sink again");
    EXPECT_TRUE(runUntil([] { return earjack == 1; }));
    EXPECT_EQ(2u, routes.size());
}

TEST_F(SoundTest, AnswersQuicklyWithoutAServerAndFindsItAgain)
{
    auto& watch = host::PulseWatch::instance();
    EXPECT_TRUE(runUntil([&] { return watch.refresh().isConnected; }));
    server.kill();
    EXPECT_TRUE(runUntil([&] { return !watch.refresh().isConnected; }));
    const auto begin = std::chrono::steady_clock::now();
    for (int i = 0; i < 20; ++i)
        EXPECT_FALSE(watch.refresh().othersRecord);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2));
    {
        const support::PulseServer another;
        EXPECT_TRUE(runUntil([&] { return watch.refresh().isConnected; }));
    }
    EXPECT_TRUE(runUntil([&] { return !watch.refresh().isConnected; }));
}
