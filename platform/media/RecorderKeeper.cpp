#include "media/Recorder.h"

#include "media/LiveCall.h"

#include "host/PulseWatch.h"
#include "media/RecordingClaims.h"
#include "state/Log.h"

namespace media {

namespace {

    constexpr auto TICK = std::chrono::milliseconds(500);
    constexpr int SILENT_TICKS = 4; // two seconds
    constexpr auto UNWATCHED_STATUS = std::chrono::milliseconds(200);

    std::atomic<bool> isWatched = true;
    constexpr double STALLED_STORAGE_SECONDS = 1.0;

}

void Recorder::_postStatus(unsigned long long elapsed, unsigned long long size)
{
    _post([elapsed, size](const RecorderCallbacks& to) { to.status(elapsed, size); });
}

void Recorder::setWatched(bool watched) { isWatched = watched; }

// A main loop that falls behind gets fewer and newer numbers, and one that nobody watches sleeps.
void Recorder::_postProgress()
{
    const auto now = std::chrono::steady_clock::now();
    if (!_isAnnounced || (!isWatched && now - _lastStatus < UNWATCHED_STATUS) || _isStatusPosted.exchange(true))
        return;
    _lastStatus = now;
    _mailbox.post([this] {
        _isStatusPosted = false;
        if (const auto recording = _current(); recording)
            _callbacks->status(recording->elapsedMs(), recording->file().size());
    });
}

Recording::Events Recorder::_recordingEvents()
{
    Recording::Events events;
    events.progress = [this] { _postProgress(); };
    events.limit = [this](recorder_recording_limit_type_e type) {
        _post([type](const RecorderCallbacks& to) { to.limitReached(type); });
    };
    events.trouble = [this] {
        {
            const platform::Lock lock(_keeperMutex);
            _hasTrouble = true;
        }
        _keeperWake.notify_all();
    };
    return events;
}

std::shared_ptr<Recording> Recorder::_current()
{
    const platform::Lock lock(_keeperMutex);
    return _recording;
}

void Recorder::_setCurrent(std::shared_ptr<Recording> recording)
{
    {
        const platform::Lock lock(_keeperMutex);
        // Trouble may have come before the keeper knew the recording.
        _hasTrouble = recording && recording->trouble() != Trouble::NONE;
        std::swap(_recording, recording);
    }
    _keeperWake.notify_all();
}

void Recorder::_noteSound(bool hasCall)
{
    if (!hasCall || _state != RECORDER_STATE_RECORDING)
        return;
    if (const auto recording = _current(); recording)
        recording->raise(Trouble::CALL);
}

void Recorder::_keep()
{
    for (unsigned tick = 0;; ++tick) {
        std::shared_ptr<Recording> recording;
        {
            platform::Lock lock(_keeperMutex);
            const auto isDue = [this]() REQUIRES(_keeperMutex) { return _isEnding || _hasTrouble; };
            if (_recording)
                _keeperWake.wait_for(lock, TICK, isDue);
            else
                _keeperWake.wait(lock, [&]() REQUIRES(_keeperMutex) { return isDue() || _recording; });
            if (_isEnding)
                return;
            recording = _recording;
            _hasTrouble = false;
        }
        if (!recording)
            continue;
        if (recording->trouble() == Trouble::NONE)
            _inspect(*recording, tick % 2 == 0);
        if (recording->trouble() != Trouble::NONE)
            _endInterrupted(recording);
    }
}

void Recorder::_inspect(Recording& recording, bool isSecond)
{
    if (isSecond)
        _inspectStorage(recording);
    _noteSound(isCallLive(host::PulseWatch::instance().snapshot())); // the modem's, too
    // An operation under way moves the samples itself.
    if (!_operation.try_lock())
        return;
    _inspectSound(recording);
    _operation.unlock();
}

void Recorder::_inspectSound(Recording& recording)
{
    if (_state != RECORDER_STATE_RECORDING || _current().get() != &recording)
        return;
    _watchMicrophone(recording);
    if (_silentTicks >= SILENT_TICKS || _isOnForeignMonitor())
        recording.raise(Trouble::DEVICE_LOST);
}

void Recorder::_inspectStorage(Recording& recording)
{
    const int error = recording.file().flush();
    if (error != 0 && !_isStorageFailing.exchange(true)) {
        PLATFORM_LOGE("the recording cannot be flushed: [%d]", error);
        _post([state = state()](const RecorderCallbacks& to) { to.error(RECORDER_ERROR_STORAGE, state); });
    }
    recording.file().growReserve();
    if (recording.file().freeSpaceError() != 0)
        recording.reachLimit(RECORDER_RECORDING_LIMIT_FREE_SPACE);
    if (!recording.file().isInPlace())
        recording.raise(Trouble::STORAGE_LOST);
}

// Ticks of our own rather than the clock: a process that was stopped for a while has missed nothing.
void Recorder::_watchMicrophone(const Recording& recording)
{
    const uint64_t samples = recording.samples();
    const bool isStorageStalled = _pipeline->backlog() > STALLED_STORAGE_SECONDS;
    const bool isSilent = recording.isCapturing() && samples == _samplesAtTick && !isStorageStalled;
    _silentTicks = isSilent ? _silentTicks + 1 : 0;
    _samplesAtTick = samples;
}

// A server whose microphone is pulled moves us to what the speakers play. Who moved us cannot be asked; a microphone
// that is still there was left on purpose.
bool Recorder::_isOnForeignMonitor()
{
    const std::string before = std::exchange(_microphone, _pipeline->microphone());
    if (_microphone.empty() || _microphone == before)
        return false;
    const auto sound = host::PulseWatch::instance().refresh();
    return sound.isConnected && !sound.microphones.contains(before) && !sound.microphones.contains(_microphone);
}

void Recorder::_endInterrupted(const std::shared_ptr<Recording>& recording)
{
    const platform::Lock lock(_operation);
    if (_current() != recording || !_isRecordingOrPaused())
        return;
    const recorder_state_e before = _state;
    const int fileError = _complete(*recording);
    if (fileError != 0)
        PLATFORM_LOGE("the recording could not be completed: [%d]", fileError);
    _setCurrent(nullptr);
    _isEndedByPolicy = fileError == 0;
    _setState(RECORDER_STATE_READY, true);
    _reportEnd(recording->trouble(), before, fileError);
}

void Recorder::_reportEnd(Trouble trouble, recorder_state_e before, int fileError)
{
    const auto interrupt = [&](recorder_policy_e policy) {
        _post([policy, before](const RecorderCallbacks& to) { to.interrupted(policy, before, RECORDER_STATE_READY); });
    };
    // Neither an interruption nor a limit: both say that the file is complete.
    if (fileError != 0)
        return _post([fileError](const RecorderCallbacks& to) {
            to.error(fileError == ENOSPC ? RECORDER_ERROR_OUT_OF_STORAGE : RECORDER_ERROR_INVALID_OPERATION,
                RECORDER_STATE_READY);
        });
    switch (trouble) {
    case Trouble::NONE:
        return;
    case Trouble::DEVICE_LOST:
        return interrupt(RECORDER_POLICY_DEVICE_LOST);
    case Trouble::CALL:
        return interrupt(RECORDER_POLICY_SOUND);
    case Trouble::STORAGE_LOST:
        return interrupt(RECORDER_POLICY_STORAGE);
    case Trouble::STORAGE_FULL:
        return _post([](const RecorderCallbacks& to) { to.limitReached(RECORDER_RECORDING_LIMIT_FREE_SPACE); });
    }
}

}
