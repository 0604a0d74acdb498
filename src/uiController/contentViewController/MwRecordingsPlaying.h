#pragma once

#include <string>

#include "MwAppController.h"

class MwModel;

// What the recordings screen asks of the player. Model and controller are borrowed. Main loop only.
class MwRecordingsPlaying {
public:
    // What a tap came to.
    enum class Tap { FAILED, STARTED, TOGGLED, CHANGED };

    MwRecordingsPlaying(MwModel* model, MwAppController* appController);

    // A tap on what is loaded plays or pauses it; on another one, plays that.
    Tap tap(const std::string& path);
    void pause();
    // False when it goes on.
    bool stop();

private:
    [[nodiscard]] bool _isPlayingOrPaused() const;
    Tap _startPlaying(const std::string& path);
    Tap _toggleCurrent();
    bool _send(MwAppController::Command command, const char* failure);

    MwModel* _model;
    MwAppController* _appController;
};
