// The control surfaces and what decides on them, on the real core with a controller of the tests' own.
#include <gtest/gtest.h>

#include <Elementary.h>

#include <panekit/WWindowController.h>
#include <preference.h>
#include <vconf.h>

#include "FakeApp.h"
#include "MwMiniControllerMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "ScreenWindow.h"
#include "fakes/Fakes.h"
#include "support/RunUntil.h"
#include "support/Screen.h"

using fakes::calls;
using fakes::controller;
using fakes::controlWindows;

namespace {

using App = MwAppController;
using Names = std::vector<std::string>;

constexpr auto RECORDS = REC_STATE_RECORDING;
constexpr auto RESTS = REC_STATE_PAUSED;
constexpr auto READY = REC_STATE_READY;
constexpr auto PLAYS = PLAY_STATE_PLAYING;
constexpr auto PLAY_RESTS = PLAY_STATE_PAUSED;
constexpr auto SILENT = PLAY_STATE_NONE;
constexpr int PANEL = MINICONTROL_VIEWER_PANEL;
constexpr int LOCK = MINICONTROL_VIEWER_LOCKSCREEN;

class Surfaces : public ui::ScreenWindow {
public:
    Surfaces()
        : ScreenWindow(360, 640)
    {
        lock(false);
        model.setRecorderState(READY);
        ui::launches.clear();
        calls.clear();
        manager = std::make_unique<MwMiniControllerMgr>(&model, ScreenWindow::controller(), &program);
    }
    ~Surfaces() override { manager.reset(); }
    void record(MwRecorderState state, unsigned long long elapsed = 5000)
    {
        model.setElapsedTime(elapsed);
        model.setRecorderState(state);
        ScreenWindow::controller()->getRecorderUpdatedSignal().emit();
    }
    void play(MwPlayerState state)
    {
        model.setCurrentPlayPath("/somewhere/Voice <1>.m4a");
        model.setPlayerState(state);
        ScreenWindow::controller()->getPlayerUpdatedSignal().emit();
    }
    void lock(bool locked)
    {
        vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, locked ? 1 : 0);
        announce(MwSignalMgr::LOCKSCREEN_CHANGED);
    }
    static void announce(MwSignalMgr::SystemInfo info) { MwSignalMgr::getInstance()->getSystemInfoSignal().emit(info); }
    static void announce(MwSignalMgr::LifeCycle change)
    {
        MwSignalMgr::getInstance()->getLifeCycleSignal().emit(change);
    }
    // On X11 the window goes to the background; elsewhere it loses the focus.
    void setAway(bool away)
    {
        model.setAppState(away ? MwModel::APP_STATE_PAUSED : MwModel::APP_STATE_RESUMED);
        announce(away ? MwSignalMgr::PAUSE : MwSignalMgr::RESUME);
    }
    static bool has(int viewer) { return controlWindows.contains(viewer); }
    static Evas_Object* layout(int viewer)
    {
        return evas_object_name_find(evas_object_evas_get(controlWindows.at(viewer).window),
            viewer == PANEL ? "mini_controller" : "mini_lockscreen");
    }
    static Evas_Object* button(int viewer, const std::string& part)
    {
        return elm_object_part_content_get(layout(viewer), part.c_str());
    }
    static std::string time(int viewer)
    {
        support::settle(controlWindows.at(viewer).window);
        return support::text(layout(viewer), viewer == PANEL ? "rec_info_time" : "mini_lockscreen_time_text");
    }
    static void press(int viewer, const std::string& part)
    {
        support::settle(controlWindows.at(viewer).window);
        support::click(button(viewer, part));
        support::runFor(0.02);
    }
    // The buttons that are there, of all that there may be.
    static Names buttons(int viewer)
    {
        const Names panel = {"mini_controller_pause_btn", "mini_controller_stop_btn", "mini_controller_play_prev_btn",
            "mini_controller_play_play_btn", "mini_controller_play_next_btn"};
        const Names lock = {"mini_lockscreen_pause_btn", "mini_lockscreen_record_btn", "mini_lockscreen_stop_btn",
            "mini_lockscreen_play_pre_btn", "mini_lockscreen_play_play_btn", "mini_lockscreen_play_pause_btn",
            "mini_lockscreen_play_next_btn"};
        Names found;
        for (const std::string& part : viewer == PANEL ? panel : lock)
            if (button(viewer, part))
                found.push_back(part.substr(viewer == PANEL ? 16 : 16));
        return found;
    }

