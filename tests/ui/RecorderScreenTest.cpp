#include <gtest/gtest.h>

#include <Elementary.h>

#include <panekit/WMenuPopupController.h>
#include <panekit/WPopupController.h>
#include <uxt_theme.h>
#include <vconf.h>

#include "MwRecorderContentViewController.h"
#include "MwRecordingTime.h"
#include "MwRecordingsContentViewController.h"
#include "MwSignalMgr.h"
#include "MwSystemMgr.h"
#include "RecorderScreen.h"
#include "UiEnvironment.h"
#include "fakes/Fakes.h"
#include "support/Screen.h"

using panekit::WPopupController;
using Commands = std::vector<MwAppController::Command>;

namespace {

const std::vector<const char*> BUTTONS
    = {"record_button", "stop_button", "bookmark_button", "recordings_button", "pause_button", "resume_button"};

void emit(MwSignalMgr::SystemInfo info) { MwSignalMgr::getInstance()->getSystemInfoSignal().emit(info); }
void emit(MwSignalMgr::LifeCycle lifeCycle) { MwSignalMgr::getInstance()->getLifeCycleSignal().emit(lifeCycle); }

std::string shownButtons(const ui::RecorderScreen& screen)
{
    std::string shown;
    for (const char* part : BUTTONS) {
        if (screen.button(part))
            shown += std::string(shown.empty() ? "" : " ") + part;
    }
    return shown;
}

bool hasRing(const ui::RecorderScreen& screen) { return screen.button("recording_effect") != nullptr; }

void pressPopupButton(size_t position)
{
    if (WPopupController* popup = WPopupController::topmost(); popup)
        popup->press(position);
}

TEST(RecorderThemeTest, TextsOnTheScreenFollowTheThemeAtOnce)
{
    ui::RecorderScreen screen;
    screen.model.setRenameString("Interview");
    screen.enter(REC_STATE_READY);
    const auto redOf = [&](const char* part) {
        int red = 0;
        support::settle(screen.window);
        evas_object_color_get(
            edje_object_part_object_get(elm_layout_edje_get(screen.view), part), &red, nullptr, nullptr, nullptr);
        return red;
    };
    for (const bool dark : {false, true, false}) {
        SCOPED_TRACE(dark);
        ui::useTheme(dark);
        for (const auto& [part, code] : {std::pair("file_name_text", "mewlo/text"),
                 std::pair("subtitle_text", "mewlo/text/dim"), std::pair("recording_time", "mewlo/text")}) {
            int red = 0;
            uxt_theme_get_color(code, &red, nullptr, nullptr, nullptr);
            EXPECT_EQ(red, redOf(part)) << part;
        }
    }
}

TEST(RecordingTimeTest, CountsDownToNoughtAndEstimatesByFormat)
{
    EXPECT_EQ("99:59:59", mwRecordingTimeText(359999));
    EXPECT_EQ(58U, mwShownSeconds(5999, 63));
    EXPECT_EQ(0U, mwShownSeconds(70000, 63)); // past its limit
    EXPECT_EQ(2, mwEstimatedSeconds(100, MwModel::FORMAT_MP4));
    EXPECT_FALSE(mwEstimatedSeconds(100, 7));
}

TEST(RecorderScreenTest, EachStateShowsItsButtons)
{
    const struct {
        bool requestMode;
        MwRecorder::RecordingState state;
        const char* buttons;
        bool ring;
    } cases[] = {
        {false, REC_STATE_NONE, "record_button recordings_button", false},
        {false, REC_STATE_READY, "record_button recordings_button", false},
        {false, REC_STATE_RECORDING, "stop_button bookmark_button pause_button", true},
        {false, REC_STATE_PAUSED, "stop_button bookmark_button resume_button", false},
        {true, REC_STATE_READY, "record_button recordings_button", false},
        {true, REC_STATE_RECORDING, "stop_button pause_button", true},
        {true, REC_STATE_PAUSED, "stop_button resume_button", false},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(mwNumber(each.state));
        ui::RecorderScreen screen(each.requestMode);
        screen.enter(each.state);
        EXPECT_EQ(each.buttons, shownButtons(screen));
        EXPECT_EQ(each.ring, hasRing(screen));
    }
    ui::RecorderScreen screen;
    screen.enter(static_cast<MwRecorder::RecordingState>(9));
    EXPECT_EQ("", shownButtons(screen));
    EXPECT_TRUE(fakes::log.has("Invalid recorder state!"));
}

TEST(RecorderScreenTest, ShowsNameTimeAndFormat)
{
    ui::RecorderScreen screen(false, MwModel::NO_SIZE_LIMIT, MwModel::FORMAT_AMR);
    EXPECT_EQ("00:00", screen.text("recording_time"));
    EXPECT_EQ("", screen.text("file_name_text"));
    EXPECT_EQ("Recording for a message", screen.text("subtitle_text"));
    screen.model.setRenameString("A & B");
    screen.model.setFileFormat(MwModel::FORMAT_MP4);
    screen.enter(REC_STATE_READY);
    EXPECT_EQ("A &amp; B", screen.text("file_name_text"));
    EXPECT_EQ("", screen.text("subtitle_text"));
    screen.enter(REC_STATE_RECORDING);
    EXPECT_EQ("Voice 001", screen.text("file_name_text"));
    screen.model.setElapsedTime(3599999);
    ASSERT_TRUE(support::runUntil([&] { return screen.text("recording_time") == "59:59"; }));
    screen.model.setElapsedTime(3600000);
    ASSERT_TRUE(support::runUntil([&] { return screen.text("recording_time") == "01:00:00"; }));
    screen.enter(REC_STATE_READY);
    EXPECT_EQ("00:00", screen.text("recording_time"));
    EXPECT_EQ(0U, screen.model.getElapsedTime());
}

TEST(RecorderScreenTest, CountsDownForARequestWithALimit)
{
    ui::RecorderScreen screen(true, 100, MwModel::FORMAT_AMR);
    EXPECT_EQ(63, screen.model.getEstimatedRecordingMaxTime());
    EXPECT_EQ("01:03", screen.text("recording_time"));
    screen.enter(REC_STATE_RECORDING);
    screen.model.setElapsedTime(3000);
    ASSERT_TRUE(support::runUntil([&] { return screen.text("recording_time") == "01:00"; }));
    screen.more();
    support::runFor(0.02);
    EXPECT_FALSE(screen.naviframe->getTop()->hasAttachedPopup());
    ui::RecorderScreen unlimited(true);
    EXPECT_EQ(0, unlimited.model.getEstimatedRecordingMaxTime());
}

TEST(RecorderScreenTest, BlinksWhilePausedAndIsSteadyAfterwards)
{
    ui::RecorderScreen screen;
    screen.model.setElapsedTime(5000);
    screen.enter(REC_STATE_PAUSED);
    const auto state = [&] { return support::partState(screen.view, "recording_time_clip_rect"); };
    EXPECT_EQ("default", state());
    ASSERT_TRUE(support::runUntil([&] { return state() == "hidden"; }));
    ASSERT_TRUE(support::runUntil([&] { return state() == "default"; }));
    ASSERT_TRUE(support::runUntil([&] { return state() == "hidden"; }));
    screen.enter(REC_STATE_RECORDING);
    EXPECT_EQ("default", state());
    support::runFor(1.1);
    EXPECT_EQ("default", state());
}

TEST(RecorderScreenTest, ASecondTapOnRecordOrStopDoesNothing)
{
    ui::RecorderScreen screen;
    screen.press("record_button");
    screen.press("record_button");
    EXPECT_EQ(1U, fakes::controller.pending.size());
    fakes::controller.finish();
    EXPECT_EQ("stop_button bookmark_button pause_button", shownButtons(screen));
    screen.model.setElapsedTime(1000);
    screen.press("stop_button");
    screen.press("stop_button");
    EXPECT_EQ(1U, fakes::controller.pending.size());
    fakes::controller.finish();
    EXPECT_EQ(
        (Commands{MwAppController::START_RECORDING, MwAppController::STOP_RECORDING}), fakes::controller.commands);
    EXPECT_EQ(1, fakes::controller.recordingsOpened);
}

TEST(RecorderScreenTest, SpaceRecordsAfterAnotherScreenWasLeft)
{
    ui::RecorderScreen screen;
    screen.naviframe->push(new MwRecordingsContentViewController(&screen.model, screen.controller()));
    support::settle(screen.window);
    screen.back();
    support::settle(screen.window);
    ASSERT_EQ(screen.button("record_button"), elm_object_focused_object_get(screen.window));
    support::key(screen.window, "space");
    EXPECT_EQ(1U, fakes::controller.pending.size());
}

TEST(RecorderScreenTest, AFailedOrRefusedStartLeavesAButtonThatWorks)
{
    ui::RecorderScreen screen;
    fakes::controller.acceptAsync = false;
    screen.press("record_button");
    EXPECT_TRUE(fakes::log.has("Record start failed!"));
    fakes::controller.acceptAsync = true;
    fakes::controller.onCommand = [](MwAppController::Command) { return false; };
    screen.press("record_button");
    fakes::controller.finish();
    EXPECT_TRUE(fakes::log.has("START_RECORDING failed"));
    screen.press("record_button");
    EXPECT_EQ(1U, fakes::controller.pending.size());
}

TEST(RecorderScreenTest, RefusesDuringCallsAndWithoutSpace)
{
    ui::RecorderScreen screen;
    fakes::desktop.liveCalls = 1;
    screen.press("record_button");
    EXPECT_EQ("Recording is not possible during calls.", fakes::desktop.lastMessage);
    fakes::desktop.liveCalls = 0;
    ::setenv("MEWLO_FREE_BYTES_DEVICE", "1000", 1);
    screen.press("record_button");
    ::unsetenv("MEWLO_FREE_BYTES_DEVICE");
    EXPECT_TRUE(fakes::controller.pending.empty());
    ASSERT_NE(nullptr, WPopupController::topmost());
    EXPECT_EQ("Not enough space", support::text(WPopupController::topmost()->getEvasObject(), "title,text"));
    pressPopupButton(1);
    EXPECT_EQ(nullptr, WPopupController::topmost());
    EXPECT_TRUE(fakes::calls.has("app_control_set_app_id com.tovanic.setting.storage"));
    EXPECT_TRUE(fakes::calls.has("app_control_add_extra_data viewtype=storage_detail"));
    EXPECT_TRUE(fakes::calls.has("app_control_set_launch_mode 1"));
    EXPECT_EQ(1U, fakes::calls.count("app_control_send_launch_request"));
    EXPECT_EQ(1U, fakes::calls.count("app_control_destroy"));
}

TEST(RecorderScreenTest, TooShortIsCancelledAtTheLastMillisecond)
{
    const struct {
        unsigned long long elapsed;
        MwAppController::Command command;
    } cases[] = {{999, MwAppController::CANCEL_RECORDING}, {1000, MwAppController::STOP_RECORDING}};
    for (const auto& each : cases) {
        SCOPED_TRACE(each.elapsed);
        ui::RecorderScreen screen;
        screen.enter(REC_STATE_PAUSED);
        screen.model.setElapsedTime(each.elapsed);
        screen.press("stop_button");
        fakes::controller.finish();
        EXPECT_EQ(Commands{each.command}, fakes::controller.commands);
        EXPECT_EQ(each.elapsed < 1000 ? 0 : 1, fakes::controller.recordingsOpened);
        EXPECT_EQ(each.elapsed < 1000, fakes::calls.has("post Too short"));
    }
}

TEST(RecorderScreenTest, AFailedStopSaysSoAndEnds)
{
    for (const unsigned long long elapsed : {500ULL, 5000ULL}) {
        ui::RecorderScreen screen;
        screen.enter(REC_STATE_RECORDING);
        screen.model.setElapsedTime(elapsed);
        fakes::controller.onCommand = [](MwAppController::Command) { return false; };
        screen.press("stop_button");
        fakes::controller.finish();
        ASSERT_NE(nullptr, WPopupController::topmost());
        EXPECT_EQ("The recording failed.", support::text(WPopupController::topmost()->getEvasObject()));
        EXPECT_EQ(0, fakes::controller.recordingsOpened);
        pressPopupButton(0);
        EXPECT_EQ(1U, fakes::calls.count("ui_app_exit"));
    }
}

TEST(RecorderScreenTest, AResultAfterTheScreenHasGoneIsDropped)
{
    {
        ui::RecorderScreen screen;
        screen.press("record_button");
        ASSERT_EQ(1U, fakes::controller.pending.size());
        fakes::controller.onCommand = [](MwAppController::Command) { return false; };
    }
    fakes::log.clear();
    fakes::controller.finish();
    EXPECT_FALSE(fakes::log.has("async Command"));
}

TEST(RecorderScreenTest, PauseAndResumeRedrawAlsoAfterAFailure)
{
    ui::RecorderScreen screen;
    screen.enter(REC_STATE_RECORDING);
    screen.press("pause_button");
    EXPECT_NE(nullptr, screen.button("resume_button"));
    screen.press("resume_button");
    EXPECT_NE(nullptr, screen.button("pause_button"));
    EXPECT_EQ(
        (Commands{MwAppController::PAUSE_RECORDING, MwAppController::RESUME_RECORDING}), fakes::controller.commands);
    fakes::controller.onCommand = [](MwAppController::Command) { return false; };
    screen.press("pause_button");
    EXPECT_TRUE(fakes::log.has("Record pause failed!"));
    EXPECT_NE(nullptr, screen.button("pause_button"));
}

TEST(RecorderScreenTest, BookmarksAreTakenOncePerSecondAndShown)
{
    ui::RecorderScreen screen;
    screen.enter(REC_STATE_RECORDING);
    screen.model.setElapsedTime(65000);
    screen.press("bookmark_button");
    EXPECT_EQ("01:05", screen.text("bookmark_time"));
    screen.model.setElapsedTime(66000);
    screen.press("bookmark_button");
    EXPECT_EQ(1U, screen.model.getBookmarkList().size());
    EXPECT_TRUE(fakes::log.has("_addBookMarkEnabled is false, ignore!!"));
    support::runFor(1.1);
    screen.press("bookmark_button");
    ASSERT_EQ(2U, screen.model.getBookmarkList().size());
    EXPECT_EQ(66U, screen.model.getBookmarkList()[1].markedTime);
    EXPECT_EQ(2U, fakes::calls.count("usage app_id=com.tovanic.mewlo-lite feature=BMRK"));
}

TEST(RecorderScreenTest, TheMenuFollowsStateCallRejectionAndCard)
{
    const auto labels = [](ui::RecorderScreen& screen) {
        screen.more();
        support::settle(screen.window);
        std::vector<std::string> texts;
        for (Evas_Object* button : support::menuButtons(screen.window))
            texts.push_back(support::text(button));
        return texts;
    };
    using Texts = std::vector<std::string>;
    {
        ui::RecorderScreen screen;
        EXPECT_EQ(Texts{"Rename"}, labels(screen));
    }
    {
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
        ui::RecorderScreen screen;
        EXPECT_EQ((Texts{"Rename", "Save to"}), labels(screen));
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
    }
    ui::RecorderScreen screen;
    screen.enter(REC_STATE_RECORDING);
    EXPECT_EQ(Texts{"Reject calls"}, labels(screen));
    support::runFor(0.3);
    support::key(screen.window, "Return");
    support::runFor(0.02);
    EXPECT_TRUE(MwSystemMgr::getInstance()->getRejectCall());
    EXPECT_EQ("on", support::partState(screen.view, "call_rejection"));
    EXPECT_EQ("Calls are rejected while recording.", fakes::desktop.lastMessage);
    EXPECT_EQ(Texts{"Stop rejecting calls"}, labels(screen));
    screen.enter(REC_STATE_READY);
    EXPECT_FALSE(MwSystemMgr::getInstance()->getRejectCall());
    EXPECT_EQ("default", support::partState(screen.view, "call_rejection"));
}

TEST(RecorderScreenTest, BackAsksBeforeDiscarding)
{
    ui::RecorderScreen screen;
    screen.enter(REC_STATE_RECORDING);
    unsigned int marked = 0;
    screen.model.setElapsedTime(5000);
    ASSERT_TRUE(screen.model.addBookMark(marked));
    screen.back();
    ASSERT_NE(nullptr, WPopupController::topmost());
    screen.back(); // closes the question
    EXPECT_EQ(nullptr, WPopupController::topmost());
    screen.press("discard_button");
    pressPopupButton(0);
    EXPECT_EQ(nullptr, WPopupController::topmost());
    EXPECT_TRUE(fakes::controller.commands.empty());
    screen.back();
    pressPopupButton(1);
    EXPECT_EQ(Commands{MwAppController::CANCEL_RECORDING}, fakes::controller.commands);
    EXPECT_EQ(nullptr, WPopupController::topmost());
    EXPECT_TRUE(screen.model.getBookmarkList().empty());
    EXPECT_EQ("record_button recordings_button", shownButtons(screen));
    EXPECT_EQ("Recording discarded.", fakes::desktop.lastMessage);

    screen.enter(REC_STATE_PAUSED);
    screen.back();
    screen.enter(REC_STATE_READY); // ended elsewhere: nothing left to discard
    EXPECT_EQ(nullptr, WPopupController::topmost());
}

TEST(RecorderScreenTest, KeysOfTheBigButton)
{
    ui::RecorderScreen screen;
    support::key(screen.window, "space");
    ASSERT_EQ(1U, fakes::controller.pending.size());
    fakes::controller.finish();
    support::settle(screen.window);
    screen.model.setElapsedTime(5000);
    support::key(screen.window, "b");
    EXPECT_EQ(1U, screen.model.getBookmarkList().size());
    support::key(screen.window, "space");
    EXPECT_EQ(REC_STATE_PAUSED, screen.model.getRecorderState());
    support::key(screen.window, "space");
    EXPECT_EQ(REC_STATE_RECORDING, screen.model.getRecorderState());
    screen.model.setElapsedTime(6000);
    support::settle(screen.window);
    support::key(screen.window, "Return");
    support::runFor(0.02);
    fakes::controller.finish();
    EXPECT_EQ(MwAppController::STOP_RECORDING, fakes::controller.commands.back());
}

TEST(RecorderScreenTest, SaveToChoosesTheStorage)
{
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    ui::RecorderScreen screen;
    const auto open = [&] {
        screen.more();
        support::runFor(0.3);
        support::key(screen.window, "Tab");
        support::key(screen.window, "Return");
        support::runFor(0.3);
        return WPopupController::topmost();
    };
    WPopupController* popup = open();
    ASSERT_NE(nullptr, popup);
    Evas_Object* list = elm_object_content_get(popup->getEvasObject());
    ASSERT_EQ(2U, elm_genlist_items_count(list));
    Elm_Object_Item* card = elm_genlist_last_item_get(list);
    EXPECT_STREQ("Memory card", elm_object_item_part_text_get(card, "elm.text.main.left"));
    screen.more(); // one at a time
    elm_genlist_item_selected_set(card, EINA_TRUE);
    EXPECT_EQ(MW_STORAGE_CARD, screen.model.getStorageType());
    EXPECT_EQ(nullptr, WPopupController::topmost());
    ASSERT_NE(nullptr, open());
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
    emit(MwSignalMgr::MMC_REMOVED);
    EXPECT_EQ(nullptr, WPopupController::topmost());
    screen.model.setStorageType(MW_STORAGE_DEVICE);
}

TEST(RecorderScreenTest, APulledCardSavesWhatItCanAndNothingElseIsSentMeanwhile)
{
    for (const auto state : {REC_STATE_RECORDING, REC_STATE_PAUSED}) {
        ui::RecorderScreen screen;
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
        screen.model.setStorageType(MW_STORAGE_CARD);
        screen.model.holdStorage();
        screen.enter(state);
        screen.model.setElapsedTime(5000);
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
        emit(MwSignalMgr::MMC_REMOVED);
        fakes::controller.commands.clear();
        for (const char* part : {"pause_button", "resume_button", "stop_button", "discard_button"})
            if (screen.button(part) != nullptr)
                screen.press(part);
        EXPECT_TRUE(fakes::controller.commands.empty()) << "nothing waits for the stop";
        EXPECT_EQ(nullptr, WPopupController::topmost());
        fakes::controller.lastSavedPath = "/card/saved.m4a";
        fakes::controller.finish();
        EXPECT_EQ(std::vector{MwAppController::STOP_RECORDING}, fakes::controller.commands);
        EXPECT_EQ(1, fakes::controller.recordingsOpened);
        screen.model.releaseStorage();
        screen.model.setStorageType(MW_STORAGE_DEVICE);
    }
}

TEST(RecorderScreenTest, SystemEvents)
{
    ui::RecorderScreen screen;
    emit(MwSignalMgr::EARJACK_INSERTED);
    EXPECT_EQ("Recording with the external microphone.", fakes::desktop.lastMessage);
    screen.model.setRecorderState(REC_STATE_NONE);
    emit(MwSignalMgr::EARJACK_INSERTED);
    EXPECT_EQ("The external microphone will be used to record.", fakes::desktop.lastMessage);
    emit(MwSignalMgr::MINI_CONTROLLER_RECORDING_SAVED);
    EXPECT_EQ(1, fakes::controller.recordingsOpened);
    emit(MwSignalMgr::POWER_OFF);
    emit(MwSignalMgr::UPS_MODE_CHANGED);
    EXPECT_EQ(2U, fakes::calls.count("ui_app_exit"));
    screen.enter(REC_STATE_READY);
    screen.more();
    EXPECT_TRUE(screen.naviframe->getTop()->hasAttachedPopup());
    emit(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_FALSE(screen.naviframe->getTop()->hasAttachedPopup());
    emit(MwSignalMgr::THEME_CHANGED);
    EXPECT_EQ("record_button recordings_button", shownButtons(screen));
}

TEST(RecorderScreenTest, PausesItsAnimationsWithTheApplication)
{
    ui::RecorderScreen screen;
    emit(MwSignalMgr::RESUME); // the one of the start
    screen.enter(REC_STATE_RECORDING);
    ASSERT_TRUE(hasRing(screen));
    emit(MwSignalMgr::PAUSE);
    EXPECT_FALSE(hasRing(screen));
    screen.model.setElapsedTime(9000);
    support::runFor(0.15);
    EXPECT_EQ("00:00", screen.text("recording_time"));
    emit(MwSignalMgr::RESUME);
    EXPECT_TRUE(hasRing(screen));
    ASSERT_TRUE(support::runUntil([&] { return screen.text("recording_time") == "00:09"; }));
}

TEST(RecorderScreenTest, AWideWindowKeepsAColumnAndTouchTargetsStayLarge)
{
    ui::RecorderScreen screen(1400, 640);
    screen.enter(REC_STATE_RECORDING);
    support::settle(screen.window);
    for (const char* part : {"stop_button", "bookmark_button", "pause_button", "discard_button"}) {
        int x = 0;
        int width = 0;
        int height = 0;
        evas_object_geometry_get(screen.button(part), &x, nullptr, &width, &height);
        EXPECT_GE(x, 700 - 180) << part;
        EXPECT_LE(x + width, 700 + 180) << part;
        EXPECT_GE(std::min(width, height), 44) << part;
    }
}

}
