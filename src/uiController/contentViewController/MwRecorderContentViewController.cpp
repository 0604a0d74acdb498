#include "MwRecorderContentViewController.h"

#include <utility>

#include <Elementary.h>

#include <app.h>
#include <panekit/WMenuPopupController.h>
#include <panekit/WPopupController.h>

#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwModel.h"
#include "MwNextRecordingName.h"
#include "MwRecorderDisplay.h"
#include "MwRecordingStartStop.h"
#include "MwRecordingTime.h"
#include "MwResourceMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WMenuPopupController;
using panekit::WPopupController;
using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecorderContentView.edj";
constexpr auto LAYOUT_GROUP = "recorder_content_view";
constexpr double BOOKMARK_PAUSE = 1.0; // seconds

void closePopup(WPopupController* popup) { popup->destroy(); }

}

MwRecorderContentViewController::MwRecorderContentViewController(MwModel* model, MwAppController* appController)
    : MwContentViewController(model, appController)
    , _saveToPopup(model)
{
}

MwRecorderContentViewController::~MwRecorderContentViewController() = default;

Evas_Object* MwRecorderContentViewController::onCreateView(Evas_Object* parent, void*)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return nullptr;
    }
    Evas_Object* layout = elm_layout_add(parent);
    elm_layout_file_set(layout, path.c_str(), LAYOUT_GROUP);
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_show(layout);
    return layout;
}

bool MwRecorderContentViewController::_isComplete() const
{
    if (!getEvasObject()) {
        MW_LOGE("getEvasObject() is nullptr");
        return false;
    }
    if (!getModel()) {
        MW_LOGE("getModel() is nullptr");
        return false;
    }
    if (!getAppController()) {
        MW_LOGE("getAppController() is nullptr");
        return false;
    }
    return true;
}

void MwRecorderContentViewController::onCreated()
{
    if (!_isComplete())
        return;
    _createParts();
    _listen();
    _getEstimatedRecordingMaxTime();
    _updateContentView();
}

void MwRecorderContentViewController::_createParts()
{
    _display = std::make_unique<MwRecorderDisplay>(getEvasObject(), getModel());
    _buttons = std::make_unique<MwRecorderButtons>(
        getEvasObject(), [this](MwRecorderButtons::Button button) { _buttonClicked(button); });
    _nextName = std::make_unique<MwNextRecordingName>(
        getModel(), [this](const std::string& name) { _display->_updateFileName(name); });
    MwRecordingStartStop::Screen screen;
    screen.accepted = [this] {
        _buttons->ignoreFurtherClicks(MwRecorderButtons::RECORD);
        _buttons->ignoreFurtherClicks(MwRecorderButtons::STOP);
    };
    screen.started = [this] { _updateContentView(); };
    screen.saved = [this] { _openRecordings(); };
    _startStop = std::make_unique<MwRecordingStartStop>(getWindow(), getModel(), getAppController(), std::move(screen));
}

void MwRecorderContentViewController::_listen()
{
    listenToSystemInfo([this](MwSignalMgr::SystemInfo info) { _systemInfoChanged(info); });
    _lifeCycleListener = MwSignalMgr::getInstance()->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    // Goes with the view, or with the controller when that ends first.
    const auto updated = [this] {
        MW_LOGW("recorder update signal");
        _updateContentView();
    };
    getAppController()->getRecorderUpdatedSignal().addListener(updated, getEvasObject());
    setBackKeyHandler([this] { _backKeyClicked(); });
}

// On TERMINATE at the latest: afterwards the controller and the signals are gone, while the screen waits for its
// window.
void MwRecorderContentViewController::_forgetLifeCycle()
{
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals)
        mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
}

void MwRecorderContentViewController::onDestroy()
{
    _forgetLifeCycle();
    WTimer::destroy(_bookMarkAddTimer);
    _startStop.reset();
    _nextName.reset();
    _display.reset();
    _saveToPopup.close();
    if (auto* popup = std::exchange(_discardPopup, nullptr); popup) {
        popup->setOnDestroyed(nullptr);
        popup->destroy();
    }
}

void MwRecorderContentViewController::onPushed(Evas_Object* item)
{
    elm_naviframe_item_title_enabled_set(item, EINA_FALSE, EINA_FALSE);
    setMoreButton([this] { _moreKeyClicked(); });
}

