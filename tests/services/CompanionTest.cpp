// The companion programs as the recorder meets them: by their registry entries.
#include "app_control.h"
#include "host/BusInLoop.h"
#include "message_port.h"
#include "storage.h"

#include "support/DbusMock.h"
#include "support/PrivateBus.h"
#include "support/RunUntil.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>

namespace {

using support::BusKind;
using support::DbusMock;
using support::PrivateBus;
using support::Program;
using support::runUntil;

class CompanionTest : public testing::Test {
protected:
    CompanionTest()
    {
        ::setenv("MEWLO_APPS_DIR", TEST_APPS_DIR, 1);
        ::setenv("MEWLO_HOST", "none", 1);
        app_control_create(&_request);
    }
    ~CompanionTest() override
    {
        app_control_destroy(_request);
        host::closeBuses();
    }
    int send(const char* id)
    {
        app_control_set_app_id(_request, id);
        return app_control_send_launch_request(
            _request,
            [](app_control_h, app_control_h, app_control_result_e result, void* data) {
                static_cast<std::vector<int>*>(data)->push_back(result);
            },
            &_results);
    }

    app_control_h _request = nullptr;
    std::vector<int> _results;
};

TEST_F(CompanionTest, AlarmServiceRepliesInTimeOrEndsOnRequest)
{
    ::setenv("MEWLO_ALARM_SECONDS", "0.1", 1);
    ASSERT_EQ(0, send("com.tovanic.mewlo-alarmservice"));
    ASSERT_TRUE(runUntil([&] { return !_results.empty(); }, 30));
    EXPECT_EQ(std::vector<int>{APP_CONTROL_RESULT_SUCCEEDED}, _results);
    ::unsetenv("MEWLO_ALARM_SECONDS");
    ASSERT_EQ(0, send("com.tovanic.mewlo-alarmservice"));
    support::runFor(0.3);
    EXPECT_EQ(1U, _results.size());
    EXPECT_EQ(0, app_control_send_terminate_request(_request));
    ASSERT_TRUE(runUntil([&] { return _results.size() == 2; }, 30));
    EXPECT_EQ(APP_CONTROL_RESULT_FAILED, _results.back());
}

TEST_F(CompanionTest, StorageSettingOpensTheFileManagerAtTheRoot)
{
    const support::TempDir programs;
    const std::string opened = programs.file("opened");
    support::writeFile(programs.file("xdg-open"), "#!/bin/sh\necho \"$1\" > " + opened + "\n");
    std::filesystem::permissions(programs.file("xdg-open"), std::filesystem::perms::owner_all);
    const std::string path = ::getenv("PATH");
    ::setenv("PATH", (programs.path() + ":" + path).c_str(), 1);
    EXPECT_EQ(0, send("com.tovanic.setting.storage"));
    EXPECT_TRUE(runUntil([&] { return support::readFile(opened) == std::string(storage_device_root()) + "\n"; }, 30));
    EXPECT_TRUE(runUntil([&] { return _results == std::vector<int>{APP_CONTROL_RESULT_APP_STARTED}; }, 30));
    ::setenv("PATH", path.c_str(), 1);
}

class IndicatorTest : public CompanionTest {
protected:
    static constexpr auto WATCHER = "org.kde.StatusNotifierWatcher";
    static constexpr auto WATCHER_PATH = "/StatusNotifierWatcher";

    void SetUp() override
    {
        if (!DbusMock::isInstalled())
            GTEST_SKIP() << "python3-dbusmock is missing";
        _watcher = std::make_unique<DbusMock>(
            _bus, BusKind::SESSION, WATCHER, std::vector<std::string>{WATCHER, WATCHER_PATH, WATCHER});
        _watcher->control(WATCHER_PATH, "AddMethod", "sssss", WATCHER, "RegisterStatusNotifierItem", "s", "", "");
        _indicator = std::make_unique<Program>(std::vector<std::string>{TEST_BIN_DIR "/mewlo-indicator"});
        ASSERT_TRUE(runUntil(
            [&] { return message_port_check_remote_port("com.tovanic.indicator", "mewlo_indicator_port") == 0; }, 30));
    }
    static void tell(const char* data)
    {
        bundle* message = bundle_create();
        bundle_add_str(message, "mewlo_indicator_data", data);
        EXPECT_EQ(0, message_port_send_message("com.tovanic.indicator", "mewlo_indicator_port", message));
        bundle_free(message);
    }
    [[nodiscard]] std::string property(const char* name) const
    {
        char* text = nullptr;
        const std::string item = "org.kde.StatusNotifierItem-" + std::to_string(_indicator->id()) + "-1";
        sd_bus_get_property_string(host::sessionBus()->get(), item.c_str(), "/StatusNotifierItem",
            "org.kde.StatusNotifierItem", name, nullptr, &text);
        const std::string copy = text != nullptr ? text : "";
        ::free(text);
        return copy;
    }

    PrivateBus _bus;
    std::unique_ptr<DbusMock> _watcher;
    std::unique_ptr<Program> _indicator;
};

TEST_F(IndicatorTest, ShowsWhatRunsInTheBackground)
{
    EXPECT_TRUE(runUntil([&] { return _watcher->callsOf(WATCHER_PATH, "RegisterStatusNotifierItem") == 1; }, 30));
    EXPECT_EQ("Passive", property("Status"));
    const struct {
        const char* data;
        const char* title;
    } cases[] = {{"bg_recording_start", "Recording"}, {"bg_recording_pause", "Recording paused"},
        {"bg_playing_start", "Playing"}, {"bg_playing_pause", "Playback paused"}};
    for (const auto& entry : cases) {
        tell(entry.data);
        EXPECT_TRUE(runUntil([&] { return property("Title") == entry.title; }, 20)) << entry.data;
        EXPECT_EQ("Active", property("Status"));
        EXPECT_NE("", property("IconName"));
    }
    tell("mewlo_none");
    EXPECT_TRUE(runUntil([&] { return property("Status") == "Passive"; }, 20));
}

TEST_F(IndicatorTest, HidesWhenTheRecorderIsGoneAndEndsWithTheSession)
{
    sd_bus* bus = host::sessionBus()->get();
    ASSERT_GE(sd_bus_request_name(bus, "com.tovanic.mewlo_lite", 0), 0);
    tell("bg_recording_start");
    ASSERT_TRUE(runUntil([&] { return property("Status") == "Active"; }, 20));
    ASSERT_GE(sd_bus_release_name(bus, "com.tovanic.mewlo_lite"), 0); // as after a crash
    EXPECT_TRUE(runUntil([&] { return property("Status") == "Passive"; }, 20));
    _bus.stop();
    EXPECT_TRUE(runUntil([&] { return !_indicator->isRunning(); }, 20));
}

TEST_F(CompanionTest, IndicatorWithoutABusEndsWithAnError)
{
    EXPECT_EQ(1, Program({TEST_BIN_DIR "/mewlo-indicator"}).wait());
}

}
