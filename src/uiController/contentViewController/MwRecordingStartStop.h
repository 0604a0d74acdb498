#pragma once

#include <functional>
#include <memory>

#include "MwAppController.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

// What a recorder screen's big button does: it starts a recording unless a call or a full storage forbids it, and stops
// one, which throws away what is too short. The commands run beside the main loop; what comes of them is told here,
// unless this has gone by then. Model and controller are borrowed. Main loop only.
class MwRecordingStartStop {
public:
    struct Screen {
        std::function<void()> accepted; // a command is under way; the button must not send it again
        std::function<void()> started; // or not: the button is to be drawn again
        std::function<void()> saved;
    };

    // window: where the popups appear.
    MwRecordingStartStop(Evas_Object* window, MwModel* model, MwAppController* appController, Screen screen);

    void _recordButtonClicked();
    void _stopButtonClicked();
    // What can be kept is kept: on the card, when it is only about to go, or for the rescue, when it comes back.
    void stopForRemovedCard();
    // A stop is under way; another command would wait for it.
    [[nodiscard]] bool isStopping() const { return _isStopping; }

private:
    using Finished = void (MwRecordingStartStop::*)(MwAppController::Result);

    bool _dispatchAsync(MwAppController::Command command, Finished finished);
    void _startRecording();
    void _recordingStarted(MwAppController::Result result);
    void _stop(MwAppController::Command command, Finished finished);
    void _cancelTooShortRecording();
    void _tooShortCancelled(MwAppController::Result result);
    void _stopFinished(MwAppController::Result result);
    void _stoppedByRemovedCard(MwAppController::Result result);
    void _createRecordingFailedPopup();

    Evas_Object* _window;
    MwModel* _model;
    MwAppController* _appController;
    Screen _screen;
    bool _isStopping = false;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