void MwRecorderContentViewController::onTop()
{
    if (!_isComplete())
        return;
    _updateContentView();
    if (getModel()->getRecorderState() == REC_STATE_RECORDING && MwSystemMgr::getInstance()->isEarjackInserted())
        mwPost("IDS_MW_TPOP_RECORDING_WITH_EXTERNAL_MICROPHONE");
}

void MwRecorderContentViewController::_openRecordings() { getAppController()->openRecordings(); }

void MwRecorderContentViewController::_lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle)
{
    MW_LOGW("life cycle signal: [%d]", lifeCycle);
    switch (lifeCycle) {
    case MwSignalMgr::RESUME:
        return _appResume();
    case MwSignalMgr::PAUSE:
        return _appPause();
    case MwSignalMgr::TERMINATE:
        return _appTerminate();
    }
    MW_LOGE("Invalid life cycle signal!");
}

void MwRecorderContentViewController::_appResume()
{
    _nextName->_createUpdateNextRecordingFileNameTimer();
    // The first resume belongs to the start, which has just drawn everything.
    if (std::exchange(_skipNextResume, false))
        return;
    if (!isTop())
        return;
    _getEstimatedRecordingMaxTime();
    _updateContentView();
}

void MwRecorderContentViewController::_appPause()
{
    _display->_updateRecordingEffect(false);
    _display->_updateBlinking(false);
    _display->_destroyRecordingStatusUpdateTimer();
    _nextName->cancelUpdate();
}

void MwRecorderContentViewController::_appTerminate()
{
    MW_LOGW("BEGIN");
    _forgetLifeCycle();
    MW_LOGW("END");
}

void MwRecorderContentViewController::_systemInfoChanged(MwSignalMgr::SystemInfo info)
{
    MW_LOGW("system info signal: [%d]", info);
    if (!_isComplete())
        return;
    switch (info) {
    case MwSignalMgr::MMC_REMOVED:
        return _mmcRemoved();
    case MwSignalMgr::MEDIA_DB_UPDATED:
        return _mediaDBUpdated();
    case MwSignalMgr::POWER_OFF:
    case MwSignalMgr::UPS_MODE_CHANGED:
        return ui_app_exit();
    case MwSignalMgr::EARJACK_INSERTED:
        return _earjackInserted();
    case MwSignalMgr::MINI_CONTROLLER_RECORDING_SAVED:
        return _openRecordings();
    case MwSignalMgr::LOCKSCREEN_CHANGED:
    case MwSignalMgr::TIME_ZONE_CHANGED:
    case MwSignalMgr::REGION_FORMAT_CHANGED:
    case MwSignalMgr::EARJACK_REMOVED:
    case MwSignalMgr::POWER_STATE_CHANGED:
    case MwSignalMgr::THEME_CHANGED:
    case MwSignalMgr::CALL_REJECT_CHANGED:
    case MwSignalMgr::MICROPHONE_BACK:
    case MwSignalMgr::PRIVATE_STORAGE_CHANGED:
        return;
    }
}

void MwRecorderContentViewController::_mmcRemoved()
{
    if (getModel()->getStorageType() == MW_STORAGE_CARD && mwIsRecordingOrPaused(getModel()->getRecorderState()))
        _startStop->stopForRemovedCard();
    _saveToPopup.close();
}

void MwRecorderContentViewController::_mediaDBUpdated()
{
    if (!mwIsRecordingOrPaused(getModel()->getRecorderState()))
        destroyAttachedPopup();
    if (getModel()->getAppState() == MwModel::APP_STATE_RESUMED)
        _nextName->_createUpdateNextRecordingFileNameTimer();
}

void MwRecorderContentViewController::_earjackInserted()
{
    if (!isTop() || getModel()->getAppState() != MwModel::APP_STATE_RESUMED)
        return;
    mwPost(getModel()->getRecorderState() == REC_STATE_NONE ? "IDS_MW_TPOP_EXTERNAL_MICROPHONE_WILL_BE_USED_TO_RECORD"
                                                            : "IDS_MW_TPOP_RECORDING_WITH_EXTERNAL_MICROPHONE");
}

