// What the recordings list does to files: deleting, moving, sharing, renaming, as a user does them.
#include <gtest/gtest.h>

#include <Elementary.h>

#include <panekit/WPopupController.h>
#include <storage.h>
#include <vconf.h>

#include "FakeApp.h"
#include "RecordingsScreen.h"
#include "RenameWindow.h"
#include "fakes/Fakes.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"
#include "support/Screen.h"

using fakes::calls;
using panekit::WPopupController;
using support::runUntil;
using ui::RecordingsScreen;
using Names = std::vector<std::string>;

namespace {

namespace fs = std::filesystem;

std::string privatePath(const std::string& name)
{
    return std::string(storage_private_root()) + "/Sounds/Mewlo/" + name;
}

std::string popupName()
{
    const auto* popup = WPopupController::topmost();
    const char* name = popup ? evas_object_name_get(popup->getEvasObject()) : nullptr;
    return name ? name : "";
}

Evas_Object* popupContent() { return elm_object_content_get(WPopupController::topmost()->getEvasObject()); }

class RecordingsOperationsTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        ui::forgetRecordings();
        ui::launches.clear();
        vconf_set_int("db/setting/personal_unlock_method", 1);
        vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0);
        _screen = std::make_unique<RecordingsScreen>();
        for (const char* name : {"a.m4a", "b.m4a", "c.m4a"})
            _ids[name] = support::addRecording(name, name);
        _screen->open();
        calls.clear();
    }
    // Enters a mode by its menu entry, checks the recordings and presses Done or Delete.
    void select(const std::string& entry, const Names& names)
    {
        _screen->chooseMenu(entry);
        for (const std::string& name : names)
            _screen->tap(name);
        _screen->pressTitle("title_right_btn");
    }
    [[nodiscard]] bool hasEnded() const
    {
        return runUntil([this] { return WPopupController::topmost() == nullptr && _screen->names().size() < 4; }, 10);
    }
    [[nodiscard]] bool isNormal() const { return _screen->hasRecordButton(); }
    // Moves the files as far as the popup.
    void startMove(const Names& names)
    {
        select("Move to private", names);
        ASSERT_EQ(1U, ui::launches.size());
        ui::answer(ui::launches[0], APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
        ASSERT_EQ("movePopup", popupName());
    }
    static bool waitForClash()
    {
        return runUntil([] { return popupName() == "duplicationPopup"; }, 5);
    }
    std::unique_ptr<RecordingsScreen> _screen;
    std::map<std::string, std::string> _ids;
};

TEST_F(RecordingsOperationsTest, DeletesWhatIsCheckedBehindAPopup)
{
    select("Delete", {"a.m4a", "c.m4a"});
    EXPECT_EQ("deletePopup", popupName());
    EXPECT_EQ("Deleting…", support::text(popupContent(), "elm.text"));
    ASSERT_TRUE(hasEnded());
    EXPECT_EQ(Names{"b.m4a"}, _screen->names());
    EXPECT_FALSE(fs::exists(ui::recordingPath("a.m4a")));
    EXPECT_TRUE(fs::exists(ui::recordingPath("b.m4a")));
    EXPECT_TRUE(isNormal());

    _screen->chooseMenu("Delete");
    _screen->tap("b.m4a");
    support::click(_screen->titleButton("title_right_btn"));
    support::key(_screen->window, "Escape"); // before it begins
    EXPECT_EQ("", popupName());
    support::runFor(0.5);
    EXPECT_TRUE(fs::exists(ui::recordingPath("b.m4a")));
    _screen->pressTitle("title_right_btn");
    ASSERT_TRUE(runUntil([this] { return _screen->list() == nullptr; }));
    EXPECT_FALSE(fs::exists(ui::recordingPath("b.m4a")));
}

TEST_F(RecordingsOperationsTest, AsksBeforeItDeletesForGood)
{
    const std::string trash = std::string(::getenv("XDG_DATA_HOME")) + "/Trash";
    fs::remove_all(trash);
    support::writeFile(trash, "in the way");
    for (const bool confirmed : {false, true}) {
        select("Delete", {"a.m4a", "c.m4a"});
        ASSERT_TRUE(runUntil([] { return popupName() != "deletePopup"; }, 10));
        ASSERT_NE(nullptr, WPopupController::topmost());
        EXPECT_TRUE(fs::exists(ui::recordingPath("a.m4a")));
        EXPECT_NE(std::string::npos,
            support::text(WPopupController::topmost()->getEvasObject()).find("2 recordings cannot go to the trash."));
        WPopupController::topmost()->press(confirmed ? 1 : 0);
        ASSERT_TRUE(runUntil([] { return WPopupController::topmost() == nullptr; }, 10));
        EXPECT_EQ(confirmed ? 1U : 3U, _screen->names().size());
        EXPECT_EQ(confirmed, !fs::exists(ui::recordingPath("c.m4a")));
    }
    fs::remove(trash);
}

