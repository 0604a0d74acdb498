#include <gtest/gtest.h>
#include <panekit/WWindowController.h>
#include <preference.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vconf.h>

#include "MwAppController.h"
#include "MwModel.h"
#include "MwRecordingNotes.h"
#include "MwRecordingRescue.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "fakes/Fakes.h"
#include "support/DatabaseRows.h"
#include "support/FaultyCalls.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

using fakes::calls;

// How a recording begins and ends, against a recorder that misbehaves.
class RecordingFlowTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        std::filesystem::remove_all(support::deviceRoot());
        std::filesystem::create_directories(support::deviceRoot());
        ASSERT_EQ(0, media_content_connect());
        _model.setAppState(MwModel::APP_STATE_RESUMED);
        MwSystemMgr::getInstance()->initialize(&_model);
        ASSERT_TRUE(_controller.initialize(&_model, &_window));
        fakes::recorder.onStart = [] { support::writeFile(fakes::recorder.fileName, "sound"); };
        calls.clear();
    }
    void TearDown() override
    {
        _controller.deinitialize();
        MwSystemMgr::destroyInstance();
        media_content_disconnect();
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
        _model.setStorageType(MW_STORAGE_DEVICE);
    }
    bool dispatch(MwAppController::Command command) { return _controller.dispatchCommand(command); }
    bool stop() { return dispatch(MwAppController::STOP_RECORDING); }
    void startRecording(unsigned long long elapsed = 5000)
    {
        ASSERT_TRUE(dispatch(MwAppController::START_RECORDING));
        _model.setElapsedTime(elapsed);
    }
    // What the recorder tells when it has ended a recording by itself.
    static void endedByItself() { fakes::recorder.state = RECORDER_STATE_READY; }
    static void interrupt()
    {
        endedByItself();
        fakes::recorder.interrupted(
            RECORDER_POLICY_DEVICE_LOST, RECORDER_STATE_RECORDING, RECORDER_STATE_READY, fakes::recorder.userData);
    }
    static void fail(int error) { fakes::recorder.error(error, fakes::recorder.state, fakes::recorder.userData); }
    static void reachFreeSpace()
    {
        endedByItself();
        fakes::recorder.limitReached(RECORDER_RECORDING_LIMIT_FREE_SPACE, fakes::recorder.userData);
    }
    bool isReadySoon()
    {
        return support::runUntil(
            [&] { return _model.getRecorderState() == REC_STATE_READY && calls.has("recorder_destroy"); });
    }
    static void execute(const char* statement)
    {
        sqlite3* database = nullptr;
        EXPECT_EQ(SQLITE_OK, sqlite3_open(support::databasePath().c_str(), &database));
        EXPECT_EQ(SQLITE_OK, sqlite3_exec(database, statement, nullptr, nullptr, nullptr));
        sqlite3_close(database);
    }
    static int bookmarksOf(const std::string& id)
    {
        int count = -1;
        media_info_get_bookmark_count_from_db(id.c_str(), nullptr, &count);
        return count;
    }
    static bool isThere(const std::string& path) { return std::filesystem::exists(path); }

    MwModel _model;
    panekit::WWindowController _window{"test", 1};
    MwAppController _controller;
};

TEST_F(RecordingFlowTest, WhatWasNotCompletedIsLeftToTheRescue)
{
    const std::map<std::string, std::function<void()>> ways = {
        {"commit fails",
            [&] {
                calls.failWith("recorder_commit", -1);
                EXPECT_FALSE(stop());
            }},
        {"completion failed before the stop",
            [&] {
                calls.failWith("recorder_check_temporary", -1);
                endedByItself();
                EXPECT_FALSE(stop());
            }},
        {"completion failed at the interruption",
            [&] {
                calls.failWith("recorder_check_temporary", -1);
                interrupt();
            }},
        {"the recorder tells only the failure",
            [&] {
                calls.failWith("recorder_check_temporary", -1);
                endedByItself();
                fail(RECORDER_ERROR_INVALID_OPERATION);
            }},
    };
    for (const bool request : {false, true})
        for (const auto& [name, end] : ways) {
            SCOPED_TRACE(name + (request ? ", for a request" : ""));
            calls.clear();
            _model.setRequestMode(request);
            startRecording();
            unsigned int second = 0;
            _model.addBookMark(second);
            end();
            EXPECT_TRUE(isReadySoon());
            EXPECT_EQ("", _controller.getLastSavedPath());
            EXPECT_EQ("sound", support::readFile(fakes::recorder.fileName));
            EXPECT_TRUE(isThere(fakes::recorder.fileName + ".notes"));
            EXPECT_FALSE(calls.has("recorder_release_temporary"));
            EXPECT_TRUE(support::runUntil([] {
                return fakes::desktop.lastMessage
                    == mwTranslate("IDS_MW_TPOP_RECORDING_NOT_COMPLETED_KEPT_FOR_THE_NEXT_START");
            })) << fakes::desktop.lastMessage;
            EXPECT_TRUE(support::runUntil([] { return calls.has("device_power_release_lock 0"); }));
            fakes::desktop.lastMessage.clear();
        }
}