void MwRecorderContentViewController::_updateContentView()
{
    if (!_isComplete())
        return;
    _buttons->clear();
    const auto state = getModel()->getRecorderState();
    MW_LOGW("recorder state: [%d]", mwNumber(state));
    elm_layout_signal_emit(
        getEvasObject(), getModel()->isRequestMode() ? "enter_request_mode" : "leave_request_mode", "");
    switch (state) {
    case REC_STATE_NONE:
    case REC_STATE_READY:
        return _updateReady();
    case REC_STATE_RECORDING:
        return _updateRecording();
    case REC_STATE_PAUSED:
        return _updatePaused();
    }
    MW_LOGE("Invalid recorder state!");
}

void MwRecorderContentViewController::_updateReady()
{
    if (auto* popup = std::exchange(_discardPopup, nullptr); popup) {
        MW_LOGW("detroy discard popup");
        popup->destroy();
    }
    getModel()->setElapsedTime(0);
    _display->resetRecordingTime();
    _setCallRejection(false);
    _display->_destroyRecordingStatusUpdateTimer();
    _display->_updateFileName(getModel()->getRenameString());
    _display->_updateSubtitle();
    _display->_updateRecordingEffect(false);
    _display->_updateBlinking(false);
    _display->_updateRecordingTime();
    _showButtons({MwRecorderButtons::RECORD, MwRecorderButtons::RECORDINGS});
}

void MwRecorderContentViewController::_updateRecording()
{
    _display->_updateBlinking(false);
    _display->_createRecordingStatusUpdateTimer();
    _display->_updateFileName(getModel()->getCurrentRecordingFileName());
    _display->_updateRecordingEffect(true);
    _showButtons({MwRecorderButtons::STOP, MwRecorderButtons::PAUSE, MwRecorderButtons::DISCARD});
}

void MwRecorderContentViewController::_updatePaused()
{
    _display->_updateRecordingTime();
    _display->_destroyRecordingStatusUpdateTimer();
    _display->_updateBlinking(true);
    _display->_updateRecordingEffect(false);
    _showButtons({MwRecorderButtons::STOP, MwRecorderButtons::RESUME, MwRecorderButtons::DISCARD});
}

void MwRecorderContentViewController::_showButtons(std::initializer_list<MwRecorderButtons::Button> buttons)
{
    _buttons->add(buttons);
    if (mwIsRecordingOrPaused(getModel()->getRecorderState()) && !getModel()->isRequestMode())
        _buttons->add({MwRecorderButtons::BOOKMARK});
    _focusMainButton();
}

// Return and Space act on the big button unless a popup has the keyboard.
void MwRecorderContentViewController::_focusMainButton()
{
    if (_buttons && !hasAttachedPopup() && !WPopupController::topmost())
        _buttons->focusMain();
}

// The naviframe gives the keyboard to what comes first in the title.
void MwRecorderContentViewController::onBecomeTop() { _focusMainButton(); }

void MwRecorderContentViewController::_getEstimatedRecordingMaxTime()
{
    if (!getModel()->isRequestMode() || getModel()->getSizeLimit() >= MwModel::NO_SIZE_LIMIT)
        return;
    const auto seconds = mwEstimatedSeconds(getModel()->getSizeLimit(), getModel()->getFileFormat());
    if (!seconds) {
        MW_LOGE("Invalid recording format!");
        return;
    }
    getModel()->setEstimatedRecordingMaxTime(*seconds);
}

void MwRecorderContentViewController::_setCallRejection(bool enable)
{
    MwSystemMgr::getInstance()->setRejectCall(enable);
    elm_layout_signal_emit(getEvasObject(), enable ? "enable_call_rejection" : "disable_call_rejection", "");
    if (!enable)
        return;
    MwLoggingMgr::getInstance()->insert("REJC");
    mwPost("IDS_MW_TPOP_INCOMING_CALLS_BLOCKED_WHILE_RECORDING");
}

void MwRecorderContentViewController::_buttonClicked(MwRecorderButtons::Button button)
{
    if (!_isComplete())
        return;
    switch (button) {
    case MwRecorderButtons::RECORD:
        return _startStop->_recordButtonClicked();
    case MwRecorderButtons::RECORDINGS:
        return _openRecordings();
    case MwRecorderButtons::STOP:
        return _startStop->_stopButtonClicked();
    case MwRecorderButtons::BOOKMARK:
        return _bookmarkButtonClicked();
    case MwRecorderButtons::PAUSE:
        return _pauseButtonClicked();
    case MwRecorderButtons::RESUME:
        return _resumeButtonClicked();
    case MwRecorderButtons::DISCARD:
        return _backKeyClicked();
    case MwRecorderButtons::BUTTONS:
        return;
    }
}