    panekit::WWindowController program{"test", 1};
    std::unique_ptr<MwMiniControllerMgr> manager;

protected:
    bool execute(App::Command) override { return accepts; }

public:
    bool accepts = true;
};

TEST(MiniControllerTest, SurfacesComeAndGoWithWhatIsGoingOn)
{
    struct {
        const char* name;
        MwRecorderState recorder;
        MwPlayerState player;
        bool locked;
        bool panel;
        bool lockscreen;
    } const cases[] = {
        {"nothing", READY, SILENT, true, false, false},
        {"recording", RECORDS, SILENT, false, true, false},
        {"recording, locked", RECORDS, SILENT, true, true, true},
        {"paused, locked", RESTS, SILENT, true, true, false},
        {"playing", READY, PLAYS, false, true, false},
        {"playing, locked", READY, PLAYS, true, true, true},
        {"playback paused, locked", READY, PLAY_RESTS, true, false, false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        Surfaces surfaces;
        surfaces.lock(c.locked);
        if (c.player == SILENT)
            surfaces.record(c.recorder);
        else
            surfaces.play(c.player);
        EXPECT_EQ(c.panel, Surfaces::has(PANEL));
        EXPECT_EQ(c.lockscreen, Surfaces::has(LOCK));
        // The lock screen comes up during each, and goes.
        surfaces.lock(false);
        EXPECT_FALSE(Surfaces::has(LOCK));
        surfaces.lock(true);
        EXPECT_EQ(c.recorder != READY || c.player == PLAYS, Surfaces::has(LOCK));
        if (c.player == SILENT)
            surfaces.record(READY);
        else
            surfaces.play(SILENT);
        support::runFor(0.02);
        EXPECT_FALSE(Surfaces::has(PANEL) || Surfaces::has(LOCK));
    }
    Surfaces surfaces;
    surfaces.record(RECORDS);
    surfaces.record(RESTS);
    EXPECT_EQ(1U, calls.count("minicontrol_create_window")) << "one of a kind";
    Surfaces::announce(MwSignalMgr::TERMINATE);
    EXPECT_FALSE(Surfaces::has(PANEL));
}

TEST(MiniControllerTest, ButtonsFitTheStateAndBecomeCommands)
{
    struct {
        MwRecorderState recorder;
        MwPlayerState player;
        bool panelShown;
        Names panel;
        Names lockscreen;
    } const states[] = {
        {RECORDS, SILENT, false, {"pause_btn", "stop_btn"}, {"pause_btn", "stop_btn"}},
        {RESTS, SILENT, false, {"pause_btn", "stop_btn"}, {"record_btn", "stop_btn"}},
        {READY, PLAYS, false, {"play_prev_btn", "play_play_btn", "play_next_btn"},
            {"play_pre_btn", "play_pause_btn", "play_next_btn"}},
        {READY, PLAY_RESTS, false, {"play_prev_btn", "play_play_btn", "play_next_btn"},
            {"play_pre_btn", "play_play_btn", "play_next_btn"}},
        {READY, PLAYS, true, {"play_play_btn"}, {"play_pause_btn"}},
    };
    for (const auto& state : states) {
        Surfaces surfaces;
        surfaces.lock(true);
        surfaces.model.setPlayViewShown(state.panelShown);
        state.player == SILENT ? surfaces.record(RECORDS) : surfaces.play(PLAYS);
        state.player == SILENT ? surfaces.record(state.recorder) : surfaces.play(state.player);
        EXPECT_EQ(state.panel, Surfaces::buttons(PANEL));
        EXPECT_EQ(state.lockscreen, Surfaces::buttons(LOCK));
    }
    const struct {
        int viewer;
        MwRecorderState recorder;
        MwPlayerState player;
        const char* part;
        App::Command command;
    } presses[] = {
        {PANEL, RECORDS, SILENT, "mini_controller_pause_btn", App::PAUSE_RECORDING},
        {PANEL, RESTS, SILENT, "mini_controller_pause_btn", App::RESUME_RECORDING},
        {PANEL, RECORDS, SILENT, "mini_controller_stop_btn", App::STOP_RECORDING},
        {PANEL, READY, PLAYS, "mini_controller_play_play_btn", App::PAUSE_PLAYING},
        {PANEL, READY, PLAY_RESTS, "mini_controller_play_play_btn", App::RESUME_PLAYING},
        {PANEL, READY, PLAYS, "mini_controller_play_prev_btn", App::PLAY_PREVIOUS},
        {PANEL, READY, PLAYS, "mini_controller_play_next_btn", App::PLAY_NEXT},
        {LOCK, RECORDS, SILENT, "mini_lockscreen_pause_btn", App::PAUSE_RECORDING},
        {LOCK, RESTS, SILENT, "mini_lockscreen_record_btn", App::RESUME_RECORDING},
        {LOCK, RECORDS, SILENT, "mini_lockscreen_stop_btn", App::STOP_RECORDING},
        {LOCK, READY, PLAYS, "mini_lockscreen_play_pause_btn", App::PAUSE_PLAYING},
        {LOCK, READY, PLAY_RESTS, "mini_lockscreen_play_play_btn", App::RESUME_PLAYING},
        {LOCK, READY, PLAYS, "mini_lockscreen_play_pre_btn", App::PLAY_PREVIOUS},
        {LOCK, READY, PLAYS, "mini_lockscreen_play_next_btn", App::PLAY_NEXT},
    };
    for (const auto& each : presses) {
        SCOPED_TRACE(each.part);
        for (const bool accepted : {true, false}) {
            Surfaces surfaces;
            surfaces.accepts = accepted;
            surfaces.lock(true);
            each.player == SILENT ? surfaces.record(RECORDS) : surfaces.play(PLAYS);
            each.player == SILENT ? surfaces.record(each.recorder) : surfaces.play(each.player);
            Surfaces::press(each.viewer, each.part);
            controller.finish();
            EXPECT_EQ(std::vector{each.command}, controller.commands);
            EXPECT_TRUE(Surfaces::has(each.viewer)) << "a refused command leaves it as it is";
        }
    }
}

TEST(MiniControllerTest, AStopSavesFromASecondOnAndSaysSo)
{
    Surfaces surfaces;
    int saved = 0;
    MwSignalMgr::getInstance()->getSystemInfoSignal().addListener(
        [&](MwSignalMgr::SystemInfo info) { saved += info == MwSignalMgr::MINI_CONTROLLER_RECORDING_SAVED; });
    for (const auto& [elapsed, command] : {std::pair(999, App::CANCEL_RECORDING), {1000, App::STOP_RECORDING}}) {
        surfaces.record(RECORDS, static_cast<unsigned long long>(elapsed));
        controller.commands.clear();
        fakes::desktop.lastMessage.clear();
        Surfaces::press(PANEL, "mini_controller_stop_btn");
        controller.finish();
        EXPECT_EQ(std::vector{command}, controller.commands);
        EXPECT_EQ(elapsed < 1000, !fakes::desktop.lastMessage.empty());
    }
    EXPECT_EQ(1, saved);
    surfaces.accepts = false;
    Surfaces::press(PANEL, "mini_controller_stop_btn");
    controller.finish();
    EXPECT_EQ(1, saved);
}

TEST(MiniControllerTest, TimesAreWrittenAndTickOnlyWhenSeen)
{
    Surfaces surfaces;
    surfaces.lock(true);
    for (const auto& [seconds, text] :
        {std::pair(0, "00:00"), {3599, "59:59"}, {3600, "01:00:00"}, {36061, "10:01:01"}}) {
        surfaces.record(RECORDS, static_cast<unsigned long long>(seconds) * 1000);
        EXPECT_EQ(text, Surfaces::time(PANEL));
        EXPECT_EQ(text, Surfaces::time(LOCK));
    }
    const auto ticks = [&](unsigned long long elapsed, const std::string& text) {
        surfaces.model.setElapsedTime(elapsed);
        return support::runUntil([&] { return Surfaces::time(PANEL) == text && Surfaces::time(LOCK) == text; }, 0.7);
    };
    EXPECT_TRUE(ticks(7000, "00:07"));
    for (const int viewer : {PANEL, LOCK})
        fakes::setSeen(viewer, false);
    EXPECT_FALSE(ticks(9000, "00:09")) << "covered";
    for (const int viewer : {PANEL, LOCK})
        fakes::setSeen(viewer, true);
    EXPECT_EQ("00:09", Surfaces::time(PANEL)) << "at once";
    calls.failWith("device_display_get_state", -1);
    Surfaces::announce(MwSignalMgr::POWER_STATE_CHANGED);
    EXPECT_FALSE(ticks(11000, "00:11")) << "the display is off";
    calls.clear();
    Surfaces::announce(MwSignalMgr::POWER_STATE_CHANGED);
    EXPECT_TRUE(ticks(12000, "00:12"));
}

TEST(MiniControllerTest, ClosingARecordingAsksFirst)
{
    Surfaces surfaces;
    surfaces.record(RECORDS);
    Evas_Object* window = controlWindows.at(PANEL).window;
    const auto close = [] { controlWindows.at(PANEL).callback(MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE, nullptr); };
    close();
    EXPECT_TRUE(calls.has("app_control_set_app_id com.tovanic.mewlo-lite.popupapp"));
    EXPECT_FALSE(evas_object_visible_get(window));
    close();
    ASSERT_EQ(1U, ui::launches.size()) << "one question";
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_FAILED);
    EXPECT_TRUE(evas_object_visible_get(window)) << "it goes on";
    EXPECT_TRUE(controller.commands.empty());
    calls.failWith("app_control_send_launch_request", -1);
    close();
    EXPECT_TRUE(evas_object_visible_get(window)) << "nobody to ask";
    calls.clear();
    close();
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_SUCCEEDED);
    EXPECT_TRUE(support::runUntil([] { return calls.has("ui_app_exit"); }));
    EXPECT_EQ(std::vector{App::CANCEL_RECORDING}, controller.commands);
    close();
    surfaces.record(READY);
    EXPECT_TRUE(calls.has("app_control_send_terminate_request")) << "the question goes with what it is about";
    EXPECT_FALSE(Surfaces::has(PANEL));
}

