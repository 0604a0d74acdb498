#pragma once

#include <MainLoopMailbox.h>
#include <Mutex.h>
#include <player.h>

#include <functional>
#include <memory>
#include <string>

#include "MwPlayer.h"
#include "MwRecorder.h"
#include "MwSignalMgr.h"
#include <panekit/WSignal.h>

class MwAvrcp;
class MwMediaKeys;
class MwModel;
class MwRemoteControl;
class MwSoundSession;

namespace panekit {
class WPopupController;
class WWindowController;
}

// Owns the media engines and is the only place that starts, pauses, moves or stops them. Everybody else sends commands:
// synchronously on the main loop, or through one worker that executes them in order and reports each result on the main
// loop. A command never overlaps another one: the main loop waits for the worker's command and the other way round.
class MwAppController {
public:
    // In the order of their numbers, which are logged.
    enum Command : unsigned {
        START_RECORDING,
        PAUSE_RECORDING,
        RESUME_RECORDING,
        CANCEL_RECORDING,
        STOP_RECORDING,
        STOP_RECORDING_INTERRUPTED,
        START_PLAYING,
        PAUSE_PLAYING,
        RESUME_PLAYING,
        STOP_PLAYING,
        PLAY_PREVIOUS,
        PLAY_NEXT,
        SET_PLAYER_POSITION,
        RESTART_PLAYING,
    };
    enum Result : int { SUCCESS, FAIL };
    // Called on the main loop.
    using AsyncCallback = std::function<void(Command command, Result result, void* userData)>;

    MwAppController();
    virtual ~MwAppController();
    MwAppController(const MwAppController&) = delete;
    MwAppController& operator=(const MwAppController&) = delete;

    // Model and window controller are borrowed until deinitialize.
    bool initialize(MwModel* model, panekit::WWindowController* windowController);
    void deinitialize();

    // Executes at once; false when it was refused or failed.
    bool dispatchCommand(Command command);
    // Queues for the worker. True also for a repeat of the waiting head command, whose callback is then never called.
    bool dispatchCommandAsync(Command command, AsyncCallback callback, void* userData);

    panekit::WSignal<void()>& getPlayerUpdatedSignal() { return _playerUpdatedSignal; }
    panekit::WSignal<void()>& getRecorderUpdatedSignal() { return _recorderUpdatedSignal; }

    // What opens the recordings after a stop, unless the recording is all that a request can get: then it is the
    // answer. Handed in at start-up so that the controller knows no screen.
    void setRecordingsOpener(std::function<void()> opener) { _recordingsOpener = std::move(opener); }
    void openRecordings();

    // Request mode: answers the caller with the recording and ends this instance.
    void replyAndExit();

    // The path of the last recording saved by this process; empty when none.
    [[nodiscard]] std::string getLastSavedPath() const;

private:
    class AsyncCmdControl;
    struct AsyncRequest;

    void _initAsyncCmdControl();
    void _deinitAsyncCmdControl();
    void _executeAsyncRequest(std::unique_ptr<AsyncRequest> request);
    void _callSafetyMainThread(std::function<void()> closure);

    bool _createRecorder();
    bool _destroyRecorder();
    bool _createPlayer();
    bool _destroyPlayer();
    void _destroyRecorderHandle();

    bool _execute(Command command);
    bool _executeStart();
    bool _executePauseRecording();
    bool _executeResumeRecording();
    bool _executeCancel();
    bool _executeStop(bool interrupted);
    bool _executeStartPlaying();
    bool _executePausePlaying();
    bool _executeResumePlaying();
    bool _executeStopPlaying();
    bool _executePlayPrevious();
    bool _executePlayNext();
    bool _executeRestartPlaying();

    bool _startRecording();
    bool _pauseRecording();
    bool _resumeRecording();
    bool _cancelRecording(bool interrupted);
    bool _stopRecording(bool interrupted);
    bool _commitRecording(bool interrupted);
    bool _isOver() const;
    void _releaseTemporaryFile();
    bool _replyWithRecording();
    void _recorderLimitReached(MwRecorder::LimitType type);
    void _recorderInterrupted();
    void _systemInfoChanged(MwSignalMgr::SystemInfo info);
    void _stoppedByItself(Result result);
    bool _saveRecordingFile();
    bool _checkRecordedFileDir();
    bool _moveTempRecordingFile(const char* destFilePath);
    void _insertRecordedFileToDB(const char* filePath, std::string& mediaId);
    bool _insertBookmarkList(const std::string& mediaId);
    void _emitSignalAfterStopRecording(bool interrupted);
    void _chooseName();
    bool _setUpRecording();
    bool _setUpRecorder();
    static void _postStartFailure(MwRecorder::ErrorType error);

    bool _startPlaying();
    bool _pausePlaying();
    bool _resumePlaying();
    bool _stopPlaying();
    bool _setPlayerPosition(unsigned int position);
    bool _isPlayingAllowed();
    bool _refusedByRecording();
    bool _playOther(const std::string& path);
    void _closePlayView();
    void _playerCompleted();
    void _playerInterrupted(player_interrupted_code_e code);
    void _playerErrorOccurred(MwPlayer::PlayerErrorType type);

    void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    void _pauseInRequestMode();
    void _recorderErrorOccurred(MwRecorder::ErrorType type);
    void _createMediaKeys();
    void _seekByRemote(unsigned int position);

    void _emitPlayerUpdatedSignal();
    void _emitRecorderUpdatedSignal();
    void _createErrorPopup(const char* text);
    bool _sendMessagePort();
    void _requestLock();
    void _releaseLock();

    panekit::WWindowController* _windowController = nullptr;
    MwModel* _model = nullptr;
    std::unique_ptr<MwSoundSession> _soundSession;
    std::unique_ptr<MwRecorder> _recorder;
    std::unique_ptr<MwPlayer> _player;
    std::unique_ptr<MwAvrcp> _avrcp;
    std::unique_ptr<MwRemoteControl> _remoteControl;
    std::unique_ptr<MwMediaKeys> _mediaKeys; // outlives the mailbox that it posts to
    bool _resumeAfterInterruption = false;
    unsigned int _lifeCycleListener = 0;
    unsigned int _systemInfoListener = 0;
    bool _missesMicrophone = false; // the last recording ended without one; main loop
    unsigned int _recorderErrorListener = 0;
    unsigned int _recorderInterruptedListener = 0;
    unsigned int _recorderLimitListener = 0;
    unsigned int _playerCompletedListener = 0;
    unsigned int _playerInterruptedListener = 0;
    unsigned int _playerErrorListener = 0;
    panekit::WSignal<void()> _playerUpdatedSignal;
    panekit::WSignal<void()> _recorderUpdatedSignal;
    std::unique_ptr<AsyncCmdControl> _asyncCmdControl;
    panekit::WPopupController* _errorPopup = nullptr;
    platform::MainLoopMailbox _mailbox;
    std::function<void()> _recordingsOpener;
    // Held for the whole execution of a command, by whichever thread executes it; recursive, for what a command tells
    // its listeners may make them send another.
    mutable platform::RecursiveMutex _commandMutex;
    std::string _lastSavedPath; // of this process; empty while or after one that was not saved
    bool _wasDiscarded = false; // the last recording of this process
    std::string _stopReason; // identifier of the message that says why a recording ended by itself
};
