#include "MwAppController.h"

#include <gtest/gtest.h>
#include <panekit/WWindowController.h>

#include <future>

#include "MwModel.h"
#include "MwRecordingNotes.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "fakes/Fakes.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

using Command = MwAppController::Command;
using fakes::calls;

class MwAppControllerTest : public ::testing::Test {
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
        _controller.setRecordingsOpener([this] { ++_opened; });
        fakes::recorder.onStart = [] { support::writeFile(fakes::recorder.fileName, "sound"); };
        calls.clear();
    }
    void TearDown() override
    {
        _controller.deinitialize();
        MwSystemMgr::destroyInstance();
        media_content_disconnect();
    }
    bool dispatch(Command command) { return _controller.dispatchCommand(command); }
    void startRecording(unsigned long long elapsed = 5000)
    {
        ASSERT_TRUE(dispatch(MwAppController::START_RECORDING));
        _model.setElapsedTime(elapsed);
    }
    // Queues a command and waits for its result.
    std::optional<int> dispatchAsync(Command command)
    {
        std::optional<int> result;
        const auto done = [&](Command, MwAppController::Result answer, void*) { result = answer; };
        EXPECT_TRUE(_controller.dispatchCommandAsync(command, done, nullptr));
        support::runUntil([&] { return result.has_value(); });
        return result;
    }
    MwRecorderState state() const { return _model.getRecorderState(); }
    static void key(media_key_e which, media_key_event_e status = MEDIA_KEY_STATUS_RELEASED)
    {
        fakes::desktop.mediaKey(which, status, fakes::desktop.mediaKeyData);
    }
    static void lifeCycle(MwSignalMgr::LifeCycle value)
    {
        MwSignalMgr::getInstance()->getLifeCycleSignal().emit(value);
    }

    MwModel _model;
    panekit::WWindowController _window{"test", 1};
    MwAppController _controller;
    int _opened = 0;
};

TEST_F(MwAppControllerTest, RecordsPausesResumesAndSaves)
{
    int updates = 0;
    _controller.getRecorderUpdatedSignal().addListener([&] { ++updates; });
    startRecording();
    EXPECT_EQ(REC_STATE_RECORDING, state());
    EXPECT_TRUE(calls.has("usage app_id=com.tovanic.mewlo-lite feature=RECO extra=Normal Mode value=-"));
    EXPECT_TRUE(calls.has("device_power_request_lock 0"));
    EXPECT_TRUE(calls.has("media_key_reserve"));
    EXPECT_TRUE(dispatch(MwAppController::PAUSE_RECORDING));
    EXPECT_FALSE(dispatch(MwAppController::PAUSE_RECORDING));
    EXPECT_TRUE(calls.has("device_power_release_lock 0"));
    EXPECT_TRUE(dispatch(MwAppController::RESUME_RECORDING));
    unsigned int second = 0;
    ASSERT_TRUE(_model.addBookMark(second));
    const std::string name = _model.getCurrentRecordingFileName();
    EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
    EXPECT_EQ(REC_STATE_READY, state());
    EXPECT_EQ(4, updates) << "start, pause, resume, stop; the refused pause changes nothing";
    EXPECT_EQ("sound", support::readFile(support::recordingPath(name + ".m4a")));
    EXPECT_EQ(support::recordingPath(name + ".m4a"), _controller.getLastSavedPath());
    EXPECT_TRUE(calls.has("usage app_id=com.tovanic.mewlo-lite feature=SAVE"));
    EXPECT_TRUE(calls.has("recorder_release_temporary"));
    EXPECT_TRUE(calls.has("recorder_destroy"));
    EXPECT_FALSE(calls.has("post")) << "in the foreground the screen tells";
    EXPECT_FALSE(std::filesystem::exists(MwRecordingNotes::pathFor(_model.getTemporaryFilePath())));
    _model.createRecordedFileList();
    const MwFileInfo* info = _model.getRecordedFileInfoByPath(_controller.getLastSavedPath());
    ASSERT_NE(nullptr, info);
    int bookmarks = 0;
    media_info_get_bookmark_count_from_db(info->mediaId.c_str(), nullptr, &bookmarks);
    EXPECT_EQ(1, bookmarks);
}