TEST(MiniControllerTest, ClosingAPlaybackPausesItAndLeavesTheProgram)
{
    Surfaces surfaces;
    surfaces.play(PLAYS);
    Evas_Object* window = controlWindows.at(PANEL).window;
    Surfaces::press(PANEL, "close_button");
    EXPECT_EQ(std::vector{App::PAUSE_PLAYING}, controller.commands);
    EXPECT_FALSE(calls.has("ui_app_exit"));
    surfaces.play(PLAY_RESTS);
    EXPECT_FALSE(evas_object_visible_get(window));
    surfaces.play(PLAYS);
    EXPECT_TRUE(evas_object_visible_get(window)) << "there is something to see again";
    Surfaces::press(PANEL, "mini_controller_menu_btn");
    EXPECT_TRUE(calls.has("app_manager_resume_app"));
    surfaces.lock(true);
    controlWindows.at(LOCK).callback(MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE, nullptr);
    EXPECT_TRUE(support::runUntil([] { return !Surfaces::has(LOCK); })) << "from inside its own callback";
}

TEST(MiniControllerTest, APausedPlaybackWaitsForTheAlarmService)
{
    Surfaces surfaces;
    surfaces.play(PLAY_RESTS);
    EXPECT_TRUE(ui::launches.empty()) << "nothing is shown";
    surfaces.play(PLAYS);
    surfaces.play(PLAY_RESTS);
    ASSERT_EQ(1U, ui::launches.size());
    EXPECT_TRUE(calls.has("app_control_set_app_id com.tovanic.mewlo-alarmservice"));
    surfaces.play(PLAYS);
    ui::answer(ui::launches[0], APP_CONTROL_RESULT_SUCCEEDED);
    EXPECT_TRUE(Surfaces::has(PANEL)) << "it plays again";
    surfaces.play(PLAY_RESTS);
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_FAILED);
    EXPECT_TRUE(Surfaces::has(PANEL));
    Surfaces::announce(MwSignalMgr::PAUSE);
    Surfaces::announce(MwSignalMgr::RESUME);
    EXPECT_TRUE(calls.has("app_control_send_terminate_request"));
    Surfaces::announce(MwSignalMgr::PAUSE);
    const ui::Launch last = ui::launches.back();
    ui::answer(last, APP_CONTROL_RESULT_SUCCEEDED);
    EXPECT_FALSE(Surfaces::has(PANEL));
    surfaces.manager.reset();
    ui::answer(last, APP_CONTROL_RESULT_SUCCEEDED); // nobody waits any more
}

