// The keyboard's media keys and the display's state on a virtual X server.
#include "host/DisplayWatch.h"
#include "host/Inhibitor.h"
#include "host/X11Keys.h"
#include "media_key.h"

#include "support/PrivateBus.h"
#include "support/RunUntil.h"
#include "support/XServer.h"

#include <gtest/gtest.h>

#include <Ecore_X.h>

#include <X11/Xlib.h>
#include <X11/extensions/scrnsaver.h>

namespace {

using support::Program;
using support::runUntil;

class X11Test : public testing::Test {
protected:
    void SetUp() override
    {
        if (!_server.isUp())
            GTEST_SKIP() << "Xvfb is missing";
        ASSERT_EQ(1, ecore_x_init(_server.name().c_str()));
    }
    void TearDown() override
    {
        if (ecore_x_display_get() != nullptr)
            ecore_x_shutdown();
    }
    static bool xdotool(const std::vector<std::string>& words)
    {
        std::vector<std::string> command = {"xdotool"};
        command.insert(command.end(), words.begin(), words.end());
        Program program(command);
        return runUntil([&] { return !program.isRunning(); }, 30);
    }

    support::XServer _server;
};

TEST_F(X11Test, MediaKeysArriveOnceWithoutFocusWhileReserved)
{
    std::string events;
    ASSERT_EQ(0,
        media_key_reserve(
            [](media_key_e key, media_key_event_e status, void* data) {
                *static_cast<std::string*>(data)
                    += std::to_string(key) + (status == MEDIA_KEY_STATUS_PRESSED ? "+" : "- ");
            },
            &events));
    ecore_x_sync();
    ASSERT_TRUE(xdotool({"key", "XF86AudioPlay"}));
    EXPECT_TRUE(runUntil([&] { return events == "7+7- "; })) << events;
    events.clear();
    ASSERT_TRUE(xdotool({"keydown", "XF86AudioNext", "sleep", "1.2", "keyup", "XF86AudioNext"})); // repeats meanwhile
    EXPECT_TRUE(runUntil([&] { return events == "4+4- "; })) << events;
    media_key_release();
    ecore_x_sync();
    events.clear();
    ASSERT_TRUE(xdotool({"key", "XF86AudioPlay"}));
    support::runFor(0.1);
    EXPECT_EQ("", events);
}

TEST_F(X11Test, ScreenSaverSwitchesTheDisplayStateUnlessInhibited)
{
    std::string state;
    host::DisplayWatch watch([&](const std::string&, const std::string& value) { state = value; });
    watch.start();
    auto* display = static_cast<Display*>(ecore_x_display_get());
    XForceScreenSaver(display, ScreenSaverActive);
    XFlush(display);
    EXPECT_TRUE(runUntil([&] { return state == "2"; })) << state;
    host::wakeDisplay();
    EXPECT_TRUE(runUntil([&] { return state == "0"; })) << state;

    XSetScreenSaver(display, 1, 0, DontPreferBlanking, DontAllowExposures); // after one second
    {
        const host::ScreenSaverInhibitor inhibitor;
        XFlush(display);
        support::runFor(1.6);
        EXPECT_EQ("0", state);
    }
    EXPECT_TRUE(runUntil([&] { return state == "2"; }, 10)) << state;
    watch.stop();
}

}