TEST_F(MwAppControllerTest, ARefusedStartLeavesNothingBehind)
{
    struct {
        const char* call;
        int code;
        const char* message;
    } const cases[] = {
        {"sound_manager_multi_session_set_option", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL,
            "IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS"},
        {"sound_manager_multi_session_set_mode", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM,
            "IDS_MUSIC_TPOP_CANT_RECORD_VOICE"},
        {"recorder_prepare", RECORDER_ERROR_SOUND_POLICY_BY_CALL, "IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS"},
        {"recorder_prepare", RECORDER_ERROR_SECURITY_RESTRICTED, "IDS_MUSIC_TPOP_CANT_RECORD_VOICE"},
        {"recorder_start", RECORDER_ERROR_OUT_OF_STORAGE, "IDS_MW_POP_NOT_ENOUGH_MEMORY_DELETE_SOME_ITEMS"},
        {"recorder_start", RECORDER_ERROR_DEVICE, "IDS_MUSIC_TPOP_CANT_RECORD_VOICE"},
    };
    for (const auto& c : cases) {
        calls.clear();
        calls.failWith(c.call, c.code);
        EXPECT_FALSE(dispatch(MwAppController::START_RECORDING)) << c.call;
        EXPECT_EQ(mwTranslate(c.message), fakes::desktop.lastMessage);
        EXPECT_EQ(REC_STATE_READY, state());
        EXPECT_FALSE(calls.has("device_power_request_lock") || calls.has("media_key_reserve") || calls.has("usage"));
        calls.clear();
        EXPECT_TRUE(dispatch(MwAppController::START_RECORDING)) << "works again after " << c.call;
        _model.setElapsedTime(10);
        EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
    }
    calls.clear();
    fakes::recorder.someoneRecords = true;
    EXPECT_FALSE(dispatch(MwAppController::START_RECORDING));
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_UNABLE_TO_START_NEW_RECORDING_OTHER_APP_ALREADY_RECORDING"),
        fakes::desktop.lastMessage);
    EXPECT_FALSE(calls.has("sound_manager"));
    fakes::recorder.someoneRecords = false;
    startRecording();
    calls.clear();
    EXPECT_FALSE(dispatch(MwAppController::START_RECORDING)) << "one is running";
    EXPECT_FALSE(calls.has("sound_manager"));
}

TEST_F(MwAppControllerTest, TooShortIsDiscardedAndReleasesItsNumber)
{
    startRecording(999);
    const std::string name = _model.getCurrentRecordingFileName();
    unsigned int second = 0;
    _model.addBookMark(second);
    EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT"), fakes::desktop.lastMessage);
    EXPECT_TRUE(calls.has("recorder_cancel"));
    EXPECT_TRUE(_model.getBookmarkList().empty());
    startRecording(1000);
    EXPECT_EQ(name, _model.getCurrentRecordingFileName());
    calls.clear();
    EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
    EXPECT_TRUE(calls.has("recorder_commit"));
}

TEST_F(MwAppControllerTest, ChosenNamesAreUsedOnceAndNeverOverwrite)
{
    for (const char* expected : {"Talk.m4a", "Talk_001.m4a", "Talk_002.m4a"}) {
        _model.setRenameString("Talk");
        startRecording();
        EXPECT_EQ("", _model.getRenameString());
        _model.updateNextRecordingFileName(); // the screen does, when it comes back from the background
        fakes::recorder.onCommit = [expected] { support::writeFile(fakes::recorder.fileName, expected); };
        EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
        EXPECT_EQ(expected, support::readFile(support::recordingPath(expected)));
        EXPECT_EQ("Talk", _model.getCurrentRecordingFileName());
    }
    startRecording();
    EXPECT_EQ(mwTranslate("IDS_MW_BODY_DEFAULTNAME_VOICE") + " 001", _model.getCurrentRecordingFileName());
}