TEST(MiniControllerTest, ANotificationTakesThePlaceOfTheWindow)
{
    struct {
        const char* name;
        bool canBeWindow;
        bool isPreferred;
        bool isSupported;
        bool window;
        bool notification;
    } const cases[] = {
        {"as usual", true, false, true, true, false}, {"preferred", true, true, true, false, true},
        {"preferred, without actions", true, true, false, true, false}, {"no window", false, false, true, false, true},
        {"neither", false, false, false, false, true}, // refused by the service, until it comes
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        Surfaces surfaces;
        fakes::hasControlWindows = c.canBeWindow;
        fakes::setNotificationSupported(c.isSupported);
        preference_set_boolean(PREFERENCE_USE_NOTIFICATION_CONTROL, c.isPreferred);
        const auto isShown = [] { return !fakes::notification.text.empty(); };
        for (const MwRecorderState state : {RECORDS, RESTS}) {
            surfaces.setAway(false);
            surfaces.record(state);
            EXPECT_EQ(c.window, Surfaces::has(PANEL));
            EXPECT_FALSE(isShown()) << "the program is in front";
            surfaces.setAway(true);
            EXPECT_EQ(c.window, Surfaces::has(PANEL));
            EXPECT_EQ(c.notification, isShown());
        }
        fakes::setNotificationSupported(true);
        EXPECT_NE(Surfaces::has(PANEL), isShown()) << "never both";
        fakes::setNotificationSupported(false);
        EXPECT_EQ(c.canBeWindow, Surfaces::has(PANEL));
        fakes::setNotificationSupported(true);
        surfaces.record(READY);
        EXPECT_FALSE(isShown() || Surfaces::has(PANEL));
        surfaces.play(PLAYS);
        EXPECT_FALSE(isShown()) << "players have the media controls";
        EXPECT_EQ(c.canBeWindow && !c.isPreferred, Surfaces::has(PANEL));
        surfaces.play(SILENT);
        preference_set_boolean(PREFERENCE_USE_NOTIFICATION_CONTROL, false);
    }
    fakes::hasControlWindows = true;
}

