#pragma once

#include <Mutex.h>

#include <panekit/WTimer.h>

#include "MwPlayer.h"

// The state and work behind MwPlayer. The service player exists only while something plays or is paused.
class _MwPlayerImpl {
public:
    explicit _MwPlayerImpl(MwModel* model);
    ~_MwPlayerImpl();
    _MwPlayerImpl(const _MwPlayerImpl&) = delete;
    _MwPlayerImpl& operator=(const _MwPlayerImpl&) = delete;

    bool _start();
    bool _pause();
    bool _resume();
    bool _stop();
    bool _setPlayPosition(int milliseconds);
    bool _isSeeking();

private:
    MwModel* _model;
    player_h _handle = nullptr;

public:
    panekit::WSignal<void()> completedSignal;
    panekit::WSignal<void(player_interrupted_code_e)> interruptedSignal;
    panekit::WSignal<void(MwPlayer::PlayerErrorType)> errorSignal;

private:
    bool _createPlayerHandle();
    bool _unprepare();
    bool _destroyPlayerHandle();
    bool _stopAfterFailedStart();
    void _startPlayerTimer();
    void _stopPlayerTimer();
    static bool _playerTimerCb(void* userData);
    void _setSeeking(bool seeking);
    // Logs the call, its code and the code's name; answers whether it succeeded.
    static bool _succeeded(int code, const char* call);
    static void _printError(int code);

    static void _completedCb(void* userData);
    static void _interruptedCb(player_interrupted_code_e code, void* userData);
    static void _errorCb(int error, void* userData);
    static void _seekCompletedCb(void* userData);

    panekit::WTimer::Weak _playerTimer;
    platform::Mutex _seekingMutex; // the seek-completed callback may come from another thread
    bool _seeking GUARDED_BY(_seekingMutex) = false;
};