TEST_F(MwAppControllerTest, InterruptionsSaveWithoutAskingTheRecorder)
{
    startRecording();
    calls.clear();
    fakes::recorder.state = RECORDER_STATE_READY;
    fakes::recorder.interrupted(
        RECORDER_POLICY_DEVICE_LOST, RECORDER_STATE_RECORDING, RECORDER_STATE_READY, fakes::recorder.userData);
    EXPECT_TRUE(support::runUntil([&] { return _opened == 1; }));
    EXPECT_FALSE(calls.has("recorder_commit"));
    EXPECT_FALSE(calls.has("usage"));
    EXPECT_NE("", _controller.getLastSavedPath());
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_RECORDING_INTERRUPTED_WHAT_WAS_RECORDED_IS_SAVED"), fakes::desktop.lastMessage);

    startRecording(10);
    calls.clear();
    fakes::recorder.state = RECORDER_STATE_READY;
    fakes::recorder.interrupted(
        RECORDER_POLICY_SOUND, RECORDER_STATE_RECORDING, RECORDER_STATE_READY, fakes::recorder.userData);
    EXPECT_TRUE(support::runUntil([&] { return _opened == 2; }));
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT"), fakes::desktop.lastMessage);
    EXPECT_FALSE(calls.has("recorder_cancel"));
    EXPECT_FALSE(std::filesystem::exists(fakes::recorder.fileName));
}

TEST_F(MwAppControllerTest, LimitsStopAndOpenTheRecordingsOnlyInTheForeground)
{
    startRecording();
    fakes::recorder.limitReached(RECORDER_RECORDING_LIMIT_SIZE, fakes::recorder.userData);
    EXPECT_TRUE(support::runUntil([&] { return _opened == 1; }));
    EXPECT_EQ(REC_STATE_READY, state());
    startRecording();
    _model.setAppState(MwModel::APP_STATE_PAUSED);
    const std::string name = _model.getCurrentRecordingFileName();
    calls.clear();
    fakes::recorder.limitReached(RECORDER_RECORDING_LIMIT_FREE_SPACE, fakes::recorder.userData);
    EXPECT_TRUE(support::runUntil([&] { return fakes::log.has("recording stop success"); }));
    EXPECT_EQ(1, _opened);
    EXPECT_TRUE(calls.has("post " + name + " " + mwTranslate("IDS_MW_POP_SAVED")));
    EXPECT_EQ(mwTranslate("IDS_MW_POP_NOT_ENOUGH_MEMORY_DELETE_SOME_ITEMS"), fakes::desktop.lastMessage);
}

TEST_F(MwAppControllerTest, AFailedCommitOrMoveLosesNothing)
{
    startRecording();
    calls.failWith("recorder_commit", -1);
    EXPECT_FALSE(dispatch(MwAppController::STOP_RECORDING));
    EXPECT_EQ(REC_STATE_READY, state());
    EXPECT_TRUE(std::filesystem::exists(fakes::recorder.fileName));
    EXPECT_FALSE(calls.has("recorder_release_temporary")) << "the claim keeps the file safe";
    calls.clear();
    support::writeFile(support::deviceRoot() + "/Sounds", "a file where the directory should be");
    startRecording();
    EXPECT_FALSE(dispatch(MwAppController::STOP_RECORDING));
    EXPECT_TRUE(std::filesystem::exists(fakes::recorder.fileName));
    EXPECT_FALSE(calls.has("recorder_release_temporary"));
}

TEST_F(MwAppControllerTest, ARowThatCannotBeWrittenKeepsFileAndBookmarks)
{
    startRecording();
    unsigned int second = 0;
    _model.addBookMark(second);
    media_content_disconnect();
    EXPECT_FALSE(dispatch(MwAppController::STOP_RECORDING));
    const std::string path = _controller.getLastSavedPath();
    EXPECT_EQ("sound", support::readFile(path));
    const auto notes = MwRecordingNotes::load(MwRecordingNotes::pathForSaved(path));
    ASSERT_TRUE(notes);
    EXPECT_EQ(1u, notes->bookmarks.size());
    media_content_connect();
}

TEST_F(MwAppControllerTest, RefusesUnknownCommandsAndWorksOnlyWhileInitialized)
{
    EXPECT_FALSE(dispatch(static_cast<Command>(14)));
    EXPECT_TRUE(fakes::log.has("invalid command"));
    EXPECT_TRUE(calls.all().empty());
    EXPECT_FALSE(dispatch(MwAppController::STOP_RECORDING) || dispatch(MwAppController::RESUME_RECORDING));
    _controller.deinitialize();
    EXPECT_FALSE(dispatch(MwAppController::START_RECORDING));
    EXPECT_FALSE(_controller.dispatchCommandAsync(MwAppController::START_RECORDING, {}, nullptr));
    EXPECT_TRUE(fakes::log.has("aync command control is not working"));
    EXPECT_FALSE(MwAppController().initialize(nullptr, &_window) || MwAppController().initialize(&_model, nullptr));
}