TEST_F(RecordingFlowTest, AFailingStorageIsToldWhileItRecords)
{
    startRecording();
    calls.clear();
    fail(RECORDER_ERROR_STORAGE);
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_STORAGE_FAILS_RECORDING_MAY_BE_LOST"), fakes::desktop.lastMessage);
    EXPECT_FALSE(calls.has("device_power_release_lock")) << "it still records";
    EXPECT_TRUE(stop());
}

TEST_F(RecordingFlowTest, WhereARecordingGoesIsDecidedAtItsStart)
{
    const std::string card = std::getenv("MEWLO_CARD_ROOT");
    const auto setCard = [](bool mounted) { vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, mounted ? 1 : 0); };
    struct {
        const char* name;
        bool onCard;
        std::function<void()> change;
    } const cases[] = {
        {"card mounted", false, [&] { setCard(true); }},
        {"choice changed", false, [&] { _model.setStorageType(MW_STORAGE_CARD), setCard(true); }},
        {"card removed", true, [&] { setCard(false); }},
        {"choice changed to the device", true, [&] { _model.setStorageType(MW_STORAGE_DEVICE); }},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        std::filesystem::create_directories(card);
        setCard(c.onCard);
        _model.setStorageType(MW_STORAGE_CARD);
        const std::string root = c.onCard ? card : support::deviceRoot();
        startRecording();
        c.change();
        EXPECT_EQ(c.onCard ? MW_STORAGE_CARD : MW_STORAGE_DEVICE, _model.getStorageType());
        unsigned int second = 0;
        _model.addBookMark(second);
        EXPECT_TRUE(isThere(root + "/.mw_temp.notes"));
        EXPECT_TRUE(stop());
        EXPECT_EQ(0u, _controller.getLastSavedPath().find(root + "/Sounds/Mewlo/")) << _controller.getLastSavedPath();
        EXPECT_FALSE(isThere(root + "/.mw_temp") || isThere(root + "/.mw_temp.notes"));
        EXPECT_TRUE(calls.has("recorder_release_temporary " + root + "/.mw_temp"));
    }
    setCard(true);
    _model.setStorageType(MW_STORAGE_CARD);
    EXPECT_EQ(card, _model.getStorageRoot()) << "the next recording asks again";
}

TEST_F(RecordingFlowTest, TooShortForAFullStorageIsGoneForGood)
{
    for (const auto& end : {std::function<void()>(interrupt), std::function<void()>(reachFreeSpace)}) {
        startRecording(900);
        end();
        EXPECT_TRUE(isReadySoon());
        EXPECT_TRUE(support::runUntil([] { return calls.has("recorder_release_temporary"); }));
        EXPECT_EQ(mwTranslate("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT"), fakes::desktop.lastMessage);
        EXPECT_FALSE(isThere(fakes::recorder.fileName) || isThere(fakes::recorder.fileName + ".notes"));
        calls.clear();
    }
}

TEST_F(RecordingFlowTest, AStopThatMeetsTheRecordersOwnIsASuccess)
{
    EXPECT_FALSE(stop()) << "nothing was recorded";
    startRecording();
    interrupt();
    EXPECT_TRUE(isReadySoon());
    EXPECT_TRUE(stop()) << "saved already";
    EXPECT_FALSE(dispatch(MwAppController::CANCEL_RECORDING)) << "not discarded";
    calls.clear();
    startRecording(10);
    interrupt();
    EXPECT_TRUE(isReadySoon());
    EXPECT_TRUE(dispatch(MwAppController::CANCEL_RECORDING)) << "discarded already";
    startRecording();
    calls.failWith("recorder_commit", -1);
    EXPECT_FALSE(stop());
    EXPECT_FALSE(stop()) << "nothing was saved";
}