void MwRecorderContentViewController::_pauseButtonClicked()
{
    if (_startStop->isStopping())
        return;
    if (!getAppController()->dispatchCommand(MwAppController::PAUSE_RECORDING))
        MW_LOGE("Record pause failed!");
    _updateContentView();
}

void MwRecorderContentViewController::_resumeButtonClicked()
{
    if (_startStop->isStopping())
        return;
    if (!getAppController()->dispatchCommand(MwAppController::RESUME_RECORDING))
        MW_LOGE("Record resume failed!");
    _updateContentView();
}

void MwRecorderContentViewController::_bookmarkButtonClicked()
{
    if (_startStop->isStopping())
        return;
    if (!mwIsRecordingOrPaused(getModel()->getRecorderState())) {
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
    _display->_updateBookMarkEffect(markedTime);
}

void MwRecorderContentViewController::_createBookMarkAddTimer()
{
    WTimer::destroy(_bookMarkAddTimer);
    _bookMarkAddTimer = WTimer::addTimer(BOOKMARK_PAUSE, [this](void*) {
        _addBookMarkEnabled = true;
        return false;
    });
}

void MwRecorderContentViewController::_backKeyClicked()
{
    if (!_isComplete() || _startStop->isStopping())
        return;
    if (mwIsRecordingOrPaused(getModel()->getRecorderState()))
        _createDiscardPopup();
    else
        popOut();
}

void MwRecorderContentViewController::_moreKeyClicked()
{
    if (!_isComplete() || getModel()->isRequestMode() || _nextName->isEdited() || _saveToPopup.isOpen())
        return;
    auto* menu = new WMenuPopupController();
    if (mwIsRecordingOrPaused(getModel()->getRecorderState()) && !MwSystemMgr::getInstance()->getRejectCall()) {
        menu->addItem("IDS_MW_OPT_ENABLE_CALL_REJECTION_ABB", [this] { _setCallRejection(true); });
    } else if (mwIsRecordingOrPaused(getModel()->getRecorderState())) {
        menu->addItem("IDS_MW_OPT_DISABLE_CALL_REJECTION_ABB", [this] { _setCallRejection(false); });
    } else {
        menu->addItem("IDS_MUSIC_OPT_RENAME", [this] {
            MW_LOGW("Rename recording file name");
            _nextName->_renameRecordingFileName(getWindow());
            MwLoggingMgr::getInstance()->insert("Rena", "StandBy");
        });
    }
    if (!mwIsRecordingOrPaused(getModel()->getRecorderState()) && MwSystemMgr::getInstance()->isMMCMounted()) {
        menu->addItem("IDS_MW_HEADER_SAVE_TO", [this] { _saveToPopup.open(getWindow()); });
    }
    attachPopup(menu);
    menu->create(getWindow(), elm_object_item_widget_get(getNaviItem()));
}

void MwRecorderContentViewController::_createDiscardPopup()
{
    if (_discardPopup)
        return;
    _discardPopup = new WPopupController();
    _discardPopup->setTitle("IDS_MW_HEADER_DISCARD_RECORDING_ABB3");
    _discardPopup->setContent("IDS_MW_POP_RECORDING_WILL_BE_STOPPED_AND_THE_FILE_WILL_BE_DISCARDED");
    _discardPopup->addButton("IDS_MW_BUTTON_CANCEL", closePopup);
    _discardPopup->addButton("IDS_MW_BUTTON_DISCARD_ABB3", [this](WPopupController*) { _discardRecording(); });
    _discardPopup->setOnDestroyed([this] { _discardPopup = nullptr; });
    _discardPopup->create(getWindow());
}

void MwRecorderContentViewController::_discardRecording()
{
    if (!_isComplete())
        return;
    const bool discarded = getAppController()->dispatchCommand(MwAppController::CANCEL_RECORDING);
    if (!discarded)
        MW_LOGE("Record cancel failed!");
    getModel()->clearBookMark();
    // Closes the popup when the recorder is ready again.
    _updateContentView();
    if (discarded)
        mwPost("IDS_MW_TPOP_RECORDING_DISCARDED_M_SOUND");
}
