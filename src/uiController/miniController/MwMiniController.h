#pragma once

#include <panekit/WSignal.h>

#include <string>

class MwAppController;
class MwModel;

namespace panekit {
class WWindowController;
}

// One control surface outside the program's window. It reports what its user pressed and does nothing by itself. Main
// loop only.
class MwMiniController {
public:
    enum ActionType : int {
        ACTION_START_RECORD = 1,
        ACTION_PAUSE_RECORD,
        ACTION_RESUME_RECORD,
        ACTION_STOP_RECORD,
        ACTION_CANCEL_RECORD,
        ACTION_STOP_PLAY,
        ACTION_RESUME_PLAY,
        ACTION_PAUSE_PLAY,
        ACTION_NEXT_PLAY,
        ACTION_PREV_PLAY,
        ACTION_REQUEST_HIDE,
    };

    // All are borrowed and outlive the surface.
    MwMiniController(MwModel* model, MwAppController* appController, panekit::WWindowController* windowController);
    MwMiniController(const MwMiniController&) = delete;
    MwMiniController& operator=(const MwMiniController&) = delete;

    virtual void create() = 0;
    // Removes the surface and deletes this object; nobody deletes it otherwise.
    virtual void destroy() = 0;
    // Draws it anew from the model.
    virtual void update() = 0;
    virtual ~MwMiniController() = default;

    panekit::WSignal<void(ActionType)>& getActionSignal() { return _actionSignal; }

protected:
    void startRecord() { _emit(ACTION_START_RECORD); }
    void pauseRecord() { _emit(ACTION_PAUSE_RECORD); }
    void resumeRecord() { _emit(ACTION_RESUME_RECORD); }
    void stopRecord() { _emit(ACTION_STOP_RECORD); }
    void cancelRecord() { _emit(ACTION_CANCEL_RECORD); }
    void stopPlay() { _emit(ACTION_STOP_PLAY); }
    void resumePlay() { _emit(ACTION_RESUME_PLAY); }
    void pausePlay() { _emit(ACTION_PAUSE_PLAY); }
    void nextPlay() { _emit(ACTION_NEXT_PLAY); }
    void prevPlay() { _emit(ACTION_PREV_PLAY); }
    void requestHide() { _emit(ACTION_REQUEST_HIDE); }

    // Whether there is a recording, running or paused.
    [[nodiscard]] bool isRecording() const;
    // What the recording does, translated.
    [[nodiscard]] std::string getRecordingText() const;
    // Of the recording; with hours from the first one on.
    [[nodiscard]] std::string getTimeText() const;
    // Brings the program's window forward.
    static void openProgram();
    [[nodiscard]] MwModel* getModel() const { return _model; }
    [[nodiscard]] MwAppController* getAppController() const { return _appController; }
    [[nodiscard]] panekit::WWindowController* getWindowController() const { return _windowController; }

private:
    void _emit(ActionType action);

    MwModel* _model;
    MwAppController* _appController;
    panekit::WWindowController* _windowController;
    panekit::WSignal<void(ActionType)> _actionSignal;
};
