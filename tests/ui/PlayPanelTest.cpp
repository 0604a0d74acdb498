#include <gtest/gtest.h>

#include <Elementary.h>

#include <media_content.h>

#include "MwBookmarkWidget.h"
#include "MwPlayRules.h"
#include "PanelScreen.h"
#include "fakes/Fakes.h"
#include "support/Recordings.h"
#include "support/Screen.h"

using Commands = std::vector<MwAppController::Command>;
using Events = std::vector<MwPlayViewController::eventType>;
using Panel = MwPlayViewController;
using State = MwPlayer::PlayState;

namespace {

constexpr int MINUTE = 60000;
constexpr auto FILE_NAME = "a.m4a";

// A panel over one loaded recording.
class PlayPanelTest : public ::testing::Test {
protected:
    void open(int duration, State state, unsigned int position = 0, Panel::ViewType type = Panel::QUIET)
    {
        _mediaId = _screen.addRecording(FILE_NAME, duration);
        _screen.load(FILE_NAME, state, position);
        _screen.dock(type);
        _screen.takeCommands();
    }
    Eina_Rectangle place(const char* part) const
    {
        Eina_Rectangle area;
        evas_object_geometry_get(_screen.content(part), &area.x, &area.y, &area.w, &area.h);
        return area;
    }
    Evas* canvas() const { return evas_object_evas_get(_screen.window); }
    void moveTo(int x, int y) { evas_event_feed_mouse_move(canvas(), x, y, support::nextTime(), nullptr); }
    void holdAt(int x, int y)
    {
        support::settle(_screen.window);
        evas_event_feed_mouse_in(canvas(), support::nextTime(), nullptr);
        moveTo(x, y);
        evas_event_feed_mouse_down(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        support::runFor(0.02);
    }
    void hold(const char* part)
    {
        const Eina_Rectangle area = place(part);
        holdAt(area.x + area.w / 2, area.y + area.h / 2);
    }
    void letGo()
    {
        evas_event_feed_mouse_up(canvas(), 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        support::runFor(0.02);
    }
    bool waitForSeeks(size_t count)
    {
        return support::runUntil([&] { return _screen.soughtTo.size() >= count; }, 3.0);
    }
    size_t markerCount() const
    {
        Eina_List* markers = evas_object_smart_members_get(_screen.content("bookmark_confine_rect"));
        const size_t count = eina_list_count(markers);
        eina_list_free(markers);
        return count;
    }
    std::string bookmarks() const
    {
        std::string all;
        for (const MwSavedBookmark& each : ui::PanelScreen::bookmarksOf(_mediaId))
            all += each.name + "@" + std::to_string(each.markedTime) + " ";
        return all;
    }

    ui::PanelScreen _screen;
    std::string _mediaId;
};

TEST(PlayRulesTest, PeriodsTextsAndPlaces)
{
    EXPECT_EQ(0.02, mwPlayRefreshPeriod(300000));
    EXPECT_EQ(0.2, mwPlayRefreshPeriod(300001));
    EXPECT_EQ("00:00", mwPlayPositionText(0, 3599999));
    EXPECT_EQ(0.0, mwPlayRatio(5000, 0));
    EXPECT_EQ(1.0, mwPlayRatio(5000, 4000)) << "a position behind the end";
    EXPECT_EQ(0U, mwSoughtPosition(2000, -3000, 10000));
    EXPECT_EQ(10000U, mwSoughtPosition(9000, 3000, 10000));
    const auto [x, y] = MwBookmarkWidget::place({100, 50, 200, 31}, 25, 5, 10000);
    EXPECT_EQ(188, x) << "the middle less half a marker";
    EXPECT_EQ(53, y);
}

TEST(PlayRulesTest, BookmarksGetTheNearestSecondAndTheSmallestFreeNumber)
{
    const std::tuple<unsigned int, unsigned int, unsigned int> seconds[]
        = {{10600, 20000, 11}, {10499, 20000, 10}, {19500, 20000, 20}, {19600, 20000, 19}, {0, 0, 0}};
    for (const auto& [position, duration, second] : seconds)
        EXPECT_EQ(second, mwBookmarkSecond(position, duration)) << position;
    EXPECT_EQ("B001", mwFreeBookmarkName("B", {}));
    EXPECT_EQ("B002", mwFreeBookmarkName("B", {"B001", "B003"}));
    EXPECT_EQ("B001", mwFreeBookmarkName("B", {"B1", "b001", "B002"}));
}

TEST_F(PlayPanelTest, TimesHaveOneShape)
{
    open(60 * MINUTE, State::PLAY_STATE_PAUSED);
    EXPECT_EQ("01:00:00", _screen.text("slider_text_total"));
    EXPECT_EQ("00:00:00", _screen.text("slider_text_playing"));
    _screen.addRecording("b.m4a", 400);
    _screen.load("b.m4a", State::PLAY_STATE_PAUSED, 400);
    EXPECT_EQ("00:01", _screen.text("slider_text_total"));
    EXPECT_EQ("00:00", _screen.text("slider_text_playing"));
    EXPECT_EQ(1.0, _screen.sliderValue());
}

TEST_F(PlayPanelTest, FollowsThePositionOnlyWhilePlayingInTheForeground)
{
    open(4 * MINUTE, State::PLAY_STATE_PLAYING);
    const auto shows = [this](unsigned int position, double limit = 3.0) {
        _screen.model.setCurrentPlayPosition(position);
        return support::runUntil([&] { return std::abs(_screen.sliderValue() * 4 * MINUTE - position) < 1000; }, limit);
    };
    EXPECT_TRUE(shows(60000));
    EXPECT_EQ("01:00", _screen.text("slider_text_playing"));
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::PAUSE);
    EXPECT_FALSE(shows(90000, 0.3));
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::RESUME);
    EXPECT_TRUE(shows(120000));
    _screen.load(FILE_NAME, State::PLAY_STATE_PAUSED, 120000);
    EXPECT_FALSE(shows(180000, 0.3));
    _screen.model.setCurrentPlayPath("");
    _screen.announce();
    EXPECT_EQ("02:00", _screen.text("slider_text_playing")) << "nothing is loaded: nothing is drawn";
}

TEST_F(PlayPanelTest, PlayButtonStartsPausesAndResumes)
{
    open(MINUTE, State::PLAY_STATE_NONE, 7000);
    _screen.press("play_pause_btn");
    EXPECT_EQ((Commands{MwAppController::START_PLAYING, MwAppController::SET_PLAYER_POSITION}), _screen.takeCommands());
    EXPECT_EQ(7000U, _screen.soughtTo.back()) << "what was chosen before";
    _screen.press("play_pause_btn");
    _screen.panel->togglePlay();
    EXPECT_EQ((Commands{MwAppController::PAUSE_PLAYING, MwAppController::RESUME_PLAYING}), _screen.takeCommands());
    _screen.load(FILE_NAME, State::PLAY_STATE_NONE, 7000);
    _screen.failing = MwAppController::START_PLAYING;
    _screen.press("play_pause_btn");
    EXPECT_EQ(Commands{MwAppController::START_PLAYING}, _screen.takeCommands());
}

TEST_F(PlayPanelTest, HeldNextSeeksFurtherAndFurther)
{
    open(MINUTE, State::PLAY_STATE_PAUSED);
    hold("ff_btn");
    const double start = ecore_time_get();
    ASSERT_TRUE(waitForSeeks(1));
    const double first = ecore_time_get() - start;
    EXPECT_GT(first, 0.2);
    EXPECT_LT(first, 0.8);
    ASSERT_TRUE(waitForSeeks(2));
    EXPECT_GT(ecore_time_get() - start - first, 0.4);
    letGo();
    EXPECT_EQ((std::vector<unsigned int>{3000, 9000}), _screen.soughtTo);
    EXPECT_NEAR(0.15, _screen.sliderValue(), 0.001);
    EXPECT_EQ("00:09", _screen.text("slider_text_playing"));
    hold("rew_btn");
    ASSERT_TRUE(waitForSeeks(4));
    letGo();
    EXPECT_EQ((std::vector<unsigned int>{3000, 9000, 6000, 0}), _screen.soughtTo) << "the step starts anew";
    support::runFor(0.6);
    EXPECT_EQ(Commands(4, MwAppController::SET_PLAYER_POSITION), _screen.takeCommands()) << "no file was changed";
}

TEST_F(PlayPanelTest, ShortPressesChangeTheFile)
{
    _screen.addRecording("b.m4a", MINUTE);
    open(MINUTE, State::PLAY_STATE_PLAYING, 5000, Panel::REPORTS_FILE_CHANGES);
    media_bookmark_insert_to_db(_mediaId.c_str(), 5, "here");
    _screen.press("ff_btn");
    EXPECT_EQ(Commands{MwAppController::PLAY_NEXT}, _screen.takeCommands());
    EXPECT_EQ(support::recordingPath("b.m4a"), _screen.model.getCurrentPlayPath());
    _screen.press("rew_btn");
    EXPECT_EQ(Commands{MwAppController::PLAY_PREVIOUS}, _screen.takeCommands());
    EXPECT_EQ((Events{Panel::FILE_CHANGED, Panel::FILE_CHANGED}), _screen.events);
    EXPECT_EQ(1U, markerCount()) << "those of the file that plays now";
    for (const auto& [part, command] :
        {std::pair("rew_btn", MwAppController::PLAY_PREVIOUS), std::pair("ff_btn", MwAppController::PLAY_NEXT)}) {
        _screen.failing = command;
        _screen.press(part);
        EXPECT_EQ(Commands{command}, _screen.takeCommands());
    }
    _screen.model.setCurrentPlayPath(support::recordingPath("gone.m4a"));
    _screen.press("rew_btn");
    EXPECT_EQ(Commands{}, _screen.takeCommands()) << "there is no previous one";
    EXPECT_EQ(2U, _screen.events.size());
}

TEST_F(PlayPanelTest, KeysChangeTheFileOnce)
{
    open(MINUTE, State::PLAY_STATE_PLAYING);
    elm_object_focus_set(_screen.content("ff_btn"), EINA_TRUE);
    support::key(_screen.window, "Return");
    support::runFor(0.2);
    EXPECT_EQ(Commands{MwAppController::PLAY_NEXT}, _screen.takeCommands());
    EXPECT_EQ(Events{}, _screen.events) << "only on request";
}

TEST_F(PlayPanelTest, LeavingAHeldButtonOrLosingThePanelEndsTheHold)
{
    open(MINUTE, State::PLAY_STATE_PAUSED);
    hold("ff_btn");
    moveTo(5, 5);
    support::runFor(0.4);
    letGo();
    EXPECT_EQ(Commands{}, _screen.takeCommands());
    hold("rew_btn");
    _screen.panel->destroy();
    support::runFor(0.4);
    letGo();
    EXPECT_EQ(Commands{}, _screen.takeCommands());
}

TEST_F(PlayPanelTest, SliderObeysTheFingerAlone)
{
    open(100000, State::PLAY_STATE_PLAYING, 50000);
    const Eina_Rectangle area = place("slider");
    const int middle = area.y + area.h / 2;
    holdAt(area.x + area.w / 2, middle);
    for (int i = 1; i <= 50; ++i) {
        moveTo(area.x + area.w / 2 + i, middle);
        _screen.model.setCurrentPlayPosition(50100); // the player plays on
        _screen.announce();
        support::runFor(0.005);
    }
    const double held = _screen.sliderValue();
    EXPECT_GT(held, 0.6) << "the knob stayed with the finger";
    EXPECT_EQ(Commands{}, _screen.takeCommands());
    letGo();
    ASSERT_EQ(Commands{MwAppController::SET_PLAYER_POSITION}, _screen.takeCommands());
    EXPECT_NEAR(held * 100000, _screen.soughtTo.back(), 500);
    EXPECT_NEAR(held, _screen.sliderValue(), 0.01);

    _screen.load(FILE_NAME, State::PLAY_STATE_PAUSED, 90000);
    support::settle(_screen.window);
    holdAt(area.x + area.w / 4, middle);
    letGo();
    EXPECT_EQ(Commands{MwAppController::SET_PLAYER_POSITION}, _screen.takeCommands()) << "a tap on the line";
    EXPECT_NEAR(23000, _screen.soughtTo.back(), 3000);
}

TEST_F(PlayPanelTest, KeysSeekWithinTheRecording)
{
    open(20000, State::PLAY_STATE_PAUSED, 12000);
    EXPECT_TRUE(_screen.panel->takeKey("Right"));
    _screen.panel->seekBy(5000);
    _screen.panel->seekBy(-30000);
    EXPECT_EQ((std::vector<unsigned int>{17000, 20000, 0}), _screen.soughtTo);
    EXPECT_EQ(0.0, _screen.sliderValue());
    elm_object_focus_set(_screen.content("slider"), EINA_TRUE);
    support::key(_screen.window, "Right");
    ASSERT_TRUE(waitForSeeks(4)) << "nobody lets go of a knob that a key moved";
    EXPECT_NEAR(5000, _screen.soughtTo.back(), 1);
    for (int i = 0; i < 50; ++i)
        support::key(_screen.window, i % 5 == 4 ? "Left" : "Right");
    support::runFor(0.05);
    EXPECT_NEAR(15000, _screen.soughtTo.back(), 1) << "a burst ends where its last key asked";
    _screen.load(FILE_NAME, State::PLAY_STATE_NONE, 12000);
    _screen.takeCommands();
    _screen.panel->seekBy(1000);
    EXPECT_EQ(Commands{}, _screen.takeCommands()) << "waits for the play button";
    EXPECT_EQ("00:13", _screen.text("slider_text_playing"));
    _screen.addRecording("b.m4a", 0);
    _screen.load("b.m4a", State::PLAY_STATE_PAUSED, 8000);
    _screen.panel->seekBy(5000);
    EXPECT_EQ(8000U, _screen.model.getCurrentPlayPosition()) << "nobody knows how long it is";
    EXPECT_TRUE(elm_object_disabled_get(_screen.content("slider")));
}

TEST_F(PlayPanelTest, BookmarksAreStoredAndMarked)
{
    open(20000, State::PLAY_STATE_PAUSED, 10600);
    EXPECT_EQ(nullptr, _screen.content("bookmark_confine_rect"));
    _screen.press("bookmark_btn");
    EXPECT_EQ("Bookmark001@11 ", bookmarks());
    EXPECT_EQ(1U, markerCount());
    EXPECT_EQ(Events{Panel::BOOKMARK_ADDED}, _screen.events);
    EXPECT_TRUE(fakes::calls.has("usage app_id=com.tovanic.mewlo-lite feature=BMRK"));
    _screen.press("bookmark_btn");
    EXPECT_EQ("There is a bookmark here already.", fakes::desktop.lastMessage);
    _screen.load(FILE_NAME, State::PLAY_STATE_PAUSED, 19600);
    _screen.press("bookmark_btn");
    EXPECT_EQ("Bookmark001@11 Bookmark002@19 ", bookmarks());
    _screen.model.destroyRecordedFileList();
    _screen.model.setCurrentPlayPosition(3000);
    _screen.press("bookmark_btn");
    EXPECT_EQ(2U, ui::PanelScreen::bookmarksOf(_mediaId).size()) << "a recording that is not listed gets none";
}

TEST_F(PlayPanelTest, FiftyBookmarksAreEnough)
{
    _mediaId = _screen.addRecording(FILE_NAME, MINUTE);
    for (unsigned int second = 1; second < 50; ++second)
        media_bookmark_insert_to_db(_mediaId.c_str(), second, "x");
    _screen.load(FILE_NAME, State::PLAY_STATE_PAUSED, 55000);
    _screen.dock();
    _screen.press("bookmark_btn");
    EXPECT_EQ(50U, markerCount());
    _screen.model.setCurrentPlayPosition(58000);
    _screen.press("bookmark_btn");
    EXPECT_EQ(50U, markerCount());
    EXPECT_EQ("No more than 50 bookmarks can be added.", fakes::desktop.lastMessage);
}

TEST_F(PlayPanelTest, TrimNeedsALongEnoughRecordingOfItsKind)
{
    const std::tuple<const char*, int, bool> files[]
        = {{"a.m4a", 1001, true}, {"b.m4a", 1000, false}, {"c.amr", 5000, true}, {"d.3ga", 5000, false}};
    _screen.addRecording(std::get<0>(files[0]), 1001);
    _screen.load("a.m4a", State::PLAY_STATE_PAUSED);
    _screen.dock();
    for (const auto& [file, duration, allowed] : files) {
        _screen.addRecording(file, duration);
        _screen.load(file, State::PLAY_STATE_PAUSED);
        ASSERT_NE(nullptr, _screen.content("trim_btn")) << file;
        EXPECT_EQ(allowed, !elm_object_disabled_get(_screen.content("trim_btn"))) << file;
    }
    _screen.press("trim_btn");
    EXPECT_FALSE(_screen.model.isTrimMode());
    _screen.load("a.m4a", State::PLAY_STATE_PLAYING);
    _screen.takeCommands();
    _screen.press("trim_btn");
    EXPECT_EQ(Commands{MwAppController::PAUSE_PLAYING}, _screen.takeCommands());
    EXPECT_TRUE(_screen.model.isTrimMode());
    EXPECT_EQ(Events{Panel::TRIM_REQUESTED}, _screen.events);
}

TEST_F(PlayPanelTest, NeitherMarksForAnotherApplicationNorTrimsOnEveryModel)
{
    ::setenv("MEWLO_MODEL", "QX-A110H", 1);
    _screen.model.setRequestMode(true);
    open(MINUTE, State::PLAY_STATE_PAUSED);
    EXPECT_EQ(nullptr, _screen.content("trim_btn"));
    EXPECT_EQ(nullptr, _screen.content("bookmark_btn"));
    EXPECT_NE(nullptr, _screen.content("play_pause_btn"));
    ::unsetenv("MEWLO_MODEL");
}

}
