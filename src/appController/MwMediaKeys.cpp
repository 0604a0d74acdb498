#include "MwMediaKeys.h"

#include <Ecore.h>

#include <algorithm>
#include <utility>

#include "MwLog.h"
#include "MwModel.h"

namespace {

constexpr double FIRST_TICK_SECONDS = 0.3;
constexpr double NEXT_TICK_SECONDS = 0.5;
constexpr unsigned int SEEK_STEP_MS = 3000;

Ecore_Timer* ecoreTimer(const panekit::WTimer::Weak& timer)
{
    return static_cast<Ecore_Timer*>(wuitimer_get_timer_handle(timer));
}

}

MwMediaKeys::MwMediaKeys(MwModel* model, Controller controller)
    : _model(model)
    , _controller(std::move(controller))
{
}

MwMediaKeys::~MwMediaKeys() { stopSeeking(); }

void MwMediaKeys::stopSeeking()
{
    panekit::WTimer::destroy(_rewindTimer);
    panekit::WTimer::destroy(_fastForwardTimer);
}

void MwMediaKeys::grab()
{
    _controller.onMainLoop([this] {
        if (const int result = media_key_reserve(_mediaKeyStatusChanged, this); result != 0)
            MW_LOGE("media_key_reserve failed [%d]", result);
    });
}

void MwMediaKeys::release()
{
    _controller.onMainLoop([] {
        if (const int result = media_key_release(); result != 0)
            MW_LOGE("media_key_release failed [%d]", result);
    });
}

void MwMediaKeys::_mediaKeyStatusChanged(media_key_e key, media_key_event_e status, void* userData)
{
    MW_LOGI("key type:%d status:%d", key, status);
    auto* self = static_cast<MwMediaKeys*>(userData);
    if (self == nullptr || self->_model == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    if (status == MEDIA_KEY_STATUS_PRESSED)
        self->_mediaKeyPressed(key);
    else if (status == MEDIA_KEY_STATUS_RELEASED)
        self->_mediaKeyReleased(key);
}

void MwMediaKeys::_mediaKeyPressed(media_key_e key)
{
    if (_model->getPlayerState() != PLAY_STATE_PLAYING)
        return;
    if (key == MEDIA_KEY_FASTFORWARD)
        _holdSeekKey(_fastForwardTimer, true);
    else if (key == MEDIA_KEY_REWIND)
        _holdSeekKey(_rewindTimer, false);
}

void MwMediaKeys::_mediaKeyReleased(media_key_e key)
{
    switch (key) {
    case MEDIA_KEY_PLAY:
        _resumePlayingByKey();
        _resumeRecordingByKey();
        break;
    case MEDIA_KEY_STOP:
        _pausePlayingByKey();
        _stopRecordingByKey();
        break;
    case MEDIA_KEY_PAUSE:
        _pausePlayingByKey();
        _pauseRecordingByKey();
        break;
    case MEDIA_KEY_RECORD:
        _resumeRecordingByKey();
        break;
    case MEDIA_KEY_PREVIOUS:
        _playOtherByKey(MwAppController::PLAY_PREVIOUS);
        break;
    case MEDIA_KEY_NEXT:
        _playOtherByKey(MwAppController::PLAY_NEXT);
        break;
    case MEDIA_KEY_FASTFORWARD:
        _releaseSeekKey(_fastForwardTimer, MwAppController::PLAY_NEXT);
        break;
    case MEDIA_KEY_REWIND:
        _releaseSeekKey(_rewindTimer, MwAppController::PLAY_PREVIOUS);
        break;
    case MEDIA_KEY_PLAYPAUSE:
        _togglePlaying();
        _toggleRecording();
        break;
    case MEDIA_KEY_MEDIA:
        _toggleRecording();
        _togglePlaying();
        break;
    }
}

void MwMediaKeys::_dispatchByKey(MwAppController::Command command, const char* failure)
{
    if (!_controller.dispatch(command))
        MW_LOGE("%s", failure);
}

void MwMediaKeys::_toggleRecording()
{
    if (_model->getRecorderState() == REC_STATE_RECORDING)
        _pauseRecordingByKey();
    else
        _resumeRecordingByKey();
}

void MwMediaKeys::_pauseRecordingByKey()
{
    if (_model->getRecorderState() == REC_STATE_RECORDING)
        _dispatchByKey(MwAppController::PAUSE_RECORDING, "pause recording failed");
}

void MwMediaKeys::_resumeRecordingByKey()
{
    if (_model->getRecorderState() == REC_STATE_PAUSED)
        _dispatchByKey(MwAppController::RESUME_RECORDING, "resume recording failed");
}

void MwMediaKeys::_stopRecordingByKey()
{
    if (mwIsRecordingOrPaused(_model->getRecorderState()))
        _controller.stopRecording();
}

void MwMediaKeys::_togglePlaying()
{
    if (_model->getPlayerState() == PLAY_STATE_PLAYING)
        _pausePlayingByKey();
    else
        _resumePlayingByKey();
}

void MwMediaKeys::_pausePlayingByKey()
{
    if (_model->getPlayerState() == PLAY_STATE_PLAYING)
        _dispatchByKey(MwAppController::PAUSE_PLAYING, "pause playing failed");
}

void MwMediaKeys::_resumePlayingByKey()
{
    if (_model->getPlayerState() == PLAY_STATE_PAUSED)
        _dispatchByKey(MwAppController::RESUME_PLAYING, "resume playing failed");
}

void MwMediaKeys::_playOtherByKey(MwAppController::Command command)
{
    if (_model->getPlayerState() != PLAY_STATE_NONE)
        _dispatchByKey(command, command == MwAppController::PLAY_NEXT ? "play next failed!" : "play previous failed!");
}

void MwMediaKeys::_holdSeekKey(panekit::WTimer::Weak& timer, bool forward)
{
    panekit::WTimer::destroy(timer);
    timer = panekit::WTimer::addTimer(FIRST_TICK_SECONDS, [this, forward](void*) { return _seekTick(forward); });
}

// A key let go before the first tick means the next or previous recording.
void MwMediaKeys::_releaseSeekKey(panekit::WTimer::Weak& timer, MwAppController::Command shortPress)
{
    _seekStep = 0;
    Ecore_Timer* handle = ecoreTimer(timer);
    if (handle == nullptr)
        return;
    const bool ticked = ecore_timer_interval_get(handle) != FIRST_TICK_SECONDS;
    panekit::WTimer::destroy(timer);
    if (!ticked)
        _playOtherByKey(shortPress);
}

bool MwMediaKeys::_seekTick(bool forward)
{
    if (_model->getPlayerState() == PLAY_STATE_NONE) {
        MW_LOGE("player state is none!!!!");
        return false;
    }
    _seekStep += SEEK_STEP_MS;
    if (Ecore_Timer* handle = ecoreTimer(forward ? _fastForwardTimer : _rewindTimer); handle != nullptr)
        ecore_timer_interval_set(handle, NEXT_TICK_SECONDS);
    const unsigned int position = _model->getCurrentPlayPosition();
    if (forward)
        _model->setCurrentPlayPosition(std::min(position + _seekStep, _model->getCurrentPlayDuration()));
    else
        _model->setCurrentPlayPosition(position > _seekStep ? position - _seekStep : 0);
    if (!_controller.dispatch(MwAppController::SET_PLAYER_POSITION))
        MW_LOGE("set play position failed!");
    return true;
}
