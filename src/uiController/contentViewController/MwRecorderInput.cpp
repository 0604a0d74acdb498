// The recorder screen: what the user's actions do.
#include "MwRecorderContentViewController.h"

#include <Elementary.h>

#include <panekit/WMenuPopupController.h>

#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwModel.h"
#include "MwRecordingTime.h"
#include "MwRenamePopupController.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WMenuPopupController;
using panekit::WTimer;

namespace {

constexpr double BOOKMARK_PAUSE = 1.0; // seconds

}

// Sends a command through the worker; the result comes back on the main loop, unless the screen has gone by then.
bool MwRecorderContentViewController::_dispatchAsync(
    MwAppController::Command command, void (MwRecorderContentViewController::*finished)(MwAppController::Result))
{
    const auto alive = token();
    return getAppController()->dispatchCommandAsync(
        command,
        [alive, finished](MwAppController::Command, MwAppController::Result result, void* userData) {
            if (alive.expired())
                return;
            (static_cast<MwRecorderContentViewController*>(userData)->*finished)(result);
        },
        this);
}

void MwRecorderContentViewController::_recordButtonClicked()
{
    if (!_isComplete())
        return;
    const auto state = getModel()->getRecorderState();
    if (state != REC_STATE_READY) {
        MW_LOGW("current recorder state is [%d]!! can't start recording", mwNumber(state));
        return;
    }
    if (MwSystemMgr::getInstance()->isCallConnected()) {
        MW_LOGW("call is connected");
        mwPost("IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS");
        return;
    }
    if (MwSystemMgr::getInstance()->isStorageFull()) {
        MW_LOGW("not enough memory!!");
        _createStorageFullPopup();
        return;
    }
    _startRecording();
}

void MwRecorderContentViewController::_startRecording()
{
    if (!_dispatchAsync(MwAppController::START_RECORDING, &MwRecorderContentViewController::_recordingStarted)) {
        MW_LOGE("Record start failed!");
        return;
    }
    _ignoreFurtherClicks("record_button", _recordButtonCb);
}

void MwRecorderContentViewController::_recordingStarted(MwAppController::Result result)
{
    MW_LOGW("async Command[START RECORDING] result is [%d]", result);
    // Also after a failure: the button has been deaf since the tap.
    _updateContentView();
    if (result != MwAppController::SUCCESS) {
        MW_LOGE("START_RECORDING failed");
        return;
    }
    if (MwSystemMgr::getInstance()->isEarjackInserted())
        mwPost("IDS_MW_TPOP_RECORDING_WITH_EXTERNAL_MICROPHONE");
}

void MwRecorderContentViewController::_stopButtonClicked()
{
    if (!_isComplete())
        return;
    if (!_isRecordingOrPaused()) {
        MW_LOGW("current recorder state is [%d]!! can't stop recording", mwNumber(getModel()->getRecorderState()));
        return;
    }
    if (_isStopping)
        return;
    if (getModel()->isTooShort())
        _cancelTooShortRecording();
    else
        _stopRecording();
}

void MwRecorderContentViewController::_cancelTooShortRecording()
{
    MW_LOGW("current elapsedTime is under 1 sec");
    mwPost("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT");
    if (!_dispatchAsync(MwAppController::CANCEL_RECORDING, &MwRecorderContentViewController::_tooShortCancelled)) {
        MW_LOGE("Record stop failed!");
        return;
    }
    _isStopping = true;
    _ignoreFurtherClicks("stop_button", _stopButtonCb);
}

void MwRecorderContentViewController::_tooShortCancelled(MwAppController::Result result)
{
    _isStopping = false;
    MW_LOGW("async Command[STOP_RECORDING] result is [%d]", result);
    if (result == MwAppController::FAIL)
        _createRecordingFailedPopup();
}

void MwRecorderContentViewController::_stopRecording()
{
    if (!_dispatchAsync(MwAppController::STOP_RECORDING, &MwRecorderContentViewController::_stopFinished)) {
        MW_LOGE("Record stop failed!");
        return;
    }
    _isStopping = true;
    _ignoreFurtherClicks("stop_button", _stopButtonCb);
}

