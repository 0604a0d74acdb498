#include <gtest/gtest.h>

#include <Elementary.h>

#include <filesystem>

#include <media_content.h>
#include <panekit/WPopupController.h>
#include <vconf.h>

#include "MwTrimBookmarkWidget.h"
#include "MwTrimRange.h"
#include "MwTrimWaveform.h"
#include "PanelScreen.h"
#include "fakes/Fakes.h"
#include "support/Recordings.h"
#include "support/Screen.h"

using Commands = std::vector<MwAppController::Command>;
using Events = std::vector<MwTrimViewController::eventType>;
using Press = MwTrimRange::Press;
using State = MwPlayer::PlayState;
using panekit::WPopupController;

namespace {

constexpr auto FILE_NAME = "Voice 001.m4a";

MwTrimRange rangeOf(unsigned int duration)
{
    MwTrimRange range(duration);
    range.setGeometry({686, 17, 5});
    return range;
}

TEST(TrimRangeTest, BarsKeepTheirDistanceAndTheirTimes)
{
    MwTrimRange range = rangeOf(10000);
    EXPECT_EQ(0, range.getStartX());
    EXPECT_EQ(703, range.getEndX());
    EXPECT_FALSE(range.isTrimmed());
    range.moveEnd(-2000);
    EXPECT_NEAR(17 + 68.6, range.getEndX(), 0.1) << "one second behind the start";
    EXPECT_EQ(1000U, range.getEnd());
    range.moveEnd(5000);
    EXPECT_EQ(10000U, range.getEnd());
    range.moveStart(343);
    EXPECT_EQ(5000U, range.getBegin());
    EXPECT_TRUE(range.isTrimmed());
    range.moveStart(5000);
    EXPECT_EQ(9000U, range.getBegin());
    range.moveStart(-5000);
    EXPECT_EQ(0U, range.getBegin());
    // In a long recording it is the bars that must not meet.
    MwTrimRange hour = rangeOf(3600000);
    hour.moveStart(5000);
    EXPECT_NEAR(703 - 5 - 17, hour.getStartX(), 0.1);
    for (const long long time : {-5LL, 400000000LL}) {
        hour.setBegin(time);
        hour.setEnd(time);
        EXPECT_LE(hour.getBegin() + 1000, hour.getEnd());
        EXPECT_LE(hour.getEnd(), 3600000U);
    }
}

TEST(TrimRangeTest, TheNearestBarIsTaken)
{
    MwTrimRange range = rangeOf(10000);
    range.moveStart(200);
    range.moveEnd(-200);
    const struct {
        double x;
        unsigned int position;
        Press press;
    } cases[] = {{208, 5000, Press::START_TRIM_BAR_PRESSED}, {140, 5000, Press::START_TRIM_BAR_PRESSED},
        {520, 5000, Press::END_TRIM_BAR_PRESSED}, {360, 5000, Press::PLAY_POSITION_BAR_PRESSED},
        {20, 5000, Press::NONE}, {690, 5000, Press::NONE}, {213, 3000, Press::START_TRIM_BAR_PRESSED}};
    for (const auto& each : cases)
        EXPECT_EQ(each.press, range.press(each.x, each.position)) << each.x;
    // Nine millimetres at 160 dots an inch and the base scale of 2.6 are 147 units.
    int taken = 0;
    for (int x = 0; x < 720; ++x)
        taken += range.press(x, 9000) == Press::START_TRIM_BAR_PRESSED ? 1 : 0;
    EXPECT_GE(taken, 147);
}

TEST(TrimRangeTest, ThePlayBarStaysBetween)
{
    MwTrimRange range = rangeOf(10000);
    range.setBegin(2000);
    range.setEnd(8000);
    EXPECT_EQ(range.getStartX() + 17, range.getPlayX(0));
    EXPECT_EQ(range.getEndX() - 5, range.getPlayX(10000));
    EXPECT_EQ(2000U, range.movePlay(5000, -1000));
    EXPECT_EQ(8000U, range.movePlay(5000, 1000));
    EXPECT_NEAR(6000, range.movePlay(5000, 68.6), 10);
    EXPECT_EQ(2000U, range.confine(-7));
}

TEST(TrimRangeTest, LongRecordingsCanBeCutFinely)
{
    const MwTrimRange hour = rangeOf(3600000);
    EXPECT_EQ(1, hour.stepOf(0, 500));
    EXPECT_LT(hour.stepOf(0, 5), 0.3);
    EXPECT_LT(hour.stepOf(300, 500), 0.2);
    EXPECT_GE(hour.stepOf(5000, 0), 0.001);
    EXPECT_EQ(1, rangeOf(10000).stepOf(300, 5));
}

TEST(TrimWaveformTest, NinetyBarsOfAnyNumberOfSamples)
{
    std::vector<uint32_t> samples(45);
    for (size_t i = 0; i < samples.size(); ++i)
        samples[i] = static_cast<uint32_t>(i);
    MwTrimWaveform::Bars bars = MwTrimWaveform::barsOf(samples.data(), samples.size());
    EXPECT_DOUBLE_EQ(1.0, bars[89]);
    EXPECT_DOUBLE_EQ(bars[88], bars[89]) << "each fills two";
    EXPECT_DOUBLE_EQ(1.0 / 44, bars[2]);
    samples.assign(900, 0);
    for (size_t i = 0; i < samples.size(); ++i)
        samples[i] = i < 10 ? 100 + static_cast<uint32_t>(i % 2) * 100 : 300;
    bars = MwTrimWaveform::barsOf(samples.data(), samples.size());
    EXPECT_DOUBLE_EQ(0.5, bars[0]);
    EXPECT_DOUBLE_EQ(1.0, bars[1]);
    EXPECT_EQ(MwTrimWaveform::Bars{}, MwTrimWaveform::barsOf(samples.data(), 0));
    EXPECT_EQ(MwTrimWaveform::Bars{}, MwTrimWaveform::barsOf(nullptr, 0));
    samples.assign(900, 0);
    EXPECT_EQ(MwTrimWaveform::Bars{}, MwTrimWaveform::barsOf(samples.data(), 900));
}

TEST(TrimBookmarkTest, MarksHangOverTheirSecond)
{
    const auto mark = MwTrimBookmarkWidget::place({17, 100, 686, 28}, {14, 17, 2, 168}, 5, 10000);
    EXPECT_EQ(17 + 343 - 7, mark.icon.x);
    EXPECT_EQ(100 + (28 + 17) / 2 - 17, mark.icon.y);
    EXPECT_EQ(17 + 343, mark.line.x);
    EXPECT_EQ(mark.icon.y + 17 + 2, mark.line.y);
    EXPECT_EQ(168, mark.line.h);
}

// The panel over a real recording of ten seconds.
class TrimPanelTest : public ::testing::Test {
protected:
    void open(State state = State::PLAY_STATE_NONE, unsigned int position = 0, const std::string& content = {})
    {
        _mediaId = _screen.addRecording(FILE_NAME, 10000, content.empty() ? ui::PanelScreen::sound() : content);
        media_bookmark_insert_to_db(_mediaId.c_str(), 1, "one");
        media_bookmark_insert_to_db(_mediaId.c_str(), 4, "four");
        _screen.load(FILE_NAME, state, position);
        _screen.dockTrim();
        support::settle(_screen.window);
        _screen.takeCommands();
    }
    [[nodiscard]] Evas* canvas() const { return evas_object_evas_get(_screen.window); }
    // By shares of the waveform.
    void drag(double from, double to, bool release = true)
    {
        int left = 0;
        int width = 0;
        int top = 0;
        Evas_Object* edje = elm_layout_edje_get(_screen.panelView);
        int x = 0;
        int y = 0;
        evas_object_geometry_get(edje, &x, &y, nullptr, nullptr);
        edje_object_part_geometry_get(edje, "waveform", &left, &top, &width, nullptr);
        const auto at = [&](double share) { return x + left + static_cast<int>(width * share); };
        evas_event_feed_mouse_in(canvas(), support::nextTime(), nullptr);
        evas_event_feed_mouse_move(canvas(), at(from), y + top + 20, support::nextTime(), nullptr);
        evas_event_feed_mouse_down(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        evas_event_feed_mouse_move(canvas(), at(to), y + top + 20, support::nextTime(), nullptr);
        if (release)
            evas_event_feed_mouse_up(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        support::runFor(0.02);
    }
    void key(const char* name, bool shift = false)
    {
        if (shift)
            evas_key_modifier_on(canvas(), "Shift");
        support::key(_screen.window, name);
        evas_key_modifier_off(canvas(), "Shift");
        support::runFor(0.02);
    }
    [[nodiscard]] const MwTrimRange& range() const { return _screen.trimPanel->getRange(); }
    [[nodiscard]] bool isSaveEnabled() const { return !elm_object_disabled_get(_screen.content("save_button")); }
    [[nodiscard]] Elm_Object_Item* choice(bool asNewFile)
    {
        _screen.press("save_button");
        EXPECT_NE(nullptr, WPopupController::topmost());
        Evas_Object* list = elm_object_content_get(WPopupController::topmost()->getEvasObject());
        return asNewFile ? elm_genlist_first_item_get(list) : elm_genlist_last_item_get(list);
    }
    bool waitForEvent()
    {
        return support::runUntil([this] { return !_screen.trimEvents.empty(); }, 10);
    }

    ui::PanelScreen _screen;
    std::string _mediaId;
};

TEST_F(TrimPanelTest, FingersMoveTheBars)
{
    open();
    EXPECT_EQ("00:00", _screen.text("time_text_begin"));
    EXPECT_EQ("00:10", _screen.text("time_text_end"));
    EXPECT_FALSE(isSaveEnabled());
    drag(-0.02, 0.18, false);
    EXPECT_EQ(0U, _screen.text("time_text_begin").find("00:0")) << "to a tenth while it is held";
    EXPECT_EQ(7U, _screen.text("time_text_begin").size());
    evas_event_feed_mouse_up(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
    EXPECT_EQ(5U, _screen.text("time_text_begin").size());
    EXPECT_NEAR(2000, range().getBegin(), 60);
    EXPECT_EQ(range().getBegin(), _screen.model.getCurrentPlayPosition()) << "it pushes the play bar";
    EXPECT_TRUE(_screen.soughtTo.empty()) << "nothing plays";
    drag(1.0, 0.5);
    EXPECT_NEAR(5000, range().getEnd(), 60);
    EXPECT_TRUE(isSaveEnabled());
    drag(0.8, 0.6);
    EXPECT_NEAR(5000, range().getEnd(), 60) << "far from every bar";
    drag(0.18, -1.0);
    drag(0.5, 2.0);
    EXPECT_FALSE(isSaveEnabled());
}

TEST_F(TrimPanelTest, KeysMoveTheFocusedBar)
{
    open(State::PLAY_STATE_PAUSED, 3000);
    key("Right");
    EXPECT_EQ(100U, range().getBegin());
    key("Right", true);
    EXPECT_EQ(1100U, range().getBegin());
    key("Left");
    EXPECT_EQ(1000U, range().getBegin());
    key("End");
    EXPECT_EQ(9000U, range().getBegin());
    EXPECT_EQ((std::vector<unsigned int>{9000}), _screen.soughtTo);
    key("Home");
    EXPECT_EQ(0U, range().getBegin());
    EXPECT_TRUE(_screen.takeCommands() == Commands{MwAppController::SET_PLAYER_POSITION});
    key("Tab");
    key("Left");
    EXPECT_EQ(9900U, range().getEnd());
    key("End");
    key("Tab");
    key("Left", true);
    EXPECT_EQ((std::vector<unsigned int>{9000, 8000}), _screen.soughtTo) << "the play bar";
    _screen.takeCommands();
    key("space");
    key("space");
    EXPECT_EQ((Commands{MwAppController::RESUME_PLAYING, MwAppController::PAUSE_PLAYING}), _screen.takeCommands());
    key("Return");
    EXPECT_EQ(nullptr, WPopupController::topmost()) << "nothing to save";
    key("Escape");
    EXPECT_EQ(Events{MwTrimViewController::TRIM_VIEW_EVENT_CLOSE}, _screen.trimEvents);
}

TEST_F(TrimPanelTest, PlaysWithinTheRange)
{
    open(State::PLAY_STATE_NONE, 500);
    drag(-0.02, 0.18);
    drag(1.0, 0.5);
    _screen.press("play_button");
    EXPECT_EQ((Commands{MwAppController::START_PLAYING, MwAppController::SET_PLAYER_POSITION}), _screen.takeCommands());
    EXPECT_EQ(range().getBegin(), _screen.soughtTo.back());
    _screen.model.setCurrentPlayPosition(range().getEnd() + 1);
    EXPECT_TRUE(support::runUntil([&] { return _screen.model.getPlayerState() == State::PLAY_STATE_PAUSED; }));
    EXPECT_EQ(range().getBegin(), _screen.model.getCurrentPlayPosition());
    _screen.takeCommands();
    _screen.press("play_button");
    EXPECT_EQ(Commands{MwAppController::RESUME_PLAYING}, _screen.takeCommands());
    _screen.model.setCurrentPlayPosition(0);
    EXPECT_TRUE(support::runUntil([&] { return _screen.soughtTo.back() == range().getBegin(); }));
    // A held play bar is left alone, and sought to when it is let go.
    _screen.soughtTo.clear();
    _screen.model.setCurrentPlayPosition(3000);
    _screen.announce();
    drag(0.3 + 0.02, 0.4, false);
    EXPECT_TRUE(_screen.soughtTo.empty());
    evas_event_feed_mouse_up(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
    ASSERT_EQ(1U, _screen.soughtTo.size());
    EXPECT_NEAR(4000, _screen.soughtTo[0], 400);
}

TEST_F(TrimPanelTest, ShowsTheWaveformOfWhatItCanRead)
{
    open();
    const MwTrimWaveform* waveform = _screen.trimPanel->getWaveform();
    ASSERT_TRUE(support::runUntil([&] { return waveform->isComplete(); }, 5));
    support::runFor(0.3);
    EXPECT_GT(waveform->getBars()[80], 0.7);
    EXPECT_NEAR(0.5, waveform->getBars()[45], 0.15);
    EXPECT_LT(waveform->getBars()[3], 0.2);
}

TEST_F(TrimPanelTest, WithoutAWaveformTheBarsStillWork)
{
    open(State::PLAY_STATE_NONE, 0, "no sound");
    ASSERT_TRUE(support::runUntil([&] { return _screen.trimPanel->getWaveform()->isComplete(); }, 5));
    EXPECT_EQ(MwTrimWaveform::Bars{}, _screen.trimPanel->getWaveform()->getBars());
    drag(-0.02, 0.18);
    EXPECT_NEAR(2000, range().getBegin(), 60);
    elm_genlist_item_selected_set(choice(true), EINA_TRUE);
    ASSERT_TRUE(waitForEvent());
    EXPECT_EQ(Events{MwTrimViewController::TRIM_VIEW_EVENT_CLOSE}, _screen.trimEvents);
    EXPECT_EQ("This recording cannot be trimmed.", fakes::desktop.lastMessage);
}

TEST_F(TrimPanelTest, AsksBeforeChangesAreDiscarded)
{
    open(State::PLAY_STATE_PLAYING, 4000);
    drag(-0.02, 0.18);
    _screen.press("cancel_button");
    WPopupController* popup = WPopupController::topmost();
    ASSERT_NE(nullptr, popup);
    popup->press(0);
    EXPECT_TRUE(_screen.trimEvents.empty());
    _screen.press("cancel_button");
    ASSERT_NE(nullptr, WPopupController::topmost());
    _screen.takeCommands();
    WPopupController::topmost()->press(1);
    EXPECT_EQ(Events{MwTrimViewController::TRIM_VIEW_EVENT_CLOSE}, _screen.trimEvents);
    EXPECT_EQ(Commands{MwAppController::PAUSE_PLAYING}, _screen.takeCommands());
}

TEST_F(TrimPanelTest, SavesAsNewFileAndOverTheOriginal)
{
    for (const bool asNewFile : {true, false}) {
        SCOPED_TRACE(asNewFile);
        _screen.trimEvents.clear();
        const size_t size = ui::PanelScreen::sound().size();
        open(State::PLAY_STATE_PAUSED, 3000);
        drag(-0.02, 0.18);
        key("Return");
        ASSERT_NE(nullptr, WPopupController::topmost());
        key("Down");
        if (!asNewFile)
            key("Down");
        key("Return");
        ASSERT_EQ(Commands{MwAppController::STOP_PLAYING}, Commands{_screen.takeCommands().back()});
        ASSERT_NE(nullptr, WPopupController::topmost()) << "it says that it works";
        ASSERT_TRUE(waitForEvent());
        EXPECT_EQ(Events{MwTrimViewController::TRIM_VIEW_EVENT_SAVED}, _screen.trimEvents);
        EXPECT_EQ(nullptr, WPopupController::topmost());
        const std::string written = support::recordingPath(asNewFile ? "Voice 001_001.m4a" : FILE_NAME);
        ASSERT_TRUE(std::filesystem::exists(written));
        EXPECT_NEAR(static_cast<double>(size) * 0.8, static_cast<double>(std::filesystem::file_size(written)),
            static_cast<double>(size) * 0.25);
        _screen.trimPanel->destroy();
        std::filesystem::remove(written);
        media_content_scan_all();
    }
}

TEST_F(TrimPanelTest, BackEndsASaveBeforeItStartsAndFullStorageStartsNone)
{
    open();
    drag(-0.02, 0.18);
    elm_genlist_item_selected_set(choice(true), EINA_TRUE);
    _screen.press("save_button");
    ASSERT_NE(nullptr, WPopupController::topmost());
    EXPECT_EQ(0U, _screen.trimEvents.size());
    support::key(_screen.window, "XF86Back");
    support::runFor(0.05);
    ASSERT_TRUE(waitForEvent());
    EXPECT_EQ(Events{MwTrimViewController::TRIM_VIEW_EVENT_CLOSE}, _screen.trimEvents);
    EXPECT_FALSE(std::filesystem::exists(support::recordingPath("Voice 001_001.m4a")));
}

}
