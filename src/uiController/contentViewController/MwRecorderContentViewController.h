#pragma once

#include <functional>
#include <memory>
#include <string>

#include <panekit/WTimer.h>

#include "MwAppController.h"
#include "MwContentViewController.h"
#include "MwSignalMgr.h"

class MwRenamePopupController;
typedef void (*Evas_Smart_Cb)(void* data, Evas_Object* object, void* info);

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

private:
    struct ButtonLook;

    // Listening
    bool _isComplete() const;
    void _listen();
    void _stopListening();
    void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    void _appResume();
    void _appPause();
    void _appTerminate();
    void _systemInfoChanged(MwSignalMgr::SystemInfo info);
    void _mmcRemoved();
    void _mediaDBUpdated();
    void _earjackInserted();
    void _openRecordings();
    bool _isRecordingOrPaused() const;

    // Redraw
    void _updateContentView();
    void _updateReady();
    void _updateRecording();
    void _updatePaused();
    void _updateFileName(const std::string& name);
    void _updateSubtitle();
    void _updateRecordingTime();
    void _updateRecordingEffect(bool show);
    void _updateBlinking(bool blink);
    bool _blink();
    void _getEstimatedRecordingMaxTime();
    void _createRecordingStatusUpdateTimer();
    void _destroyRecordingStatusUpdateTimer();
    void _createUpdateNextRecordingFileNameTimer();
    void _updateNextRecordingFileName();
    void _setCallRejection(bool enable);

    // Buttons
    void _createButton(const ButtonLook& look, Evas_Smart_Cb clicked);
    void _destroyButton(const char* part);
    void _setButtonIcon(Evas_Object* button, const char* part, const char* image, const char* color);
    void _createRecordButton();
    void _createStopButton();
    void _createBookmarkButton();
    void _createRecordingsButton();
    void _createPauseButton();
    void _createResumeButton();
    void _createDiscardButton();
    void _destroyRecordButton();
    void _destroyStopButton();
    void _destroyBookmarkButton();
    void _destroyRecordingsButton();
    void _destroyPauseButton();
    void _destroyResumeButton();
    void _destroyAllButtons();
    void _focusMainButton(const char* part);
    void _ignoreFurtherClicks(const char* part, Evas_Smart_Cb clicked);

    // Input
    static void _recordButtonCb(void* data, Evas_Object* button, void* info);
    static void _stopButtonCb(void* data, Evas_Object* button, void* info);
    static void _bookmarkButtonCb(void* data, Evas_Object* button, void* info);
    static void _recordingsButtonCb(void* data, Evas_Object* button, void* info);
    static void _pauseButtonCb(void* data, Evas_Object* button, void* info);
    static void _resumeButtonCb(void* data, Evas_Object* button, void* info);
    static void _discardButtonCb(void* data, Evas_Object* button, void* info);
    static void _stopButtonKeyCb(void* data, Eo* canvas, Evas_Object* button, void* info);
    void _recordButtonClicked();
    void _startRecording();
    void _recordingStarted(MwAppController::Result result);
    void _stopButtonClicked();
    void _stopRecording();
    void _cancelTooShortRecording();
    void _bookmarkButtonClicked();
    void _createBookMarkAddTimer();
    void _updateBookMarkEffect(unsigned int seconds);
    void _recordingsButtonClicked();
    void _pauseButtonClicked();
    void _resumeButtonClicked();
    void _backKeyClicked();
    void _moreKeyClicked();
    bool _dispatchAsync(
        MwAppController::Command command, void (MwRecorderContentViewController::*finished)(MwAppController::Result));
    void _stopFinished(MwAppController::Result result);
    void _tooShortCancelled(MwAppController::Result result);
    void _stoppedByRemovedCard(MwAppController::Result result);

    // Popups
    void _renameRecordingFileName();
    void _renameResponseCb(const char* text, int response);
    void _destroyRenamePopup();
    void _createSaveToPopup();
    void _destroySaveToPopup();
    void _createDiscardPopup();
    void _discardRecording();
    void _createStorageFullPopup();
    void _createRecordingFailedPopup();

    unsigned int _lastShownSeconds = 0;
    bool _addBookMarkEnabled = true;
    bool _skipNextResume = true;
    bool _isStopping = false; // a stop is under way; another command would wait for it
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    panekit::WTimer::Weak _blinkTimer;
    panekit::WTimer::Weak _statusUpdateTimer;
    panekit::WTimer::Weak _bookMarkAddTimer;
    panekit::WTimer::Weak _nextNameIdler;
    panekit::WPopupController* _saveToPopup = nullptr; // deletes itself
    panekit::WPopupController* _discardPopup = nullptr; // deletes itself
    unsigned int _lifeCycleListener = 0;
    unsigned int _systemInfoListener = 0;
};
