#pragma once

#include <recorder.h>

#include <panekit/WSignal.h>

#include "MwRecorderState.h"

class MwModel;

// Drives one service recorder for one recording after the other: configured from the model, guarded by its state, its
// notifications turned into three signals and two model values. Used by the controller, on the main loop or its worker.
class MwRecorder {
public:
    enum ErrorType : int {
        ERROR_NONE,
        ERROR_UNKNOWN,
        ERROR_OUT_OF_STORAGE,
        ERROR_BLOCKED_BY_CALL,
        ERROR_SECURITY_RESTRICTED,
        ERROR_STORAGE, // it fails while the recording goes on
    };
    enum LimitType : int { LIMIT_NONE, LIMIT_TIME, LIMIT_SIZE, LIMIT_FREE_SPACE };
    using RecordingState = MwRecorderState; // kept in the model by the controller

    MwRecorder() = default;
    ~MwRecorder();
    MwRecorder(const MwRecorder&) = delete;
    MwRecorder& operator=(const MwRecorder&) = delete;

    // The model is borrowed until the handle is destroyed.
    bool createHandle(MwModel* model);
    bool destroyHandle();
    bool start(ErrorType& error);
    bool pause();
    bool resume(ErrorType& error);
    bool cancel();
    // Commits the temporary file.
    bool stop();
    // Whether the service has ended the recording by itself.
    bool hasEnded() const;
    bool isInRecording(int kind) const;

private:
    MwModel* _model = nullptr;
    recorder_h _handle = nullptr;
    int _statusCount = 0; // status callbacks since the last level sample

public:
    panekit::WSignal<void(ErrorType)> errorSignal;
    panekit::WSignal<void()> interruptedSignal;
    panekit::WSignal<void(LimitType)> limitReachedSignal;

private:
    bool _setCallbacks();
    bool _unsetCallbacks();
    bool _setAttributes();
    bool _isInState(recorder_state_e first, recorder_state_e second, const char* refusal) const;
    bool _getState(recorder_state_e& state) const;
    double _getAudioLevel() const;

    static void _stateChangedCb(recorder_state_e previous, recorder_state_e current, bool byPolicy, void* userData);
    static void _errorCb(int error, recorder_state_e state, void* userData);
    static void _interruptedCb(
        recorder_policy_e policy, recorder_state_e previous, recorder_state_e current, void* userData);
    static void _limitReachedCb(recorder_recording_limit_type_e type, void* userData);
    static void _statusCb(unsigned long long elapsed, unsigned long long fileSize, void* userData);
};