TEST(MiniControllerTest, TheNotificationActsLikeTheWindow)
{
    struct {
        MwRecorderState state;
        const char* key;
        std::vector<App::Command> commands;
    } const presses[] = {
        {RECORDS, "pause", {App::PAUSE_RECORDING}},
        {RESTS, "resume", {App::RESUME_RECORDING}},
        {RECORDS, "stop", {App::STOP_RECORDING}},
        {RESTS, "stop", {App::STOP_RECORDING}},
        {RECORDS, NOTIFICATION_CONTROL_OPENED, {}},
        {RECORDS, "something else", {}},
    };
    fakes::hasControlWindows = false;
    for (const auto& each : presses) {
        SCOPED_TRACE(each.key);
        Surfaces surfaces;
        fakes::setNotificationSupported(true);
        surfaces.setAway(true);
        surfaces.model.setCurrentRecordingFileName("Voice <1>");
        surfaces.record(each.state, 3661000);
        EXPECT_EQ(each.state == RECORDS ? "Voice <1>|Recording|default|pause|stop|cancel"
                                        : "Voice <1>|Paused \u00b7 01:01:01|default|resume|stop|cancel",
            fakes::notification.text);
        fakes::notification.press(each.key);
        controller.finish();
        EXPECT_EQ(each.commands, controller.commands);
        EXPECT_EQ(std::string(each.key) == NOTIFICATION_CONTROL_OPENED, calls.has("app_manager_resume_app"));
    }
    Surfaces surfaces;
    fakes::setNotificationSupported(true);
    surfaces.setAway(true);
    surfaces.record(RECORDS);
    fakes::notification.press("cancel");
    fakes::notification.press("cancel");
    ASSERT_EQ(1U, ui::launches.size()) << "one question";
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_FAILED);
    EXPECT_TRUE(controller.commands.empty());
    fakes::notification.press("cancel");
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_SUCCEEDED);
    EXPECT_TRUE(support::runUntil([] { return calls.has("ui_app_exit"); }));
    EXPECT_EQ(std::vector{App::CANCEL_RECORDING}, controller.commands);
    surfaces.setAway(false);
    EXPECT_TRUE(fakes::notification.text.empty());
    fakes::hasControlWindows = true;
}

TEST(MiniControllerTest, WithoutAWindowNothingIsShownAndNothingBreaks)
{
    Surfaces surfaces;
    surfaces.lock(true);
    calls.failWith("minicontrol_create_window", -1);
    surfaces.record(RECORDS);
    surfaces.record(RESTS);
    surfaces.record(READY);
    EXPECT_FALSE(Surfaces::has(PANEL) || Surfaces::has(LOCK));
    MwMiniControllerMgr inert(nullptr, nullptr, nullptr);
}

}
