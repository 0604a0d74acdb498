#pragma once

#include "media/Recording.h"
#include "media/Slot.h"
#include <MainLoopMailbox.h>
#include <Mutex.h>

#include <recorder.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <memory>
#include <string>
#include <thread>

namespace media {

// The application's callbacks; fetched at the time of the call, on the main loop.
struct RecorderCallbacks {
    Slot<recorder_error_cb> error;
    Slot<recorder_interrupted_cb> interrupted;
    Slot<recorder_state_changed_cb> stateChanged;
    Slot<recorder_recording_limit_reached_cb> limitReached;
    Slot<recorder_recording_status_cb> status;
};

struct RecorderSettings {
    recorder_audio_codec_e codec = RECORDER_AUDIO_CODEC_AAC;
    recorder_file_format_e format = RECORDER_FILE_FORMAT_MP4;
    int sampleRate = RECORDER_AAC_SAMPLE_RATE;
    int bitRate = RECORDER_AAC_BIT_RATE;
    int sizeLimitKb = 0;
    int timeLimit = 0;
    std::string path;
};

// The recorder behind recorder_h. Operations come from any one thread at a time and are serialised with the keeper, a
// thread of its own that flushes once a second, watches storage and microphone, and ends a recording that cannot go on:
// it completes the file, makes the recorder ready and only then reports. Nobody here ever waits for the main loop.
class Recorder {
public:
    static void setWatched(bool watched); // of all recorders
    Recorder();
    ~Recorder();
    Recorder(const Recorder&) = delete;
    Recorder& operator=(const Recorder&) = delete;

    [[nodiscard]] recorder_state_e state() const { return _state; }
    RecorderCallbacks& callbacks() { return *_callbacks; }
    // For changing settings, while nothing is recorded; null otherwise.
    RecorderSettings* settings();

    int prepare();
    int unprepare();
    int start();
    int pause();
    int commit();
    int cancel();
    double level();

private:
    int _startNew() REQUIRES(_operation);
    int _startOn(std::shared_ptr<Recording> recording) REQUIRES(_operation);
    int _resume() REQUIRES(_operation);
    int _refusal(std::chrono::milliseconds limit = std::chrono::milliseconds(200)) const;
    std::shared_ptr<Recording> _createRecording(int& error) REQUIRES(_operation);
    Recording::Events _recordingEvents();
    // Writes out what was captured and closes the file; answers the system's error number.
    int _complete(Recording& recording) REQUIRES(_operation);
    void _drain(Recording& recording) REQUIRES(_operation);
    void _discard() REQUIRES(_operation);
    void _setState(recorder_state_e state, bool byPolicy = false);
    bool _isRecordingOrPaused() const;
    RecorderFormat _format() const REQUIRES(_operation);

    void _postStatus(unsigned long long elapsed, unsigned long long size);
    void _postProgress();
    template <typename Call>
    void _post(Call call)
    {
        _mailbox.post([callbacks = _callbacks, call] { call(*callbacks); });
    }

    void _keep();
    void _inspect(Recording& recording, bool isSecond);
    void _inspectStorage(Recording& recording);
    void _inspectSound(Recording& recording) REQUIRES(_operation);
    void _watchMicrophone(const Recording& recording) REQUIRES(_operation);
    bool _isOnForeignMonitor() REQUIRES(_operation);
    void _endInterrupted(const std::shared_ptr<Recording>& recording);
    void _reportEnd(Trouble trouble, recorder_state_e before, int fileError);
    std::shared_ptr<Recording> _current();
    void _setCurrent(std::shared_ptr<Recording> recording);
    void _noteSound(bool hasCall);

    const std::shared_ptr<RecorderCallbacks> _callbacks = std::make_shared<RecorderCallbacks>();
    platform::MainLoopMailbox _mailbox;
    std::atomic<recorder_state_e> _state{RECORDER_STATE_CREATED};
    std::chrono::steady_clock::time_point _lastStatus; // of the thread that sound arrives on
    std::atomic<bool> _isStatusPosted{false}; // one status under way at a time, however fast sound arrives
    std::atomic<bool> _isAnnounced{false}; // the status with elapsed 0 was sent
    std::atomic<bool> _isStorageFailing{false}; // and that was told

    platform::Mutex _operation; // one operation, or the keeper's end of a recording
    RecorderSettings _settings GUARDED_BY(_operation);
    std::unique_ptr<RecorderPipeline> _pipeline GUARDED_BY(_operation);
    bool _isEndedByPolicy GUARDED_BY(_operation)
        = false; // the file is complete and waits for a commit, which finds nothing to do
    int _silentTicks GUARDED_BY(_operation) = 0;
    uint64_t _samplesAtTick GUARDED_BY(_operation) = 0;
    std::string _microphone GUARDED_BY(_operation); // in use at the last look

    platform::Mutex _keeperMutex; // nothing else is locked under it
    std::condition_variable_any _keeperWake;
    std::shared_ptr<Recording> _recording GUARDED_BY(_keeperMutex);
    bool _isEnding GUARDED_BY(_keeperMutex) = false;
    bool _hasTrouble GUARDED_BY(_keeperMutex) = false;
    int _soundListener = 0;
    std::thread _keeper;
};

}