// The controller has told what became of a recording that could not be saved.
void MwRecorderContentViewController::_stoppedByRemovedCard(MwAppController::Result result)
{
    _isStopping = false;
    if (result != MwAppController::SUCCESS || getAppController()->getLastSavedPath().empty())
        return;
    _openRecordings();
    mwPost("IDS_MW_TPOP_RECORDING_INTERRUPTED_WHAT_WAS_RECORDED_IS_SAVED");
}

void MwRecorderContentViewController::_stopFinished(MwAppController::Result result)
{
    _isStopping = false;
    MW_LOGW("async Command result [%d]", result);
    if (result == MwAppController::SUCCESS)
        _openRecordings();
    else
        _createRecordingFailedPopup();
}

void MwRecorderContentViewController::_recordingsButtonClicked()
{
    if (_isComplete())
        _openRecordings();
}

void MwRecorderContentViewController::_pauseButtonClicked()
{
    if (!_isComplete() || _isStopping)
        return;
    if (!getAppController()->dispatchCommand(MwAppController::PAUSE_RECORDING))
        MW_LOGE("Record pause failed!");
    _updateContentView();
}

void MwRecorderContentViewController::_resumeButtonClicked()
{
    if (!_isComplete() || _isStopping)
        return;
    if (!getAppController()->dispatchCommand(MwAppController::RESUME_RECORDING))
        MW_LOGE("Record resume failed!");
    _updateContentView();
}

void MwRecorderContentViewController::_bookmarkButtonClicked()
{
    if (!_isComplete() || _isStopping)
        return;
    if (!_isRecordingOrPaused()) {
        MW_LOGE("Invalid recorder state [%d]", mwNumber(getModel()->getRecorderState()));
        return;
    }
    if (!_addBookMarkEnabled) {
        MW_LOGE("_addBookMarkEnabled is false, ignore!!");
        return;
    }
    unsigned int markedTime = 0;
    if (!getModel()->addBookMark(markedTime)) {
        MW_LOGE("add book mark failed!!");
        return;
    }
    MwLoggingMgr::getInstance()->insert("BMRK");
    _addBookMarkEnabled = false;
    _createBookMarkAddTimer();
    _updateBookMarkEffect(markedTime);
}

void MwRecorderContentViewController::_createBookMarkAddTimer()
{
    WTimer::destroy(_bookMarkAddTimer);
    _bookMarkAddTimer = WTimer::addTimer(BOOKMARK_PAUSE, [this](void*) {
        _addBookMarkEnabled = true;
        return false;
    });
}

void MwRecorderContentViewController::_updateBookMarkEffect(unsigned int seconds)
{
    elm_layout_signal_emit(getEvasObject(), "show_bookmark_effect", "c_source");
    elm_object_part_text_set(getEvasObject(), "bookmark_time", mwRecordingTimeText(seconds).c_str());
}

void MwRecorderContentViewController::_backKeyClicked()
{
    if (!_isComplete() || _isStopping)
        return;
    if (_isRecordingOrPaused())
        _createDiscardPopup();
    else
        popOut();
}

void MwRecorderContentViewController::_moreKeyClicked()
{
    if (!_isComplete() || getModel()->isRequestMode() || _renamePopup || _saveToPopup)
        return;
    auto* menu = new WMenuPopupController();
    if (_isRecordingOrPaused() && !MwSystemMgr::getInstance()->getRejectCall()) {
        menu->addItem("IDS_MW_OPT_ENABLE_CALL_REJECTION_ABB", [this] { _setCallRejection(true); });
    } else if (_isRecordingOrPaused()) {
        menu->addItem("IDS_MW_OPT_DISABLE_CALL_REJECTION_ABB", [this] { _setCallRejection(false); });
    } else {
        menu->addItem("IDS_MUSIC_OPT_RENAME", [this] {
            MW_LOGW("Rename recording file name");
            _renameRecordingFileName();
            MwLoggingMgr::getInstance()->insert("Rena", "StandBy");
        });
    }
    if (!_isRecordingOrPaused() && MwSystemMgr::getInstance()->isMMCMounted()) {
        menu->addItem("IDS_MW_HEADER_SAVE_TO", [this] {
            MW_LOGW("create save to menu");
            _createSaveToPopup();
        });
    }
    attachPopup(menu);
    menu->create(getWindow(), elm_object_item_widget_get(getNaviItem()));
}
