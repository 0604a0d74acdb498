#include "MwPlayer.h"

#include "MwPlayerImpl.h"

MwPlayer::MwPlayer(MwModel* model)
    : _impl(std::make_unique<_MwPlayerImpl>(model))
{
}

MwPlayer::~MwPlayer() = default;

bool MwPlayer::start() { return _impl->_start(); }

bool MwPlayer::pause() { return _impl->_pause(); }

bool MwPlayer::resume() { return _impl->_resume(); }

bool MwPlayer::stop() { return _impl->_stop(); }

bool MwPlayer::setPlayPosition(int milliseconds) { return _impl->_setPlayPosition(milliseconds); }

bool MwPlayer::isSeeking() { return _impl->_isSeeking(); }

panekit::WSignal<void()>& MwPlayer::getCompletedSignal() { return _impl->completedSignal; }

panekit::WSignal<void(player_interrupted_code_e)>& MwPlayer::getInterruptedSignal() { return _impl->interruptedSignal; }

panekit::WSignal<void(MwPlayer::PlayerErrorType)>& MwPlayer::getErrorSignal() { return _impl->errorSignal; }