TEST_F(RecordingsOperationsTest, WhatComesDuringAnOperationIsShownAfterIt)
{
    for (const bool cancels : {false, true}) {
        SCOPED_TRACE(cancels);
        _screen->chooseMenu("Delete");
        _screen->tap(cancels ? "b.m4a" : "a.m4a");
        support::click(_screen->titleButton("title_right_btn"));
        const std::string added = cancels ? "e.m4a" : "d.m4a";
        support::addRecording(added);
        MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
        EXPECT_EQ("deletePopup", popupName());
        EXPECT_FALSE(isNormal());
        if (cancels)
            support::key(_screen->window, "Escape"); // before it begins
        ASSERT_TRUE(runUntil([] { return WPopupController::topmost() == nullptr; }, 10));
        support::settle(_screen->window);
        EXPECT_NE(nullptr, _screen->row(added));
        EXPECT_EQ(cancels, _screen->row("b.m4a") && !isNormal());
    }
}

TEST_F(RecordingsOperationsTest, DeletesThePlayingRecordingAfterAsking)
{
    _screen->tap("b.m4a");
    ASSERT_EQ(ui::recordingPath("b.m4a"), _screen->model.getCurrentPlayPath());
    _screen->chooseMenu("Delete");
    WPopupController::topmost()->press(1);
    support::settle(_screen->window);
    EXPECT_FALSE(fs::exists(ui::recordingPath("b.m4a")));
    EXPECT_EQ("", _screen->model.getCurrentPlayPath());
    EXPECT_EQ(2U, _screen->names().size());
    EXPECT_TRUE(isNormal());
}

TEST_F(RecordingsOperationsTest, MovesToPrivateAndAnswersAClash)
{
    support::writeFile(privatePath("b.m4a"), "old");
    select("Move to private", {"a.m4a", "b.m4a"});
    EXPECT_TRUE(calls.has("app_control_set_app_id com.tovanic.setting.private"));
    EXPECT_TRUE(calls.has("app_control_add_extra_data value=on"));
    EXPECT_EQ("", popupName()) << "not before the storage is available";
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 1); // as the service does
    ui::answer(ui::launches.at(0), APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
    EXPECT_EQ("movePopup", popupName());
    EXPECT_EQ("0/2", support::text(popupContent(), "elm.text.left"));
    ASSERT_TRUE(waitForClash());
    EXPECT_NE(std::string::npos, support::text(popupContent(), "elm.text").find("b.m4a"));
    WPopupController::topmost()->press(2);
    EXPECT_EQ("movePopup", popupName());
    ASSERT_TRUE(runUntil([] { return popupName().empty(); }, 10));
    EXPECT_EQ("old", support::readFile(privatePath("b.m4a")));
    EXPECT_EQ("b.m4a", support::readFile(privatePath("b_001.m4a")));
    EXPECT_EQ("2 items moved to private.", fakes::desktop.lastMessage);
    EXPECT_TRUE(calls.has("app_control_add_extra_data value=off"));
    EXPECT_TRUE(isNormal());
}

TEST_F(RecordingsOperationsTest, AMoveEndsByItselfHoweverItStops)
{
    startMove({"a.m4a", "b.m4a"});
    fs::remove(ui::recordingPath("a.m4a")); // the second: it fails
    ASSERT_TRUE(runUntil([] { return popupName().empty(); }, 10));
    EXPECT_EQ("1 item moved to private. Not moved: 1. A file is missing.", fakes::desktop.lastMessage);
    EXPECT_TRUE(isNormal());

    ui::launches.clear();
    select("Move to private", {"c.m4a"});
    ui::answer(ui::launches.at(0), APP_CONTROL_RESULT_FAILED);
    EXPECT_EQ("The private storage is not available.", fakes::desktop.lastMessage);
    EXPECT_EQ("", popupName());
    ui::launches.clear();
    _screen->pressTitle("title_right_btn"); // again
    ui::answer(ui::launches.at(0), APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
    WPopupController::topmost()->press(0); // cancelled before it begins
    support::runFor(0.5);
    EXPECT_TRUE(fs::exists(ui::recordingPath("c.m4a")));
    EXPECT_TRUE(isNormal());
}

TEST_F(RecordingsOperationsTest, OpensThePrivateStorageForAsLongAsItIsNeeded)
{
    support::writeFile(privatePath("d.m4a"), "d");
    support::enterRows({{privatePath("d.m4a"), 60000, 30}});
    _screen->announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ(nullptr, _screen->row("d.m4a"));
    const auto serve = [](int number, bool open) {
        vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, open ? 1 : 0);
        ui::answer(ui::launches.at(number), APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
    };
    _screen->chooseMenu("Remove from private");
    EXPECT_TRUE(isNormal()) << "not before the storage is open";
    serve(0, true);
    EXPECT_NE(nullptr, _screen->row("d.m4a"));
    EXPECT_FALSE(isNormal());
    calls.clear();
    _screen->back(); // without a move
    EXPECT_TRUE(calls.has("app_control_add_extra_data value=off"));
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0);
    _screen->announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
    EXPECT_EQ(nullptr, _screen->row("d.m4a"));

    ui::launches.clear();
    _screen->chooseMenu("Show private recordings");
    serve(0, true);
    _screen->announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
    EXPECT_NE(nullptr, _screen->row("d.m4a"));
    ui::launches.clear();
    calls.clear();
    _screen->chooseMenu("Hide private recordings");
    EXPECT_TRUE(calls.has("app_control_add_extra_data value=off"));
    vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0);
    _screen->announce(MwSignalMgr::PRIVATE_STORAGE_CHANGED);

    ::setenv("MEWLO_PRIVATE_SECONDS", "0.2", 1);
    fakes::desktop.lastMessage.clear();
    select("Move to private", {"a.m4a"});
    _screen->back(); // the list is not held up meanwhile
    select("Move to private", {"b.m4a"}); // nobody answers
    EXPECT_TRUE(runUntil([] { return !fakes::desktop.lastMessage.empty(); }, 5));
    EXPECT_EQ("The private storage is not available.", fakes::desktop.lastMessage);
    EXPECT_TRUE(calls.has("app_control_send_terminate_request"));
    ui::answer(ui::launches.back(), APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
    EXPECT_EQ("", popupName()) << "too late";
    ::unsetenv("MEWLO_PRIVATE_SECONDS");
}

