#pragma once

#include <initializer_list>
#include <memory>

#include <panekit/WTimer.h>

#include "MwContentViewController.h"
#include "MwRecorderButtons.h"
#include "MwSaveToPopup.h"
#include "MwSignalMgr.h"

class MwNextRecordingName;
class MwRecorderDisplay;
class MwRecordingStartStop;

namespace panekit {
class WPopupController;
}

// The first screen: starts, pauses, resumes, stops and discards a recording, drops bookmarks, names the next recording,
// chooses the storage and opens the list. It drives no engine: every action is a command to the controller, and every
// report of the controller redraws the screen from the model. Owned by the naviframe. Main loop only.
class MwRecorderContentViewController : public MwContentViewController {
public:
    MwRecorderContentViewController(MwModel* model, MwAppController* appController);

    const char* getClassName() const override { return "MwRecorderContentViewController"; }

protected:
    ~MwRecorderContentViewController() override;

    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;
    void onPushed(Evas_Object* item) override;
    void onTop() override;
    void onBecomeTop() override;

private:
    // Listening
    bool _isComplete() const;
    void _createParts();
    void _listen();
    void _forgetLifeCycle();
    void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    void _appResume();
    void _appPause();
    void _appTerminate();
    void _systemInfoChanged(MwSignalMgr::SystemInfo info);
    void _mmcRemoved();
    void _mediaDBUpdated();
    void _earjackInserted();
    void _openRecordings();

    // Redraw
    void _updateContentView();
    void _updateReady();
    void _updateRecording();
    void _updatePaused();
    void _showButtons(std::initializer_list<MwRecorderButtons::Button> buttons);
    void _focusMainButton();
    void _getEstimatedRecordingMaxTime();
    void _setCallRejection(bool enable);

    // Input
    void _buttonClicked(MwRecorderButtons::Button button);
    void _bookmarkButtonClicked();
    void _createBookMarkAddTimer();
    void _pauseButtonClicked();
    void _resumeButtonClicked();
    void _backKeyClicked();
    void _moreKeyClicked();

    // Popups
    void _createDiscardPopup();
    void _discardRecording();

    bool _addBookMarkEnabled = true;
    bool _skipNextResume = true;
    std::unique_ptr<MwRecorderDisplay> _display;
    std::unique_ptr<MwRecorderButtons> _buttons;
    std::unique_ptr<MwNextRecordingName> _nextName;
    std::unique_ptr<MwRecordingStartStop> _startStop;
    panekit::WTimer::Weak _bookMarkAddTimer;
    MwSaveToPopup _saveToPopup;
    panekit::WPopupController* _discardPopup = nullptr; // deletes itself
    unsigned int _lifeCycleListener = 0;
};