TEST_F(MwAppControllerTest, WorkerExecutesInOrderAndDropsRepeatsOfTheWaitingHead)
{
    std::promise<void> entered;
    std::promise<void> go;
    fakes::recorder.onStart = [&] {
        entered.set_value();
        go.get_future().wait();
    };
    std::string heard;
    const auto note = [&](Command command, MwAppController::Result result, void* data) {
        heard += std::to_string(command) + (result == MwAppController::SUCCESS ? "s" : "f")
            + static_cast<const char*>(data);
    };
    char first[] = "a ", second[] = "b ", third[] = "c ", fourth[] = "d ";
    std::thread sender([&] {
        _controller.dispatchCommandAsync(MwAppController::START_RECORDING, note, first);
        entered.get_future().wait();
        // From here on the worker holds the mutex: let it go from a third thread, or this one would wait for ever.
        std::thread opener([&] { go.set_value(); });
        const auto lockedUntilDone = _controller.dispatchCommandAsync(MwAppController::PAUSE_RECORDING, note, second);
        EXPECT_TRUE(lockedUntilDone);
        EXPECT_EQ(REC_STATE_RECORDING, state() == REC_STATE_PAUSED ? REC_STATE_RECORDING : state())
            << "the sender waited for the running command";
        opener.join();
    });
    sender.join();
    EXPECT_TRUE(support::runUntil([&] { return heard == "0sa 1sb "; })) << heard;
    {
        // While this thread is inside a command nothing leaves the queue.
        fakes::recorder.onStart = nullptr;
        int refused = 0;
        const unsigned int listener = _controller.getRecorderUpdatedSignal().addListener([&] {
            if (refused++ > 0)
                return;
            _controller.dispatchCommandAsync(MwAppController::PAUSE_RECORDING, note, third);
            _controller.dispatchCommandAsync(
                MwAppController::PAUSE_RECORDING, note, fourth); // repeats the head: dropped
        });
        EXPECT_TRUE(dispatch(MwAppController::RESUME_RECORDING));
        EXPECT_TRUE(support::runUntil([&] { return heard == "0sa 1sb 1sc "; })) << heard;
        _controller.getRecorderUpdatedSignal().removeListener(listener);
    }
    EXPECT_TRUE(fakes::log.has("same as previous command. so skip this"));
}

TEST_F(MwAppControllerTest, EndingExecutesWhatIsQueuedAndSavesTheRecording)
{
    bool called = false;
    _controller.dispatchCommandAsync(
        MwAppController::START_RECORDING, [&](Command, MwAppController::Result, void*) { called = true; }, nullptr);
    ASSERT_TRUE(support::runUntil([&] { return called; }));
    _model.setElapsedTime(3000);
    calls.clear();
    lifeCycle(MwSignalMgr::TERMINATE);
    EXPECT_TRUE(calls.has("recorder_commit"));
    EXPECT_EQ(REC_STATE_NONE, state());
    EXPECT_TRUE(std::filesystem::exists(_controller.getLastSavedPath()));
    EXPECT_TRUE(calls.has("bt_deinitialize"));
}

TEST_F(MwAppControllerTest, IndicatorShowsWhatRunsInTheBackground)
{
    startRecording();
    EXPECT_EQ("mewlo_none", fakes::desktop.indicator.back());
    _model.setAppState(MwModel::APP_STATE_PAUSED);
    lifeCycle(MwSignalMgr::PAUSE);
    EXPECT_EQ("bg_recording_start", fakes::desktop.indicator.back());
    dispatch(MwAppController::PAUSE_RECORDING);
    EXPECT_EQ("bg_recording_pause", fakes::desktop.indicator.back());
    dispatch(MwAppController::STOP_RECORDING);
    EXPECT_EQ("mewlo_none", fakes::desktop.indicator.back());
    EXPECT_TRUE(calls.has("message_port_send_message com.tovanic.indicator mewlo_indicator_port"));
    calls.clear();
    calls.failWith("message_port_check_remote_port", -2);
    lifeCycle(MwSignalMgr::RESUME);
    EXPECT_FALSE(calls.has("message_port_send_message"));
}

