#pragma once

#include "media/Loudness.h"
#include "media/RecorderPipeline.h"
#include "media/RecordingFile.h"

#include <Mutex.h>
#include <recorder.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <functional>
#include <memory>

namespace media {

// Why a recording cannot go on.
enum class Trouble { NONE, DEVICE_LOST, STORAGE_FULL, STORAGE_LOST, CALL };

struct RecordingLimits {
    uint64_t bytes = 0; // 0 for none
    uint64_t samples = 0;
};

// One recording from start to commit or cancel: counts, measures and limits what the pipeline captures, and writes the
// frames. The streaming threads work here; everybody else looks in through atomics or waits for a signal.
class Recording : public CaptureListener {
public:
    struct Events {
        std::function<void()> progress; // every 20 ms of sound; streaming thread
        std::function<void(recorder_recording_limit_type_e)> limit; // once; streaming thread or keeper
        std::function<void()> trouble; // once; any thread
    };
    Recording(std::unique_ptr<RecordingFile> file, const RecorderFormat& format, RecordingLimits limits, Events events);

    // Holding drops what the microphone delivers. The pipeline is paused after, and played before letting go.
    void setHeld(bool held) { _isHeld = held; }
    // When this returns no frame is being written and nothing told, and none will be.
    void close();
    void raise(Trouble trouble);

    [[nodiscard]] Trouble trouble() const { return _trouble; }
    [[nodiscard]] unsigned long long elapsedMs() const;
    [[nodiscard]] uint64_t samples() const { return _samples; }
    [[nodiscard]] bool isCapturing() const { return !_isHeld && !_isOver; }
    [[nodiscard]] RecordingFile& file() { return *_file; }
    // Decibels below full scale; starts anew.
    double takePeak();

    // Of all that was captured; after close().
    [[nodiscard]] Loudness loudness() const { return _loudness.result(); }

    // Whether the first sample came in time; false at once when trouble came instead.
    bool waitForSound(std::chrono::milliseconds limit);
    bool waitForDrain(std::chrono::milliseconds limit);
    // Stops the data and reports the limit, the first time.
    void reachLimit(recorder_recording_limit_type_e type);

    size_t onCaptured(const int16_t* samples, size_t count) override;
    void onFrame(const void* frame, size_t size) override;
    void onDrained() override;
    void onFailed(const char* reason) override;

private:
    void _measure(const int16_t* samples, size_t count);
    void _notify();
    template <typename Tell>
    void _tell(const Tell& tell)
    {
        const platform::Lock lock(_telling);
        if (!_isMuted)
            tell();
    }

    const std::unique_ptr<RecordingFile> _file;
    const RecorderFormat _format;
    const RecordingLimits _limits;
    const Events _events;
    std::atomic<uint64_t> _samples{0};
    GrowingLoudness _loudness; // of the streaming thread, until that has come to its end
    std::atomic<int> _peak{0};
    std::atomic<bool> _isHeld{false};
    std::atomic<bool> _isOver{false}; // takes no more sound: a limit or trouble
    std::atomic<bool> _isClosed{false};
    std::atomic<bool> _isDrained{false};
    std::atomic<Trouble> _trouble{Trouble::NONE};
    platform::Mutex _writing; // held while a frame is written
    platform::Mutex _telling; // held while an event is told
    bool _isMuted GUARDED_BY(_telling) = false;
    platform::Mutex _mutex; // only for waiting
    std::condition_variable_any _changed;
};

}
