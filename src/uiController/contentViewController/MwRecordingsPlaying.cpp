#include "MwRecordingsPlaying.h"

#include "MwLog.h"
#include "MwModel.h"

MwRecordingsPlaying::MwRecordingsPlaying(MwModel* model, MwAppController* appController)
    : _model(model)
    , _appController(appController)
{
}

bool MwRecordingsPlaying::_send(MwAppController::Command command, const char* failure)
{
    const bool done = _appController->dispatchCommand(command);
    if (!done)
        MW_LOGE("%s", failure);
    return done;
}

bool MwRecordingsPlaying::_isPlayingOrPaused() const
{
    const auto state = _model->getPlayerState();
    return state == PLAY_STATE_PLAYING || state == PLAY_STATE_PAUSED;
}

bool MwRecordingsPlaying::stop()
{
    return _model->getPlayerState() == PLAY_STATE_NONE || _send(MwAppController::STOP_PLAYING, "play stop failed!");
}

void MwRecordingsPlaying::pause()
{
    if (_isPlayingOrPaused())
        _send(MwAppController::PAUSE_PLAYING, "play pause failed!");
}

MwRecordingsPlaying::Tap MwRecordingsPlaying::tap(const std::string& path)
{
    const std::string current = _model->getCurrentPlayPath();
    if (current.empty())
        return _startPlaying(path);
    if (current == path)
        return _toggleCurrent();
    _model->setCurrentPlayPath(path);
    _send(MwAppController::RESTART_PLAYING, "play other file start failed!");
    return Tap::CHANGED;
}

MwRecordingsPlaying::Tap MwRecordingsPlaying::_startPlaying(const std::string& path)
{
    _model->setCurrentPlayPath(path);
    if (_send(MwAppController::START_PLAYING, "play start failed!"))
        return Tap::STARTED;
    _model->setCurrentPlayPath("");
    return Tap::FAILED;
}

MwRecordingsPlaying::Tap MwRecordingsPlaying::_toggleCurrent()
{
    if (_model->getPlayerState() == PLAY_STATE_PLAYING)
        _send(MwAppController::PAUSE_PLAYING, "play pause failed!");
    else if (_model->getPlayerState() == PLAY_STATE_PAUSED)
        _send(MwAppController::RESUME_PLAYING, "play resume failed!");
    else
        _send(MwAppController::START_PLAYING, "play start failed!");
    return Tap::TOGGLED;
}