TEST_F(MwAppControllerTest, PauseInRequestModeSavesRepliesAndExits)
{
    _model.setRequestMode(true);
    app_control_h request = fakes::makeRequest(APP_CONTROL_OPERATION_CREATE_CONTENT);
    _model.setRequestHandle(request);
    startRecording(200);
    EXPECT_TRUE(calls.has("device_power_request_lock 2")) << "the display stays on";
    lifeCycle(MwSignalMgr::PAUSE);
    EXPECT_EQ(APP_CONTROL_RESULT_SUCCEEDED, fakes::reply.result);
    EXPECT_EQ(_controller.getLastSavedPath(), fakes::reply.extras[APP_CONTROL_DATA_SELECTED]);
    EXPECT_TRUE(std::filesystem::exists(_controller.getLastSavedPath()));
    EXPECT_EQ(nullptr, _model.getRequestHandle());
    EXPECT_TRUE(calls.has("ui_app_exit"));

    _model.setRequestHandle(request);
    startRecording();
    EXPECT_TRUE(dispatch(MwAppController::CANCEL_RECORDING));
    lifeCycle(MwSignalMgr::PAUSE);
    EXPECT_EQ(APP_CONTROL_RESULT_FAILED, fakes::reply.result);
    EXPECT_TRUE(fakes::reply.extras.empty()) << "a discarded one is no answer";
    _model.setRequestHandle(request);
    calls.clear();
    calls.failWith("app_control_create", -1);
    lifeCycle(MwSignalMgr::PAUSE);
    EXPECT_FALSE(calls.has("ui_app_exit"));
    app_control_destroy(request);
}

TEST_F(MwAppControllerTest, ASavedRecordingIsTheAnswerWhateverEndsTheRequest)
{
    struct {
        const char* way;
        std::function<void()> end;
    } const ways[] = {
        {"the list would open", [&] { _controller.openRecordings(); }},
        {"the window is closed", [&] { _controller.deinitialize(); }},
    };
    for (const auto& [way, end] : ways) {
        SCOPED_TRACE(way);
        app_control_h request = fakes::makeRequest(APP_CONTROL_OPERATION_CREATE_CONTENT);
        _model.setRequestMode(true);
        _model.setRequestHandle(request);
        _model.setRenameString(way);
        startRecording();
        EXPECT_TRUE(dispatch(MwAppController::STOP_RECORDING));
        const std::string path = _controller.getLastSavedPath();
        end();
        EXPECT_EQ(APP_CONTROL_RESULT_SUCCEEDED, fakes::reply.result);
        EXPECT_EQ(path, fakes::reply.extras[APP_CONTROL_DATA_SELECTED]);
        EXPECT_EQ(nullptr, _model.getRequestHandle());
        fakes::reply = {};
        app_control_destroy(request);
        std::filesystem::remove_all(support::recordingsDirectory());
    }
    EXPECT_EQ(0, _opened) << "there was nothing to choose";
}

TEST_F(MwAppControllerTest, MediaKeysDriveTheRecording)
{
    constexpr auto RUNS = REC_STATE_RECORDING;
    constexpr auto RESTS = REC_STATE_PAUSED;
    startRecording(5000);
    struct {
        media_key_e key;
        MwRecorderState afterRunning;
        MwRecorderState afterResting;
    } const cases[] = {{MEDIA_KEY_PLAY, RUNS, RUNS}, {MEDIA_KEY_PAUSE, RESTS, RESTS},
        {MEDIA_KEY_PLAYPAUSE, RESTS, RUNS}, {MEDIA_KEY_MEDIA, RESTS, RUNS}, {MEDIA_KEY_RECORD, RUNS, RUNS},
        {MEDIA_KEY_NEXT, RUNS, RESTS}, {MEDIA_KEY_FASTFORWARD, RUNS, RESTS}};
    for (const auto& c : cases)
        for (const auto& [before, after] : {std::pair{RUNS, c.afterRunning}, {RESTS, c.afterResting}}) {
            if (state() != before)
                dispatch(before == RUNS ? MwAppController::RESUME_RECORDING : MwAppController::PAUSE_RECORDING);
            key(c.key, MEDIA_KEY_STATUS_PRESSED);
            EXPECT_EQ(before, state());
            key(c.key);
            EXPECT_EQ(after, state()) << c.key << " while " << mwNumber(before);
        }
    EXPECT_EQ(5000, fakes::desktop.remote.position(fakes::desktop.remoteData));
    key(MEDIA_KEY_STOP);
    EXPECT_TRUE(support::runUntil([&] { return state() == REC_STATE_READY; }));
    EXPECT_TRUE(std::filesystem::exists(_controller.getLastSavedPath()));
    EXPECT_FALSE(calls.has("player_"));
}