TEST_F(RecordingFlowTest, AMicrophoneThatIsBackIsToldWhereItWasMissed)
{
    const auto& back = MwSignalMgr::MICROPHONE_BACK;
    for (const bool isMissing : {true, false}) {
        startRecording();
        vconf_set_int(VCONFKEY_MEWLO_MICROPHONE, isMissing ? 0 : 1);
        interrupt();
        EXPECT_TRUE(isReadySoon());
        MwSignalMgr::getInstance()->getSystemInfoSignal().emit(back);
        const std::string told = mwTranslate("IDS_MW_TPOP_A_MICROPHONE_IS_CONNECTED_AGAIN");
        EXPECT_EQ(isMissing, calls.has("post " + told));
        EXPECT_NE("", told);
        calls.clear();
    }
}

TEST_F(RecordingFlowTest, ARunningRecordingKeepsItsName)
{
    startRecording();
    const std::string name = _model.getCurrentRecordingFileName();
    support::addRecording(name + ".m4a", "of another instance");
    _model.updateLastRecordedFileNumber();
    _model.updateNextRecordingFileName();
    EXPECT_EQ(name, _model.getCurrentRecordingFileName());
    EXPECT_TRUE(stop());
    EXPECT_EQ(support::recordingPath(name + "_001.m4a"), _controller.getLastSavedPath());

    startRecording();
    const std::string longest(251, 'n'); // leaves no room for a counter
    _model.chooseCurrentRecordingFileName(longest);
    support::addRecording(longest + ".m4a", "of another instance");
    EXPECT_TRUE(stop());
    EXPECT_EQ(0u, _controller.getLastSavedPath().find(support::recordingPath("nnn")));
}

TEST_F(RecordingFlowTest, ARefusedStartGivesItsNameBack)
{
    for (const char* chosen : {"", "Talk"})
        for (const char* call : {"sound_manager_multi_session_set_mode", "recorder_create_audiorecorder",
                 "recorder_prepare", "recorder_start"}) {
            SCOPED_TRACE(call);
            _model.setRenameString(chosen);
            calls.failWith(call, -1);
            EXPECT_FALSE(dispatch(MwAppController::START_RECORDING));
            EXPECT_EQ(chosen, _model.getRenameString());
            calls.clear();
        }
    _model.setRenameString("");
    startRecording();
    EXPECT_EQ(mwTranslate("IDS_MW_BODY_DEFAULTNAME_VOICE") + " 001", _model.getCurrentRecordingFileName());
}

TEST_F(RecordingFlowTest, ARefusedResumeSaysWhy)
{
    startRecording();
    ASSERT_TRUE(dispatch(MwAppController::PAUSE_RECORDING));
    for (const auto& [code, message] :
        {std::pair{RECORDER_ERROR_SOUND_POLICY_BY_CALL, "IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS"},
            {RECORDER_ERROR_DEVICE, "IDS_MUSIC_TPOP_CANT_RECORD_VOICE"}}) {
        calls.failWith("recorder_start", code);
        EXPECT_FALSE(dispatch(MwAppController::RESUME_RECORDING));
        EXPECT_EQ(mwTranslate(message), fakes::desktop.lastMessage);
        EXPECT_EQ(REC_STATE_PAUSED, _model.getRecorderState());
    }
}

TEST_F(RecordingFlowTest, DiscardingReleasesThePowerLock)
{
    startRecording();
    calls.clear();
    EXPECT_TRUE(dispatch(MwAppController::CANCEL_RECORDING));
    EXPECT_TRUE(calls.has("device_power_release_lock 0"));
}

// What the next start finds: the recorder's service gives back what still lies in the temporary place.
void startAgain(MwModel& model, const std::string& temporary)
{
    fakes::recorder.onRescue = [&](const char*, recorder_leftover_cb callback, void* data) {
        if (!std::filesystem::exists(temporary))
            return 0;
        const std::string moved = temporary + "_rescued"; // as the service does
        std::filesystem::rename(temporary, moved);
        const bool hasNotes = std::filesystem::exists(temporary + ".notes");
        if (hasNotes)
            std::filesystem::rename(temporary + ".notes", moved + ".notes");
        callback(RECORDER_LEFTOVER_REBUILT, moved.c_str(), RECORDER_FILE_FORMAT_MP4, 5000,
            hasNotes ? (moved + ".notes").c_str() : nullptr, data);
        return 1;
    };
    MwRecordingRescue::run(model);
}

