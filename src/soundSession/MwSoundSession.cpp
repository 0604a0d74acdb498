#include "MwSoundSession.h"

#include "MwSoundSessionImpl.h"

MwSoundSession::MwSoundSession()
    : _impl(std::make_unique<_MwSoundSessionImpl>())
{
}

MwSoundSession::~MwSoundSession() = default;

int MwSoundSession::setRecordSoundSession() { return _impl->_setRecordSoundSession(); }

void MwSoundSession::unsetRecordSoundSession() { _impl->_unsetRecordSoundSession(); }
