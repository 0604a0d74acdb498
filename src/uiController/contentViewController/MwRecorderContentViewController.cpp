#include "MwRecorderContentViewController.h"

#include <utility>

#include <Elementary.h>

#include <app.h>
#include <panekit/WPopupController.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwRenamePopupController.h"
#include "MwResourceMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecorderContentView.edj";
constexpr auto LAYOUT_GROUP = "recorder_content_view";

}

MwRecorderContentViewController::MwRecorderContentViewController(MwModel* model, MwAppController* appController)
    : MwContentViewController(model, appController)
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
    _listen();
    _getEstimatedRecordingMaxTime();
    _updateContentView();
}

void MwRecorderContentViewController::_listen()
{
    MwSignalMgr* signals = MwSignalMgr::getInstance();
    _lifeCycleListener = signals->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    _systemInfoListener = signals->getSystemInfoSignal().addListener(
        [this](MwSignalMgr::SystemInfo info) { _systemInfoChanged(info); });
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
void MwRecorderContentViewController::_stopListening()
{
    MwSignalMgr* signals = MwSignalMgr::existing();
    if (!signals)
        return;
    mwForget(signals->getSystemInfoSignal(), _systemInfoListener);
    mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
}

void MwRecorderContentViewController::onDestroy()
{
    _stopListening();
    for (const WTimer::Weak& timer : {_blinkTimer, _statusUpdateTimer, _bookMarkAddTimer, _nextNameIdler})
        WTimer::destroy(timer);
    _renamePopup.reset();
    for (auto* popup : {std::exchange(_saveToPopup, nullptr), std::exchange(_discardPopup, nullptr)}) {
        if (!popup)
            continue;
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

bool MwRecorderContentViewController::_isRecordingOrPaused() const
{
    const auto state = getModel()->getRecorderState();
    return state == REC_STATE_RECORDING || state == REC_STATE_PAUSED;
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
    _createUpdateNextRecordingFileNameTimer();
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
    _updateRecordingEffect(false);
    _updateBlinking(false);
    _destroyRecordingStatusUpdateTimer();
    WTimer::destroy(_nextNameIdler);
}

void MwRecorderContentViewController::_appTerminate()
{
    MW_LOGW("BEGIN");
    _stopListening();
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
    // What can be kept is kept: on the card, when it is only about to go, or for the rescue, when it comes back.
    if (getModel()->getStorageType() == MW_STORAGE_CARD && _isRecordingOrPaused() && !_isStopping)
        _isStopping
            = _dispatchAsync(MwAppController::STOP_RECORDING, &MwRecorderContentViewController::_stoppedByRemovedCard);
    _destroySaveToPopup();
}

void MwRecorderContentViewController::_mediaDBUpdated()
{
    if (!_isRecordingOrPaused())
        destroyAttachedPopup();
    if (getModel()->getAppState() == MwModel::APP_STATE_RESUMED)
        _createUpdateNextRecordingFileNameTimer();
}

void MwRecorderContentViewController::_earjackInserted()
{
    if (!isTop() || getModel()->getAppState() != MwModel::APP_STATE_RESUMED)
        return;
    mwPost(getModel()->getRecorderState() == REC_STATE_NONE ? "IDS_MW_TPOP_EXTERNAL_MICROPHONE_WILL_BE_USED_TO_RECORD"
                                                            : "IDS_MW_TPOP_RECORDING_WITH_EXTERNAL_MICROPHONE");
}