class MwPlaybackTest : public MwAppControllerTest {
protected:
    void SetUp() override
    {
        MwAppControllerTest::SetUp();
        for (const char* name : {"one.m4a", "two.m4a", "three.m4a"})
            support::addRecording(name);
        _model.createRecordedFileList();
        _model.setCurrentPlayPath(support::recordingPath("one.m4a"));
    }
    bool play() { return dispatch(MwAppController::START_PLAYING); }
    MwPlayerState playing() const { return _model.getPlayerState(); }
    static void interrupt(player_interrupted_code_e code, player_state_e state)
    {
        fakes::player.state = state;
        fakes::player.interrupted(code, fakes::player.userData);
    }
};

TEST_F(MwPlaybackTest, IsRefusedDuringCallsAndRecordings)
{
    fakes::desktop.liveCalls = 1;
    EXPECT_FALSE(play());
    EXPECT_EQ(mwTranslate("IDS_FM_TPOP_CANT_PLAY_RECORDINGS_DURING_CALLS"), fakes::desktop.lastMessage);
    fakes::desktop.liveCalls = 0;
    fakes::recorder.someoneRecords = true;
    EXPECT_FALSE(play() || dispatch(MwAppController::PLAY_NEXT) || dispatch(MwAppController::PLAY_PREVIOUS));
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_CANT_PLAY_RECORDINGS_WHILE_RECORDING_AUDIO"), fakes::desktop.lastMessage);
    fakes::recorder.someoneRecords = false;
    EXPECT_FALSE(calls.has("player_"));
    calls.failWith("player_prepare", -1);
    EXPECT_FALSE(play());
    EXPECT_EQ(mwTranslate("IDS_MW_POP_UNABLE_TO_PLAY"), fakes::desktop.lastMessage);
}

TEST_F(MwPlaybackTest, SeeksRefusePauseAndStepsFollowTheList)
{
    ASSERT_TRUE(play());
    EXPECT_TRUE(dispatch(MwAppController::SET_PLAYER_POSITION));
    EXPECT_FALSE(dispatch(MwAppController::PAUSE_PLAYING));
    EXPECT_EQ(PLAY_STATE_PLAYING, playing());
    fakes::player.seekCompleted(fakes::player.userData);
    _model.setCurrentPlayPosition(3001);
    EXPECT_TRUE(dispatch(MwAppController::PLAY_PREVIOUS));
    EXPECT_TRUE(calls.has("player_set_play_position 0"));
    fakes::player.seekCompleted(fakes::player.userData);
    bool closed = false;
    MwSignalMgr::getInstance()->getPlayViewClosedSignal().addListener([&] { closed = true; });
    _model.setPlayViewShown(true);
    const std::string expected = *_model.getPreviousPlayPath();
    _model.setCurrentPlayPosition(3000);
    EXPECT_TRUE(dispatch(MwAppController::PLAY_PREVIOUS));
    EXPECT_EQ(expected, _model.getCurrentPlayPath());
    EXPECT_TRUE(closed);
    _model.setCurrentPlayPath("/gone.m4a");
    _model.setCurrentPlayPosition(0);
    EXPECT_TRUE(dispatch(MwAppController::PLAY_NEXT));
    EXPECT_EQ(PLAY_STATE_NONE, playing());
    EXPECT_FALSE(dispatch(MwAppController::PLAY_PREVIOUS));
    EXPECT_TRUE(fakes::log.has("getPreviousPlayPath failed!!!"));
}

TEST_F(MwPlaybackTest, RemoteControlsSeeTheRecordingAndSeekInIt)
{
    const auto& remote = fakes::desktop.remote;
    remote_player_track_s track{};
    ASSERT_TRUE(play());
    ASSERT_TRUE(remote.track(&track, fakes::desktop.remoteData));
    EXPECT_EQ(_model.getCurrentPlayPath(), support::recordingPath(std::string(track.title) + ".m4a"));
    int updates = 0;
    _controller.getPlayerUpdatedSignal().addListener([&] { ++updates; });
    remote.seek(7000, fakes::desktop.remoteData);
    EXPECT_TRUE(calls.has("player_set_play_position 7000"));
    EXPECT_EQ(7000, remote.position(fakes::desktop.remoteData));
    EXPECT_EQ(7000, fakes::desktop.seekedTo);
    EXPECT_EQ(1, updates);
    _model.setCurrentPlayPath("");
    EXPECT_FALSE(remote.track(&track, fakes::desktop.remoteData));
    _controller.deinitialize();
    EXPECT_EQ(nullptr, fakes::desktop.remote.seek);
}

