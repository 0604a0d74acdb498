#include "media/Recording.h"

#include "state/Log.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <utility>

namespace media {

namespace {

    constexpr double SILENCE_DB = -300.0;
    constexpr double FULL_SCALE = 32768.0;
    constexpr uint64_t PROGRESS_PER_SECOND = 50;

    Trouble storageTrouble(int error)
    {
        return error == ENOSPC || error == EDQUOT || error == EFBIG ? Trouble::STORAGE_FULL : Trouble::STORAGE_LOST;
    }

}

Recording::Recording(
    std::unique_ptr<RecordingFile> file, const RecorderFormat& format, RecordingLimits limits, Events events)
    : _file(std::move(file))
    , _format(format)
    , _limits(limits)
    , _events(std::move(events))
{
}

unsigned long long Recording::elapsedMs() const
{
    return _samples * 1000 / static_cast<unsigned long long>(_format.sampleRate);
}

double Recording::takePeak()
{
    const int peak = _peak.exchange(0);
    return peak == 0 ? SILENCE_DB : std::min(0.0, 20 * std::log10(peak / FULL_SCALE));
}

void Recording::_notify()
{
    // Taken and let go so that a waiter between its test and its sleep is not missed.
    {
        const platform::Lock lock(_mutex);
    }
    _changed.notify_all();
}

void Recording::close()
{
    {
        const platform::Lock lock(_writing);
        _isClosed = true;
    }
    const platform::Lock lock(_telling);
    _isMuted = true;
}

void Recording::raise(Trouble trouble)
{
    Trouble none = Trouble::NONE;
    if (!_trouble.compare_exchange_strong(none, trouble))
        return;
    _isOver = true;
    _notify();
    _tell([this] { _events.trouble(); });
}

bool Recording::waitForSound(std::chrono::milliseconds limit)
{
    platform::Lock lock(_mutex);
    _changed.wait_for(lock, limit, [this] { return _samples > 0 || _trouble != Trouble::NONE; });
    return _samples > 0 && _trouble == Trouble::NONE;
}

bool Recording::waitForDrain(std::chrono::milliseconds limit)
{
    platform::Lock lock(_mutex);
    return _changed.wait_for(lock, limit, [this] { return _isDrained.load(); });
}

void Recording::reachLimit(recorder_recording_limit_type_e type)
{
    if (!_isOver.exchange(true))
        _tell([&] { _events.limit(type); });
}

void Recording::_measure(const int16_t* samples, size_t count)
{
    constexpr size_t BLOCK = 64;
    int peak = 0;
    for (size_t from = 0; from < count; from += BLOCK) {
        const size_t end = std::min(count, from + BLOCK);
        int sum = 0;
        for (size_t i = from; i < end; ++i) {
            const int amplitude = std::abs(static_cast<int>(samples[i]));
            peak = std::max(peak, amplitude);
            sum += amplitude;
        }
        _loudness.add(sum / FULL_SCALE, end - from);
    }
    int known = _peak;
    while (peak > known && !_peak.compare_exchange_weak(known, peak)) { }
}

size_t Recording::onCaptured(const int16_t* samples, size_t count)
{
    if (_isHeld || _isOver)
        return 0;
    const uint64_t before = _samples;
    const bool isLast = _limits.samples > 0 && before + count >= _limits.samples;
    const size_t taken = isLast ? _limits.samples - before : count;
    _measure(samples, taken);
    _samples = before + taken;
    if (before == 0)
        _notify();
    const auto rate = static_cast<uint64_t>(_format.sampleRate);
    if (before * PROGRESS_PER_SECOND / rate != (before + taken) * PROGRESS_PER_SECOND / rate)
        _tell([this] { _events.progress(); });
    if (isLast)
        reachLimit(RECORDER_RECORDING_LIMIT_TIME);
    return taken;
}

void Recording::onFrame(const void* frame, size_t size)
{
    // The silence that drives the last sound out of the encoder may end in frames of its own.
    const platform::Lock lock(_writing);
    const uint64_t frameSamples = _format.frameSamples();
    const uint64_t needed = (_samples + _format.lookAhead() + frameSamples - 1) / frameSamples;
    if (_isClosed || _file->frames() >= needed)
        return;
    if (_limits.bytes > 0 && _file->sizeWith(size) > _limits.bytes) {
        _isClosed = true;
        reachLimit(RECORDER_RECORDING_LIMIT_SIZE);
        return;
    }
    if (const int error = _file->append(frame, size); error != 0) {
        _isClosed = true;
        raise(storageTrouble(error));
    }
}

void Recording::onDrained()
{
    _isDrained = true;
    _notify();
}

// Further errors follow from the first.
void Recording::onFailed(const char* reason)
{
    if (_trouble == Trouble::NONE)
        PLATFORM_LOGE("the recording lost its source: %s", reason);
    raise(Trouble::DEVICE_LOST);
}

}
