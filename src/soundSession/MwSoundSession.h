#pragma once

#include <memory>

class _MwSoundSessionImpl;

// How the application's sound gives way to other sound: the media session for its whole life, a recording session
// around each recording. Main loop, and the command worker for the recording session.
class MwSoundSession {
public:
    enum Result : int {
        SESSION_RESULT_NONE,
        SESSION_RESULT_BLOCKED_BY_CALL,
        SESSION_RESULT_BLOCKED_BY_ALARM,
        SESSION_RESULT_FAILED,
    };

    MwSoundSession();
    ~MwSoundSession();
    MwSoundSession(const MwSoundSession&) = delete;
    MwSoundSession& operator=(const MwSoundSession&) = delete;

    // A Result.
    int setRecordSoundSession();
    void unsetRecordSoundSession();

private:
    std::unique_ptr<_MwSoundSessionImpl> _impl;
};