TEST_F(MwPlaybackTest, ResumesAfterACallButNotAfterAnUnpluggedHeadset)
{
    for (const auto& [code, resumes] : std::map<player_interrupted_code_e, bool>{{PLAYER_INTERRUPTED_BY_CALL, true},
             {PLAYER_INTERRUPTED_BY_ALARM, true}, {PLAYER_INTERRUPTED_BY_NOTIFICATION, true},
             {PLAYER_INTERRUPTED_BY_EARJACK_UNPLUG, false}, {PLAYER_INTERRUPTED_BY_MEDIA, false}}) {
        ASSERT_TRUE(play());
        interrupt(code, PLAYER_STATE_PAUSED);
        EXPECT_EQ(PLAY_STATE_PAUSED, playing());
        calls.clear();
        interrupt(PLAYER_INTERRUPTED_COMPLETED, PLAYER_STATE_PAUSED);
        EXPECT_EQ(resumes ? PLAY_STATE_PLAYING : PLAY_STATE_PAUSED, playing()) << code;
        EXPECT_EQ(resumes, !calls.has("device_power_release_lock")) << "locked while it plays";
        dispatch(MwAppController::STOP_PLAYING);
        EXPECT_TRUE(support::runUntil([] { return calls.has("bt_avrcp_target_notify_player_state 0"); }));
    }
    // A call that ended unheard is not what a later interruption waits for.
    ASSERT_TRUE(play());
    interrupt(PLAYER_INTERRUPTED_BY_CALL, PLAYER_STATE_PAUSED);
    ASSERT_TRUE(dispatch(MwAppController::STOP_PLAYING) && play());
    interrupt(PLAYER_INTERRUPTED_BY_EARJACK_UNPLUG, PLAYER_STATE_PAUSED);
    interrupt(PLAYER_INTERRUPTED_COMPLETED, PLAYER_STATE_PAUSED);
    EXPECT_EQ(PLAY_STATE_PAUSED, playing());
}

TEST_F(MwPlaybackTest, HeldKeysSeekInGrowingStepsAndShortOnesStep)
{
    ASSERT_TRUE(play());
    key(MEDIA_KEY_FASTFORWARD, MEDIA_KEY_STATUS_PRESSED);
    const std::string next = *_model.getNextPlayPath();
    key(MEDIA_KEY_FASTFORWARD);
    EXPECT_EQ(next, _model.getCurrentPlayPath());
    _model.setCurrentPlayPosition(9000);
    fakes::player.position = 9000;
    calls.clear();
    key(MEDIA_KEY_REWIND, MEDIA_KEY_STATUS_PRESSED);
    EXPECT_TRUE(support::runUntil([&] { return calls.count("player_set_play_position") == 2; }));
    EXPECT_EQ("player_set_play_position 6000", calls.matching("player_set_play_position")[0]);
    EXPECT_EQ("player_set_play_position 3000", calls.matching("player_set_play_position")[1])
        << "from 9000 again, by 6000";
    key(MEDIA_KEY_REWIND);
    EXPECT_EQ(next, _model.getCurrentPlayPath());
    EXPECT_EQ(2u, calls.count("player_set_play_position"));
    ASSERT_TRUE(support::execute("UPDATE media SET MEDIA_DURATION=14000"));
    _model.setCurrentPlayPosition(9000);
    calls.clear();
    key(MEDIA_KEY_FASTFORWARD, MEDIA_KEY_STATUS_PRESSED);
    EXPECT_TRUE(support::runUntil([&] { return calls.count("player_set_play_position") == 2; }));
    key(MEDIA_KEY_FASTFORWARD);
    EXPECT_EQ("player_set_play_position 12000", calls.matching("player_set_play_position")[0]);
    EXPECT_EQ("player_set_play_position 14000", calls.matching("player_set_play_position")[1]) << "the very end";
}

}
