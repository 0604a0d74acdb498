#pragma once

#include "MwSignalMgr.h"
#include "MwSoundSession.h"

class _MwSoundSessionImpl {
public:
    _MwSoundSessionImpl();
    ~_MwSoundSessionImpl();
    _MwSoundSessionImpl(const _MwSoundSessionImpl&) = delete;
    _MwSoundSessionImpl& operator=(const _MwSoundSessionImpl&) = delete;

    int _setRecordSoundSession();
    void _unsetRecordSoundSession();

private:
    static void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    static bool _succeeded(int code, const char* call);

    unsigned int _lifeCycleListener = 0;
};
