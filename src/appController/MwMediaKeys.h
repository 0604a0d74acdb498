#pragma once

#include <media_key.h>
#include <panekit/WTimer.h>

#include <functional>

#include "MwAppController.h"

class MwModel;

// What the keys of headset, keyboard and remote controls mean: while they are grabbed, they play, pause and seek in
// what is loaded, and pause, resume and stop what is recorded. The model is borrowed. Main loop, unless a function says
// otherwise.
class MwMediaKeys {
public:
    struct Controller {
        std::function<bool(MwAppController::Command command)> dispatch;
        // Beside the main loop: the window does not wait for the save.
        std::function<void()> stopRecording;
        // Now on the main loop, later from another thread.
        std::function<void(std::function<void()> call)> onMainLoop;
    };

    MwMediaKeys(MwModel* model, Controller controller);
    ~MwMediaKeys();
    MwMediaKeys(const MwMediaKeys&) = delete;
    MwMediaKeys& operator=(const MwMediaKeys&) = delete;

    // Any thread; this lives as long as what it posts to the main loop.
    void grab();
    void release();
    // Lets go of the keys that seek.
    void stopSeeking();
    // From now on keys mean nothing: the model is about to go.
    void forgetModel() { _model = nullptr; }

private:
    static void _mediaKeyStatusChanged(media_key_e key, media_key_event_e status, void* userData);
    void _mediaKeyPressed(media_key_e key);
    void _mediaKeyReleased(media_key_e key);
    void _toggleRecording();
    void _pauseRecordingByKey();
    void _resumeRecordingByKey();
    void _stopRecordingByKey();
    void _togglePlaying();
    void _pausePlayingByKey();
    void _resumePlayingByKey();
    void _playOtherByKey(MwAppController::Command command);
    void _holdSeekKey(panekit::WTimer::Weak& timer, bool forward);
    void _releaseSeekKey(panekit::WTimer::Weak& timer, MwAppController::Command shortPress);
    bool _seekTick(bool forward);
    void _dispatchByKey(MwAppController::Command command, const char* failure);

    MwModel* _model;
    Controller _controller;
    panekit::WTimer::Weak _rewindTimer;
    panekit::WTimer::Weak _fastForwardTimer;
    unsigned int _seekStep = 0; // milliseconds
};
