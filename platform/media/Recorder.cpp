#include "media/Recorder.h"

#include "media/LiveCall.h"
#include "media/WaveformCache.h"

#include "host/PulseWatch.h"
#include "media/RecordingClaims.h"

#include <recorder_leftover.h>

#include <cerrno>
#include <cstdlib>
#include <utility>

namespace media {

namespace {

    constexpr auto OPEN = std::chrono::milliseconds(3000);
    constexpr auto FIRST_SOUND = std::chrono::milliseconds(3000);
    constexpr auto DRAIN = std::chrono::milliseconds(1000);
    constexpr auto QUICK_LOOK = std::chrono::milliseconds(40); // on the main loop

    int errorFor(int systemError)
    {
        switch (systemError) {
        case 0:
            return RECORDER_ERROR_NONE;
        case ENOSPC:
        case EDQUOT:
            return RECORDER_ERROR_OUT_OF_STORAGE;
        case EACCES:
        case EPERM:
        case EROFS:
            return RECORDER_ERROR_PERMISSION_DENIED;
        case ENOMEM:
            return RECORDER_ERROR_OUT_OF_MEMORY;
        default:
            return RECORDER_ERROR_INVALID_OPERATION;
        }
    }

    int errorFor(Trouble trouble)
    {
        switch (trouble) {
        case Trouble::STORAGE_FULL:
            return RECORDER_ERROR_OUT_OF_STORAGE;
        case Trouble::STORAGE_LOST:
            return RECORDER_ERROR_INVALID_OPERATION;
        case Trouble::CALL:
            return RECORDER_ERROR_SOUND_POLICY_BY_CALL;
        case Trouble::DEVICE_LOST:
        case Trouble::NONE:
            break;
        }
        return RECORDER_ERROR_DEVICE;
    }

}

Recorder::Recorder()
{
    _soundListener = host::PulseWatch::instance().addListener(
        [this](const auto&, const host::PulseSnapshot& now) { _noteSound(now.hasCall); });
    _keeper = std::thread([this] { _keep(); });
}

Recorder::~Recorder()
{
    host::PulseWatch::instance().removeListener(_soundListener);
    {
        const platform::Lock lock(_operation);
        if (const auto recording = _current(); recording && _isRecordingOrPaused())
            (void)_complete(*recording);
        _setCurrent(nullptr);
    }
    {
        const platform::Lock lock(_keeperMutex);
        _isEnding = true;
    }
    _keeperWake.notify_all();
    _keeper.join();
    _mailbox.close();
}

RecorderSettings* Recorder::settings()
{
    return _state == RECORDER_STATE_CREATED || _state == RECORDER_STATE_READY ? &_settings : nullptr;
}

bool Recorder::_isRecordingOrPaused() const
{
    return _state == RECORDER_STATE_RECORDING || _state == RECORDER_STATE_PAUSED;
}

RecorderFormat Recorder::_format() const
{
    RecorderFormat format;
    format.isAac = _settings.codec == RECORDER_AUDIO_CODEC_AAC;
    format.sampleRate = format.isAac ? _settings.sampleRate : RECORDER_AMR_SAMPLE_RATE;
    format.bitRate = _settings.bitRate;
    format.channels = format.isAac ? 2 : 1;
    return format;
}

int Recorder::_refusal(std::chrono::milliseconds limit) const
{
    const auto sound = host::PulseWatch::instance().refresh(limit);
    if (isCallLive(sound))
        return RECORDER_ERROR_SOUND_POLICY_BY_CALL;
    return sound.hasAlarm ? RECORDER_ERROR_SOUND_POLICY_BY_ALARM : RECORDER_ERROR_NONE;
}

void Recorder::_setState(recorder_state_e state, bool byPolicy)
{
    const recorder_state_e before = _state.exchange(state);
    if (before != state)
        _post([before, state, byPolicy](const RecorderCallbacks& to) { to.stateChanged(before, state, byPolicy); });
}

int Recorder::prepare()
{
    const platform::Lock lock(_operation);
    if (_state != RECORDER_STATE_CREATED)
        return RECORDER_ERROR_INVALID_STATE;
    const bool isAac = _settings.codec == RECORDER_AUDIO_CODEC_AAC;
    if (isAac != (_settings.format == RECORDER_FILE_FORMAT_MP4))
        return RECORDER_ERROR_INVALID_PARAMETER;
    if (isAac && aacDecoderConfig(static_cast<uint32_t>(_settings.sampleRate), 2).empty())
        return RECORDER_ERROR_INVALID_PARAMETER;
    if (const int refusal = _refusal(); refusal != RECORDER_ERROR_NONE)
        return refusal;
    _pipeline = RecorderPipeline::create(_format(), OPEN);
    if (!_pipeline)
        return RECORDER_ERROR_DEVICE;
    _setState(RECORDER_STATE_READY);
    return RECORDER_ERROR_NONE;
}

int Recorder::unprepare()
{
    const platform::Lock lock(_operation);
    if (_state != RECORDER_STATE_READY)
        return RECORDER_ERROR_INVALID_STATE;
    _pipeline.reset();
    _setCurrent(nullptr);
    _isEndedByPolicy = false;
    _setState(RECORDER_STATE_CREATED);
    return RECORDER_ERROR_NONE;
}

int Recorder::start()
{
    const platform::Lock lock(_operation);
    if (_state == RECORDER_STATE_PAUSED)
        return _resume();
    return _state == RECORDER_STATE_READY ? _startNew() : RECORDER_ERROR_INVALID_STATE;
}

int Recorder::_resume()
{
    const auto recording = _current();
    if (const int refusal = _refusal(QUICK_LOOK); refusal != RECORDER_ERROR_NONE)
        return refusal;
    _silentTicks = 0;
    recording->setHeld(false);
    _pipeline->play();
    _setState(RECORDER_STATE_RECORDING);
    _noteSound(host::PulseWatch::instance().snapshot().hasCall);
    return RECORDER_ERROR_NONE;
}

int Recorder::_startNew()
{
    if (_settings.path.empty())
        return RECORDER_ERROR_INVALID_OPERATION;
    if (const int refusal = _refusal(); refusal != RECORDER_ERROR_NONE)
        return refusal;
    _isEndedByPolicy = false;
    if (!_pipeline)
        _pipeline = RecorderPipeline::create(_format(), OPEN);
    if (!_pipeline)
        return RECORDER_ERROR_DEVICE;
    if (const int error = claimTemporary(_settings.path); error != 0)
        return errorFor(error);
    int error = 0;
    const auto recording = _createRecording(error);
    if (!recording) {
        (void)releaseTemporary(_settings.path);
        return errorFor(error);
    }
    return _startOn(recording);
}

std::shared_ptr<Recording> Recorder::_createRecording(int& error)
{
    const RecorderFormat format = _format();
    auto file = RecordingFile::create(_settings.path,
        makeJournalHeader(_settings.format, static_cast<uint32_t>(format.sampleRate),
            static_cast<uint8_t>(format.channels), static_cast<uint32_t>(format.bitRate)),
        error);
    if (!file)
        return nullptr;
    RecordingLimits limits;
    limits.bytes = static_cast<uint64_t>(_settings.sizeLimitKb) * 1024;
    limits.samples = static_cast<uint64_t>(_settings.timeLimit) * static_cast<uint64_t>(format.sampleRate);
    return std::make_shared<Recording>(std::move(file), format, limits, _recordingEvents());
}

int Recorder::_startOn(std::shared_ptr<Recording> recording)
{
    _isAnnounced = false;
    _silentTicks = 0;
    _isStorageFailing = false;
    _pipeline->setListener(recording);
    _pipeline->play();
    if (!recording->waitForSound(FIRST_SOUND)) {
        recording->close();
        _pipeline.reset();
        _discard();
        return errorFor(recording->trouble());
    }
    _microphone = _pipeline->microphone();
    _postStatus(0, recording->file().size());
    _isAnnounced = true;
    _setState(RECORDER_STATE_RECORDING);
    _setCurrent(std::move(recording));
    // A call that came while we waited was not told to a recording yet.
    _noteSound(host::PulseWatch::instance().snapshot().hasCall);
    return RECORDER_ERROR_NONE;
}

int Recorder::pause()
{
    const platform::Lock lock(_operation);
    if (_state != RECORDER_STATE_RECORDING)
        return RECORDER_ERROR_INVALID_STATE;
    const auto recording = _current();
    recording->setHeld(true);
    _pipeline->pause();
    _setState(RECORDER_STATE_PAUSED);
    return RECORDER_ERROR_NONE;
}

int Recorder::commit()
{
    const platform::Lock lock(_operation);
    // An interruption that came first has completed the file already.
    if (std::exchange(_isEndedByPolicy, false) && _state == RECORDER_STATE_READY)
        return RECORDER_ERROR_NONE;
    if (!_isRecordingOrPaused())
        return RECORDER_ERROR_INVALID_STATE;
    const auto recording = _current();
    const int error = _complete(*recording);
    _setCurrent(nullptr);
    _setState(RECORDER_STATE_READY);
    return errorFor(error);
}

// The file first: what becomes of the sound server is not its matter.
int Recorder::_complete(Recording& recording)
{
    recording.setHeld(true);
    if (recording.trouble() != Trouble::STORAGE_FULL && recording.trouble() != Trouble::STORAGE_LOST)
        _drain(recording);
    recording.close();
    const int error = recording.file().finish(recording.samples());
    if (error == 0)
        rememberLoudness(recording.file().inode(), recording.loudness());
    _pipeline.reset();
    return error;
}

// A storage that is slow, but not stuck, gets all that waits for it.
void Recorder::_drain(Recording& recording)
{
    _pipeline->drain();
    for (uint64_t frames = 0;;) {
        if (recording.waitForDrain(DRAIN) || recording.file().frames() == frames)
            return;
        frames = recording.file().frames();
    }
}

int Recorder::cancel()
{
    const platform::Lock lock(_operation);
    const bool isEnded = std::exchange(_isEndedByPolicy, false) && _state == RECORDER_STATE_READY;
    if (!isEnded && !_isRecordingOrPaused())
        return RECORDER_ERROR_INVALID_STATE;
    if (const auto recording = _current(); recording)
        recording->close();
    _pipeline.reset();
    _setCurrent(nullptr);
    _discard();
    _setState(RECORDER_STATE_READY);
    return RECORDER_ERROR_NONE;
}

// The journal goes last: without it the file would look like a leftover nobody can read.
void Recorder::_discard()
{
    (void)unlink(_settings.path.c_str());
    (void)unlink((_settings.path + RECORDER_NOTES_SUFFIX).c_str());
    (void)releaseTemporary(_settings.path);
}

double Recorder::level()
{
    const auto recording = _current();
    return recording ? recording->takePeak() : -300.0;
}

}
