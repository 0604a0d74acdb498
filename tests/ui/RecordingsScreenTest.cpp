#include <gtest/gtest.h>

#include <Elementary.h>

#include <chrono>
#include <thread>

#include <media_content.h>
#include <panekit/WLanguage.h>
#include <panekit/WPopupController.h>
#include <vconf.h>

#include <fstream>

#include "MwDisplayText.h"
#include "MwRecordingsListItem.h"
#include "RecordingsScreen.h"
#include "fakes/Fakes.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/Screen.h"

using panekit::WPopupController;
using ui::RecordingsScreen;
using Commands = std::vector<MwAppController::Command>;
using Names = std::vector<std::string>;

namespace {

constexpr auto NAME = "elm.text.main.left.top";
constexpr auto MMS = "elm.text.sub.right.bottom";
constexpr auto DURATION = "elm.text.sub.left.bottom.1";
constexpr auto DONE = "title_right_btn";

class RecordingsScreenTest : public ::testing::Test {
protected:
    void SetUp() override { ui::forgetRecordings(); }
    void TearDown() override
    {
        vconf_set_int("memory/sysman/mmc", 0);
        vconf_set_int("db/setting/personal_unlock_method", 0);
        fakes::controller = {};
    }

    static bool isChecked(const RecordingsScreen& screen, const std::string& name)
    {
        Evas_Object* choice = screen.choice(name);
        return choice && elm_check_state_get(choice);
    }
    static bool isDoneEnabled(const RecordingsScreen& screen)
    {
        return screen.titleButton(DONE) && !elm_object_disabled_get(screen.titleButton(DONE));
    }
    static Names many(int count)
    {
        Names files;
        for (int i = 0; i < count; ++i)
            files.push_back("Voice " + std::to_string(i) + ".m4a");
        return files;
    }
};

TEST_F(RecordingsScreenTest, AnEmptyCatalogueSaysSoUntilTheFirstRecording)
{
    RecordingsScreen screen;
    screen.open();
    EXPECT_EQ(nullptr, screen.list());
    EXPECT_TRUE(screen.hasRecordButton());
    EXPECT_EQ(Names{}, screen.menu());
    EXPECT_TRUE(fakes::log.has("No contents"));
    ui::enterRecordings({"Memo.amr"});
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ(Names{"Memo.amr"}, screen.names());
    EXPECT_EQ((Names{"Delete", "Share", "Rename"}), screen.menu());
}

TEST_F(RecordingsScreenTest, EachModeHasItsTitleButtonsAndChoices)
{
    ui::enterRecordings({"A.m4a", "B.m4a"});
    RecordingsScreen screen;
    screen.open();
    struct Mode {
        const char* entry;
        const char* title;
        bool hasDone;
        const char* firstRow;
    };
    const Mode modes[] = {{"Delete", "Select recordings", true, "all"}, {"Share", "Select recordings", true, "all"},
        {"Rename", "Select recording", false, "A.m4a"}};
    for (const Mode& mode : modes) {
        SCOPED_TRACE(mode.entry);
        screen.chooseMenu(mode.entry);
        EXPECT_EQ(mode.title, screen.title());
        EXPECT_EQ(mode.hasDone, screen.titleButton(DONE) != nullptr);
        EXPECT_EQ(mode.hasDone, screen.titleButton("prev_btn") == nullptr);
        EXPECT_EQ(mode.firstRow, screen.names().front());
        EXPECT_NE(nullptr, screen.choice("A.m4a"));
        EXPECT_FALSE(screen.hasRecordButton());
        EXPECT_EQ(Names{}, screen.menu());
        screen.back();
        EXPECT_EQ("Recordings", screen.title());
        EXPECT_EQ((Names{"A.m4a", "B.m4a"}), screen.names());
        EXPECT_EQ(nullptr, screen.choice("A.m4a"));
        EXPECT_TRUE(screen.hasRecordButton());
    }
    screen.back();
    support::settle(screen.window);
    EXPECT_EQ(nullptr, screen.view);
}

TEST_F(RecordingsScreenTest, ChecksAreCountedAndTheFirstRowFollowsThem)
{
    ui::enterRecordings({"A.m4a", "B.m4a", "C.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.chooseMenu("Delete");
    EXPECT_FALSE(isDoneEnabled(screen));
    screen.tap("A.m4a");
    screen.tap("C.m4a");
    EXPECT_EQ("2 selected", screen.title());
    EXPECT_TRUE(isDoneEnabled(screen));
    EXPECT_FALSE(isChecked(screen, "all"));
    screen.tap("B.m4a");
    EXPECT_TRUE(isChecked(screen, "all"));
    screen.tap("B.m4a");
    EXPECT_FALSE(isChecked(screen, "all"));
    screen.tap("all");
    EXPECT_EQ("3 selected", screen.title());
    screen.tap("all");
    EXPECT_FALSE(isChecked(screen, "A.m4a"));
    EXPECT_EQ("Select recordings", screen.title());
    EXPECT_FALSE(isDoneEnabled(screen));
}

TEST_F(RecordingsScreenTest, ATapPlaysPausesResumesAndSwitches)
{
    const std::string path = ui::enterRecordings({"A.m4a", "B.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.tap("A.m4a");
    EXPECT_TRUE(screen.hasPlayer());
    EXPECT_TRUE(screen.model.isPlayViewShown());
    EXPECT_EQ(path, screen.model.getCurrentPlayPath());
    screen.tap("A.m4a");
    screen.tap("A.m4a");
    screen.tap("B.m4a");
    EXPECT_EQ((Commands{MwAppController::START_PLAYING, MwAppController::PAUSE_PLAYING, MwAppController::RESUME_PLAYING,
                  MwAppController::RESTART_PLAYING}),
        fakes::controller.commands);
    EXPECT_EQ(ui::recordingPath("B.m4a"), screen.model.getCurrentPlayPath());
    EXPECT_EQ("A", screen.text("A.m4a", NAME));
    EXPECT_EQ(0U, screen.text("B.m4a", NAME).find("<color=#1F6FB2FF>B</color>"));
    screen.back();
    EXPECT_EQ("", screen.model.getCurrentPlayPath());
    EXPECT_TRUE(screen.hasRecordButton());
    EXPECT_FALSE(screen.model.isPlayViewShown());
    EXPECT_EQ("B", screen.text("B.m4a", NAME));
}

TEST_F(RecordingsScreenTest, TheTrimPanelTakesThePlaceOfThePlayerAndGivesItBack)
{
    ui::enterRecordings({"A.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.tap("A.m4a");
    const auto isTrimming = [&] {
        Evas_Object* docked = elm_object_part_content_get(screen.view, "elm.swallow.controller");
        return docked && elm_object_part_content_get(docked, "save_button");
    };
    const auto trim = [&] {
        screen.model.setTrimMode(true);
        screen.playerChanged();
        EXPECT_TRUE(isTrimming());
        EXPECT_TRUE(elm_object_disabled_get(screen.list()));
    };
    trim();
    screen.key("Delete");
    EXPECT_EQ(nullptr, panekit::WPopupController::topmost()) << "the keys of the list rest";
    screen.back();
    support::runFor(0.1);
    EXPECT_FALSE(screen.model.isTrimMode());
    EXPECT_FALSE(isTrimming());
    EXPECT_TRUE(screen.hasPlayer());
    EXPECT_FALSE(elm_object_disabled_get(screen.list()));
    // A recording that another program deletes takes the panel along.
    trim();
    std::filesystem::remove(ui::recordingPath("A.m4a"));
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_FALSE(screen.model.isTrimMode());
    EXPECT_FALSE(isTrimming());
    EXPECT_EQ("", screen.model.getCurrentPlayPath());
}

TEST_F(RecordingsScreenTest, TheTitleFollowsTheLanguageNumbersAlike)
{
    ui::enterRecordings({"A.m4a", "B.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.chooseMenu("Delete");
    screen.tap("A.m4a");
    panekit::WLanguage::use("de");
    support::settle(screen.window);
    EXPECT_EQ("1 ausgewählt", screen.title());
    screen.back();
    EXPECT_EQ("Aufnahmen", screen.title());
    panekit::WLanguage::use("en");
    support::settle(screen.window);
    EXPECT_EQ("Recordings", screen.title());
}

TEST_F(RecordingsScreenTest, ACommandThatFailsLeavesTheListAsItIs)
{
    ui::enterRecordings({"A.m4a", "B.m4a"});
    RecordingsScreen screen;
    screen.open();
    fakes::controller.onCommand = [](MwAppController::Command) { return false; };
    screen.tap("A.m4a");
    EXPECT_EQ("", screen.model.getCurrentPlayPath());
    EXPECT_TRUE(screen.hasRecordButton());
    screen.model.setCurrentPlayPath(ui::recordingPath("A.m4a"));
    screen.model.setPlayerState(PLAY_STATE_PLAYING);
    screen.playerChanged();
    screen.tap("A.m4a");
    EXPECT_TRUE(fakes::log.has("play pause failed!"));
    screen.back();
    EXPECT_TRUE(screen.hasPlayer());
    EXPECT_EQ(ui::recordingPath("A.m4a"), screen.model.getCurrentPlayPath());
}

TEST_F(RecordingsScreenTest, TheMenuFollowsWhatIsLoadedTheCardAndPrivateMode)
{
    const std::string id = ui::enterRecordings({"A.m4a"});
    RecordingsScreen screen;
    screen.open();
    vconf_set_int("memory/sysman/mmc", 1);
    EXPECT_EQ((Names{"Delete", "Share", "Rename", "Save to"}), screen.menu());
    screen.back();
    vconf_set_int("memory/sysman/mmc", 0);
    screen.tap("A.m4a");
    EXPECT_EQ((Names{"Delete", "Share", "Rename", "Details"}), screen.menu());
    screen.back();
    media_bookmark_insert_to_db(id.c_str(), 3, "here");
    EXPECT_EQ((Names{"Delete", "Share", "Rename", "Bookmarks", "Details"}), screen.menu());
    screen.back();
    screen.chooseMenu("Delete");
    ASSERT_NE(nullptr, WPopupController::topmost());
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    support::runFor(0.4);
    EXPECT_EQ(nullptr, WPopupController::topmost());
}

TEST_F(RecordingsScreenTest, RowsSayLengthFormatAndNameSafely)
{
    media_content_connect();
    const std::string wild = "<b>\"50%\" & \xff\n\xe2\x80\xaeTiger.m4a";
    support::enterRows(
        {{"/x/Memo.amr", 400, 30}, {"/x/Memo.m4a", 3723000, 20}, {"/x/Odd.m4a", 0, 15}, {"/x/" + wild, 1999, 10}});
    media_content_disconnect();
    RecordingsScreen screen;
    screen.open();
    EXPECT_EQ("MMS", screen.text("Memo.amr", MMS));
    EXPECT_EQ("", screen.text("Memo.m4a", MMS));
    EXPECT_EQ("00:01", screen.text("Memo.amr", DURATION));
    EXPECT_EQ("01:02:03", screen.text("Memo.m4a", DURATION));
    EXPECT_EQ("--:--", screen.text("Odd.m4a", DURATION));
    EXPECT_EQ("&lt;b&gt;&quot;50%&quot; &amp; \xef\xbf\xbd  Tiger", mwDisplayMarkup(mwWithoutExtension(wild)));
    EXPECT_EQ(".hidden", mwWithoutExtension(".hidden"));
    screen.tap("Memo.amr");
    EXPECT_EQ("<color=#1F6FB2CC>MMS</color>", screen.text("Memo.amr", MMS));
}

TEST_F(RecordingsScreenTest, ARecordingDeletedElsewhereClosesItsPlayer)
{
    const std::string id = support::addRecording("A.m4a");
    support::writeFile(ui::recordingPath("B.m4a"), "x");
    ui::enterRecordings({"B.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.tap("B.m4a");
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_TRUE(screen.hasPlayer());
    std::filesystem::remove(ui::recordingPath("B.m4a"));
    media_info_delete_from_db(ui::recordingPath("B.m4a").c_str());
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_TRUE(screen.hasRecordButton());
    EXPECT_EQ("", screen.model.getCurrentPlayPath());
    EXPECT_EQ(MwAppController::STOP_PLAYING, fakes::controller.commands.back());
    EXPECT_EQ(PLAY_STATE_NONE, screen.model.getPlayerState());
}

TEST_F(RecordingsScreenTest, EventsOfTheDeviceStopPauseAndTell)
{
    ui::enterRecordings({"A.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.announce(MwSignalMgr::EARJACK_INSERTED);
    EXPECT_EQ("The external microphone will be used to record.", fakes::desktop.lastMessage);
    fakes::desktop.lastMessage.clear();
    screen.tap("A.m4a");
    screen.announce(MwSignalMgr::EARJACK_INSERTED);
    EXPECT_EQ("", fakes::desktop.lastMessage);
    screen.announce(MwSignalMgr::EARJACK_REMOVED);
    EXPECT_EQ(PLAY_STATE_PAUSED, screen.model.getPlayerState());
    EXPECT_FALSE(fakes::calls.has("ui_app_exit"));
    screen.announce(MwSignalMgr::POWER_OFF);
    EXPECT_EQ(PLAY_STATE_NONE, screen.model.getPlayerState());
    EXPECT_TRUE(fakes::calls.has("ui_app_exit"));
}

TEST_F(RecordingsScreenTest, ARequestGetsTheChosenRecording)
{
    ui::enterRecordings({"A.m4a", "B.m4a", "C.m4a", "Gone.m4a"});
    for (const char* name : {"A.m4a", "B.m4a", "C.m4a"})
        support::writeFile(ui::recordingPath(name), "x");
    RecordingsScreen screen(RecordingsScreen::Mode::Request);
    screen.model.setCurrentRecordingFileName("B");
    screen.open();
    EXPECT_EQ("Select", screen.title());
    EXPECT_TRUE(isDoneEnabled(screen));
    EXPECT_EQ("", screen.model.getCurrentRecordingFileName());
    Evas_Object* chosen = screen.choice("B.m4a");
    ASSERT_NE(nullptr, chosen);
    EXPECT_EQ(elm_radio_state_value_get(chosen), elm_radio_value_get(chosen));
    EXPECT_EQ(3U, screen.names().size()) << "what is not there is not offered";
    // The choice stays with its recording while others come and go.
    media_info_delete_from_db(ui::recordingPath("A.m4a").c_str());
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    screen.pressTitle(DONE);
    EXPECT_TRUE(fakes::calls.has(
        std::string("app_control_add_extra_data ") + APP_CONTROL_DATA_SELECTED + "=" + ui::recordingPath("B.m4a")));
    EXPECT_TRUE(fakes::calls.has("app_control_reply_to_launch_request 0"));
    EXPECT_TRUE(fakes::calls.has("ui_app_exit"));
}

TEST_F(RecordingsScreenTest, ARequestIsOfferedOnlyWhatFitsTypeAndSize)
{
    ui::enterRecordings({"A.m4a", "B.amr", "C.amr"});
    support::writeFile(ui::recordingPath("C.amr"), std::string(20 * 1024 + 1, 'x'));
    support::writeFile(ui::recordingPath("B.amr"), std::string(20 * 1024, 'x'));
    RecordingsScreen screen(RecordingsScreen::Mode::Request);
    screen.model.setTypeRequested(true);
    screen.model.setFileFormat(MwModel::FORMAT_AMR);
    screen.model.setSizeLimit(20);
    screen.open();
    EXPECT_EQ(std::vector<std::string>{"B.amr"}, screen.names());
}

TEST_F(RecordingsScreenTest, NothingIsChosenForARequestUntilATap)
{
    support::writeFile(ui::enterRecordings({"A.m4a"}), "x");
    RecordingsScreen screen(RecordingsScreen::Mode::Request);
    screen.open();
    EXPECT_FALSE(isDoneEnabled(screen));
    screen.tap("A.m4a");
    EXPECT_TRUE(isDoneEnabled(screen));
    EXPECT_TRUE(screen.hasPlayer());
    screen.back();
    EXPECT_EQ("", screen.model.getCurrentPlayPath());
    EXPECT_EQ("Select", screen.title());
}

TEST_F(RecordingsScreenTest, RowsStayWhereTheyAreWhileOthersComeAndGo)
{
    ui::enterRecordings(many(300));
    RecordingsScreen screen;
    screen.open();
    ASSERT_TRUE(support::runUntil([&] { return screen.names().size() == 300U; }));
    support::settle(screen.window);
    elm_scroller_region_show(screen.list(), 0, 100 * 68 + 21, 1, 500);
    support::settle(screen.window);
    const auto yOf = [&](const std::string& name) {
        int y = 0;
        Evas_Object* rectangle = elm_object_item_track(screen.row(name));
        evas_object_geometry_get(rectangle, nullptr, &y, nullptr, nullptr);
        elm_object_item_untrack(screen.row(name));
        return y;
    };
    const int y = yOf("Voice 102.m4a");
    support::enterRows({{"/x/new.m4a", 1000, 1800000000}, {"/x/newer.m4a", 1000, 1800000001}});
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ("newer.m4a", screen.names().front());
    EXPECT_EQ(y, yOf("Voice 102.m4a"));
    for (const char* gone : {"Voice 50.m4a", "Voice 51.m4a", "Voice 100.m4a"})
        media_info_delete_from_db(ui::recordingPath(gone).c_str());
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ(299U, screen.names().size());
    EXPECT_EQ(y, yOf("Voice 102.m4a")); // also when the row on top goes
    int height = 0;
    elm_scroller_child_size_get(screen.list(), nullptr, &height);
    EXPECT_EQ(299 * 68, height); // no gap is left
    screen.chooseMenu("Delete");
    EXPECT_EQ(y, yOf("Voice 102.m4a"));
}

TEST_F(RecordingsScreenTest, ALongListGrowsBehindItsFirstScreens)
{
    ui::enterRecordings(many(2000));
    RecordingsScreen screen;
    screen.open();
    EXPECT_EQ("Voice 0.m4a", screen.topRow());
    EXPECT_TRUE(support::runUntil([&] { return screen.names().size() == 2000U; }));
    RecordingsScreen again;
    again.open();
    ASSERT_GT(2000U, again.names().size());
    again.chooseMenu("Delete");
    again.tap("all");
    EXPECT_EQ("2000 selected", again.title());
}

TEST_F(RecordingsScreenTest, ThousandsThatComeAtOnceHoldNobodyAndMoveNothing)
{
    constexpr int MANY = 1500;
    const auto enter = [](const std::string& prefix, long long newest) {
        std::vector<support::DatabaseRow> rows;
        for (int i = 0; i < MANY; ++i)
            rows.push_back({ui::recordingPath(prefix + std::to_string(i) + ".m4a"), 60000, newest - i});
        media_content_connect();
        support::enterRows(rows);
        media_content_disconnect();
    };
    enter("old", 10000);
    RecordingsScreen screen;
    screen.open();
    // The toolkit gives rows their places while it has nothing else to do; before that there is no place to keep.
    Evas_Object* first = elm_object_item_track(elm_genlist_first_item_get(screen.list()));
    int rowHeight = 0;
    evas_object_geometry_get(first, nullptr, nullptr, nullptr, &rowHeight);
    elm_object_item_untrack(elm_genlist_first_item_get(screen.list()));
    ASSERT_GT(rowHeight, 0);
    const auto isLaidOut = [&](size_t count) {
        int all = 0;
        elm_scroller_child_size_get(screen.list(), nullptr, &all);
        return screen.names().size() == count && all >= static_cast<int>(count) * rowHeight;
    };
    ASSERT_TRUE(support::runUntil([&] { return isLaidOut(MANY); }));
    elm_genlist_item_show(screen.row("old700.m4a"), ELM_GENLIST_ITEM_SCROLLTO_TOP);
    support::settle(screen.window);
    const std::string top = screen.topRow();
    enter("new", 20000);
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ("old0.m4a", screen.names().front()) << "read while everybody waits";
    ASSERT_TRUE(support::runUntil([&] { return screen.names().front() == "new0.m4a"; }));
    EXPECT_LT(screen.names().size(), 2U * MANY) << "all at once";
    ASSERT_TRUE(support::runUntil([&] { return isLaidOut(2 * MANY); }));
    support::settle(screen.window);
    EXPECT_EQ("new0.m4a", screen.names().front());
    EXPECT_EQ(top, screen.topRow());
    // As many go again.
    ASSERT_TRUE(support::execute("DELETE FROM media WHERE MEDIA_DISPLAY_NAME LIKE 'new%'"));
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    ASSERT_TRUE(support::runUntil([&] { return screen.names().size() == MANY; }));
    support::settle(screen.window);
    EXPECT_EQ(top, screen.topRow());
    // What was read before a change of our own is not believed after it.
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
    std::this_thread::sleep_for(std::chrono::milliseconds(200)); // for the reader, which the main loop has yet to hear
    ASSERT_TRUE(support::execute("DELETE FROM media WHERE MEDIA_DISPLAY_NAME = 'old5.m4a'"));
    EXPECT_EQ(1U, screen.model.removeRecordedFiles({ui::recordingPath("old5.m4a")}));
    support::runFor(0.3);
    EXPECT_EQ(nullptr, screen.model.getRecordedFileInfoByPath(ui::recordingPath("old5.m4a")));
    // All go: their list does, too, but not at once.
    bool isGone = false;
    const auto gone = [](void* data, Evas*, Evas_Object*, void*) { *static_cast<bool*>(data) = true; };
    for (const bool leaves : {false, true}) {
        isGone = false;
        evas_object_event_callback_add(screen.list(), EVAS_CALLBACK_DEL, gone, &isGone);
        ASSERT_TRUE(support::execute("DELETE FROM media"));
        MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
        ASSERT_TRUE(support::runUntil([&] { return !screen.list(); }));
        EXPECT_FALSE(isGone);
        if (leaves)
            screen.close();
        EXPECT_TRUE(support::runUntil([&] { return isGone; }));
        if (leaves)
            return;
        enter("old", 10000);
        screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
        ASSERT_TRUE(support::runUntil([&] { return screen.names().size() == MANY; }));
    }
}

TEST_F(RecordingsScreenTest, TheKeyboardDoesWhatTheMouseDoes)
{
    ui::enterRecordings({"A.m4a", "B.m4a", "C.m4a"});
    RecordingsScreen screen;
    screen.open();
    screen.key("Down");
    screen.key("Down");
    screen.key("Delete");
    ASSERT_NE(nullptr, WPopupController::topmost());
    screen.back();
    support::runFor(0.4);
    screen.key("Return");
    EXPECT_EQ(ui::recordingPath("B.m4a"), screen.model.getCurrentPlayPath());
    screen.key("space");
    EXPECT_EQ(PLAY_STATE_PAUSED, screen.model.getPlayerState());
    screen.key("Right");
    screen.key("Right");
    screen.key("Left");
    EXPECT_EQ(5000U, screen.model.getCurrentPlayPosition());
    screen.back();
    EXPECT_TRUE(screen.hasRecordButton());
}

TEST_F(RecordingsScreenTest, MovingToPrivateListsWhatIsOutside)
{
    media_content_connect();
    const std::string inside = std::string(std::getenv("MEWLO_PRIVATE_ROOT")) + "/Sounds/Mewlo/Secret.m4a";
    support::enterRows({{inside, 60000, 30}, {ui::recordingPath("Open.m4a"), 60000, 20}});
    media_content_disconnect();
    vconf_set_int("db/setting/personal_unlock_method", 1);
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 1);
    RecordingsScreen screen;
    screen.open();
    const Names entries = screen.menu();
    EXPECT_EQ((Names{"Delete", "Share", "Rename", "Move to private", "Remove from private", "Hide private recordings"}),
        entries);
    screen.back();
    if (entries.size() < 6)
        return;
    screen.chooseMenu("Move to private");
    EXPECT_EQ((Names{"all", "Open.m4a"}), screen.names());
    screen.back();
    EXPECT_EQ((Names{"Secret.m4a", "Open.m4a"}), screen.names());
    screen.chooseMenu("Remove from private");
    EXPECT_EQ((Names{"all", "Secret.m4a"}), screen.names());
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0);
    screen.announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
    EXPECT_EQ(Names{"Open.m4a"}, screen.names()) << "handed back: not listed, whatever is being done";
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 1);
    screen.announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
    screen.tap("Secret.m4a");
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0);
    screen.announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
    EXPECT_FALSE(screen.hasPlayer()) << "nor played on";
}

}
