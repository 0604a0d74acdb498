#pragma once

#include <player.h>

#include <memory>

#include <panekit/WSignal.h>

#include "MwPlayerState.h"

class MwModel;
class _MwPlayerImpl;

// Plays the recording that the model names as current and keeps the model's position and play state up to date. The
// controller owns one for the life of the application. Main loop only.
class MwPlayer {
public:
    // Kept in the model by the engine.
    using PlayState = MwPlayerState;
    enum PlayerErrorType : int { PLAYBACK_ERROR = 2 };

    // The model is borrowed.
    explicit MwPlayer(MwModel* model);
    virtual ~MwPlayer();
    MwPlayer(const MwPlayer&) = delete;
    MwPlayer& operator=(const MwPlayer&) = delete;

    bool start();
    bool pause();
    bool resume();
    bool stop();
    bool setPlayPosition(int milliseconds);
    bool isSeeking();

    panekit::WSignal<void()>& getCompletedSignal();
    panekit::WSignal<void(player_interrupted_code_e)>& getInterruptedSignal();
    panekit::WSignal<void(PlayerErrorType)>& getErrorSignal();

private:
    std::unique_ptr<_MwPlayerImpl> _impl;
};