TEST_F(RecordingsOperationsTest, AScreenLeftInAClashAndLateRepliesDoNoHarm)
{
    support::writeFile(privatePath("a.m4a"), "old");
    startMove({"a.m4a"});
    ASSERT_TRUE(waitForClash());
    const ui::Launch launch = ui::launches[0];
    _screen.reset();
    EXPECT_EQ("", popupName());
    ui::answer(launch, APP_CONTROL_RESULT_SUCCEEDED, {{"result", "Success"}});
    EXPECT_EQ("a.m4a", support::readFile(ui::recordingPath("a.m4a")));
    EXPECT_EQ("old", support::readFile(privatePath("a.m4a")));
}

TEST_F(RecordingsOperationsTest, SharesOneOrSeveral)
{
    select("Share", {"b.m4a"});
    EXPECT_TRUE(calls.has("app_control_set_uri " + ui::recordingPath("b.m4a")));
    EXPECT_TRUE(calls.has(std::string("app_control_set_operation ") + APP_CONTROL_OPERATION_SHARE));
    EXPECT_FALSE(calls.has("app_control_add_extra_data_array"));
    EXPECT_TRUE(calls.has("app_control_set_launch_mode 1"));
    EXPECT_FALSE(isNormal());
    ui::answer(ui::launches.at(0), APP_CONTROL_RESULT_APP_STARTED);
    EXPECT_TRUE(isNormal());

    calls.clear();
    select("Share", {"a.m4a", "c.m4a"});
    EXPECT_TRUE(calls.has(std::string("app_control_set_operation ") + APP_CONTROL_OPERATION_MULTI_SHARE));
    EXPECT_TRUE(calls.has("app_control_add_extra_data launch-type=mewlo"));
    const auto arrays = calls.matching("app_control_add_extra_data_array");
    ASSERT_EQ(1U, arrays.size());
    EXPECT_NE(std::string::npos, arrays[0].find(ui::recordingPath("a.m4a")));
    EXPECT_NE(std::string::npos, arrays[0].find(ui::recordingPath("c.m4a")));
    calls.failWith("app_control_send_launch_request", APP_CONTROL_ERROR_APP_NOT_FOUND);
    _screen->pressTitle("title_right_btn");
    EXPECT_EQ("There is no application to share with.", fakes::desktop.lastMessage);
    EXPECT_FALSE(isNormal());
}

TEST_F(RecordingsOperationsTest, RenamesWhatIsFreeAndKeepsPlaying)
{
    _screen->tap("b.m4a");
    _screen->chooseMenu("Rename");
    Evas_Object* window = ui::renameWindow(_screen->window);
    ASSERT_NE(nullptr, window);
    for (const auto& [name, message] :
        std::map<std::string, std::string>{{"a", "This name is already used."}, {".b", "This name cannot be used."}}) {
        ui::answerRename(window, name);
        EXPECT_TRUE(runUntil([&message = message] { return fakes::desktop.lastMessage == message; }, 5)) << name;
        EXPECT_EQ(window, ui::renameWindow(_screen->window)) << "stays open";
    }
    ui::answerRename(window, "Talk");
    EXPECT_TRUE(runUntil([this] { return ui::renameWindow(_screen->window) == nullptr; }, 5));
    EXPECT_EQ("b.m4a", support::readFile(ui::recordingPath("Talk.m4a")));
    EXPECT_EQ("a.m4a", support::readFile(ui::recordingPath("a.m4a")));
    EXPECT_EQ(ui::recordingPath("Talk.m4a"), _screen->model.getCurrentPlayPath());
    EXPECT_TRUE(_screen->hasPlayer());
    const MwFileInfo* info = _screen->model.getRecordedFileInfoByPath(ui::recordingPath("Talk.m4a"));
    ASSERT_NE(nullptr, info);
    EXPECT_EQ(_ids["b.m4a"], info->mediaId);
    EXPECT_NE(nullptr, _screen->row("Talk.m4a"));
}

}