TEST_F(RecordingFlowTest, ASaveCutOffAnywhereLeavesOneRecordingWithItsMarks)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer ends forked children that start threads";
#endif
    using support::faults::Effect;
    for (const Effect effect : {Effect::FAIL, Effect::KILL}) {
        int point = 0;
        for (bool isOver = false; !isOver && !HasFailure();) {
            SCOPED_TRACE((effect == Effect::KILL ? "killed at call " : "failing call ") + std::to_string(++point));
            std::filesystem::remove_all(support::deviceRoot());
            std::filesystem::create_directories(support::deviceRoot());
            media_content_scan_all();
            startRecording();
            const std::string temporary = fakes::recorder.fileName;
            for (unsigned int second = 1; second <= 2; ++second) {
                _model.setElapsedTime(second * 1000);
                ASSERT_TRUE(_model.addBookMark(second));
            }
            if (effect == Effect::FAIL) {
                support::faults::arm("/", point, effect, EIO);
                stop();
                isOver = support::faults::count() < point;
                support::faults::disarm();
            } else {
                media_content_disconnect();
                const pid_t child = ::fork();
                if (child == 0) {
                    media_content_connect();
                    support::faults::arm("/", point, effect);
                    stop();
                    ::_exit(0);
                }
                int status = 0;
                ::waitpid(child, &status, 0);
                isOver = !WIFSIGNALED(status);
                media_content_connect();
                fakes::recorder.onStart = nullptr; // ends the take here, too, without a trace
                calls.failWith("recorder_commit", -1);
                stop();
                calls.clear();
                fakes::recorder.onStart = [] { support::writeFile(fakes::recorder.fileName, "sound"); };
            }
            startAgain(_model, temporary);
            media_content_scan_all();
            _model.createRecordedFileList();
            ASSERT_EQ(1U, _model.getRecordedFileList().size());
            const MwFileInfo& info = _model.getRecordedFileList().front();
            EXPECT_EQ("sound", support::readFile(info.path));
            EXPECT_EQ(2, bookmarksOf(info.mediaId));
            EXPECT_EQ(1, std::distance(std::filesystem::directory_iterator(support::recordingsDirectory()), {}));
            media_info_delete_from_db(info.mediaId.c_str());
        }
        EXPECT_GT(point, 5);
    }
}

TEST_F(RecordingFlowTest, MarksWaitBesideTheRecordingUntilTheirRowsAreThere)
{
    _model.setRenameString("Marked");
    startRecording();
    for (unsigned int second = 1; second <= 3; ++second) {
        _model.setElapsedTime(second * 1000);
        ASSERT_TRUE(_model.addBookMark(second));
    }
    EXPECT_EQ(0, bookmarksOf("none")) << "has the tables made";
    // The row can be written, the second of its marks cannot.
    execute("CREATE TRIGGER broken BEFORE INSERT ON bookmark WHEN NEW.BOOKMARK_MARKED_TIME = 2 "
            "BEGIN SELECT RAISE(ABORT, 'full'); END");
    EXPECT_TRUE(stop());
    execute("DROP TRIGGER broken");
    const std::string path = _controller.getLastSavedPath();
    const auto notes = MwRecordingNotes::load(MwRecordingNotes::pathForSaved(path));
    ASSERT_TRUE(notes);
    EXPECT_EQ(3u, notes->bookmarks.size());
    _model.createRecordedFileList();
    const std::string id = _model.getRecordedFileInfoByPath(path)->mediaId;
    EXPECT_EQ(0, bookmarksOf(id)) << "all or none";
    // As an earlier version left it: one of three.
    media_bookmark_insert_to_db(id.c_str(), 2, "mine");
    MwRecordingRescue::run(_model);
    EXPECT_EQ(3, bookmarksOf(id));
    EXPECT_FALSE(isThere(MwRecordingNotes::pathForSaved(path)));
}

}
