#include "MwMiniControllerMgr.h"

#include <Elementary.h>
#include <app.h>
#include <minicontrol.h>
#include <notification.h>
#include <notification_control.h>
#include <panekit/WWindowController.h>
#include <preference.h>

#include <algorithm>
#include <utility>

#include "MwAppReplies.h"
#include "MwLockscreenMiniController.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwNotiMiniController.h"
#include "MwNotificationMiniController.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr auto ALARM_SERVICE_ID = "com.tovanic.mewlo-alarmservice";
constexpr double PRELOAD_SECONDS = 1; // after the program's first frames
constexpr const char* FOCUS_EVENTS[] = {"focused", "unfocused"};

bool isRecording(const MwModel& model) { return mwIsRecordingOrPaused(model.getRecorderState()); }

// On the desktop's panel; the user may prefer the notification where there can be one.
bool canBeWindow()
{
    bool prefersNotification = false;
    (void)preference_get_boolean(PREFERENCE_USE_NOTIFICATION_CONTROL, &prefersNotification);
    return minicontrol_is_supported(MINICONTROL_VIEWER_PANEL)
        && !(prefersNotification && notification_control_is_supported());
}

}

MwMiniControllerMgr::MwMiniControllerMgr(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : _model(model)
    , _appController(appController)
    , _windowController(windowController)
{
    MW_LOGI("BEGIN");
    if (!_model) {
        MW_LOGE("model is nullptr");
        return;
    }
    if (!_appController) {
        MW_LOGE("appController is nullptr");
        return;
    }
    _initialize();
    MW_LOGI("END");
}

MwMiniControllerMgr::~MwMiniControllerMgr()
{
    _destoryAllMiniController();
    _removeListeners();
}

void MwMiniControllerMgr::_initialize()
{
    if (notification_control_watch(_notificationChangedCb, this) != 0)
        MW_LOGW("no notification can be the surface");
    if (preference_set_changed_cb(PREFERENCE_USE_NOTIFICATION_CONTROL, _preferenceChangedCb, this) != 0)
        MW_LOGE("preference_set_changed_cb failed");
    for (const char* event : FOCUS_EVENTS)
        if (Evas_Object* window = _window())
            evas_object_smart_callback_add(window, event, _focusChangedCb, this);
    _preloading = panekit::WTimer::addTimer(PRELOAD_SECONDS, [this](void*) {
        if (_window() && canBeWindow())
            MwNotiMiniController::preload(_window());
        return false;
    });
    MwSignalMgr* signals = MwSignalMgr::getInstance();
    _lifeCycleListenerId
        = signals->getLifeCycleSignal().addListener([this](MwSignalMgr::LifeCycle change) { _onLifeCycle(change); });
    _systemInfoListenerId
        = signals->getSystemInfoSignal().addListener([this](MwSignalMgr::SystemInfo info) { _onSystemInfo(info); });
    _playerUpdatedListenerId = _appController->getPlayerUpdatedSignal().addListener([this] { _onPlayerUpdated(); });
    _recorderUpdatedListenerId
        = _appController->getRecorderUpdatedSignal().addListener([this] { _onRecorderUpdated(); });
    _playViewClosedListenerId = signals->getPlayViewClosedSignal().addListener([this] { _updateAll(); });
}

void MwMiniControllerMgr::_removeListeners()
{
    if (_lifeCycleListenerId == 0)
        return;
    panekit::WTimer::destroy(_preloading);
    preference_unset_changed_cb(PREFERENCE_USE_NOTIFICATION_CONTROL, _preferenceChangedCb);
    notification_control_unwatch();
    for (const char* event : FOCUS_EVENTS)
        if (Evas_Object* window = _window())
            evas_object_smart_callback_del_full(window, event, _focusChangedCb, this);
    MwSignalMgr* signals = MwSignalMgr::getInstance();
    signals->getLifeCycleSignal().removeListener(std::exchange(_lifeCycleListenerId, 0));
    signals->getSystemInfoSignal().removeListener(std::exchange(_systemInfoListenerId, 0));
    _appController->getPlayerUpdatedSignal().removeListener(std::exchange(_playerUpdatedListenerId, 0));
    _appController->getRecorderUpdatedSignal().removeListener(std::exchange(_recorderUpdatedListenerId, 0));
    signals->getPlayViewClosedSignal().removeListener(std::exchange(_playViewClosedListenerId, 0));
}

void MwMiniControllerMgr::_createNotiMiniController()
{
    _createMiniController<MwNotiMiniController>(NOTIFICATION_PANEL);
}

// The window, or the notification, never both. The notification is there while nobody looks at the program.
void MwMiniControllerMgr::_choosePanelSurface()
{
    const bool records = isRecording(*_model);
    const bool plays = _model->getPlayerState() == PLAY_STATE_PLAYING;
    if (canBeWindow()) {
        _destroyMiniController(NOTIFICATION);
        if (records || plays)
            _createNotiMiniController();
        return;
    }
    _destroyMiniController(NOTIFICATION_PANEL);
    if (records && _isAway())
        _createMiniController<MwNotificationMiniController>(NOTIFICATION);
    else
        _destroyMiniController(NOTIFICATION);
}

// Where a program is not told whether its window is minimised, the one without the focus may be.
bool MwMiniControllerMgr::_isAway() const
{
    if (_model->getAppState() == MwModel::APP_STATE_PAUSED)
        return true;
    return !minicontrol_is_supported(MINICONTROL_VIEWER_PANEL) && _window()
        && elm_win_focus_get(_window()) == EINA_FALSE;
}

Evas_Object* MwMiniControllerMgr::_window() const
{
    return _windowController ? _windowController->getEvasObject() : nullptr;
}

void MwMiniControllerMgr::_focusChangedCb(void* data, Evas_Object*, void*)
{
    static_cast<MwMiniControllerMgr*>(data)->_choosePanelSurface();
}

void MwMiniControllerMgr::_notificationChangedCb(void* data)
{
    static_cast<MwMiniControllerMgr*>(data)->_choosePanelSurface();
}

void MwMiniControllerMgr::_preferenceChangedCb(const char*, void* data)
{
    static_cast<MwMiniControllerMgr*>(data)->_choosePanelSurface();
}

void MwMiniControllerMgr::_createLockscreenMiniController()
{
    _createMiniController<MwLockscreenMiniController>(LOCKSCREEN);
}

template <typename Surface>
void MwMiniControllerMgr::_createMiniController(Kind kind)
{
    MW_LOGI("BEGIN");
    if (!_model) {
        MW_LOGE("_model is nullptr");
        return;
    }
    if (std::any_of(_miniControllers.begin(), _miniControllers.end(),
            [kind](const Entry& entry) { return entry.kind == kind; })) {
        MW_LOGI("Lockscreen minicontroller is already existed");
        return;
    }
    auto* controller = new Surface(_model, _appController, _windowController);
    controller->create();
    const unsigned int id = controller->getActionSignal().addListener([this](MwMiniController::ActionType action) {
        MW_LOGI("action type signal: [%d]", action);
        if (!_dispatchCommandToAppController(action))
            MW_LOGE("_dispatchCommandToAppController : [%d] failed!!!", action);
    });
    _miniControllers.push_back({controller, id, kind});
    controller->update();
}

void MwMiniControllerMgr::_end(Entry& entry)
{
    if (entry.actionListenerId != 0)
        entry.controller->getActionSignal().removeListener(std::exchange(entry.actionListenerId, 0));
    entry.controller->destroy();
}

void MwMiniControllerMgr::_destroyMiniController(Kind kind)
{
    const auto found = std::find_if(
        _miniControllers.begin(), _miniControllers.end(), [kind](const Entry& entry) { return entry.kind == kind; });
    if (found == _miniControllers.end())
        return;
    Entry entry = *found;
    _miniControllers.erase(found);
    _end(entry);
}

void MwMiniControllerMgr::_destoryAllMiniController()
{
    MW_LOGI("BEGIN");
    for (Entry& entry : std::exchange(_miniControllers, {}))
        _end(entry);
    if (_alarmAppControl)
        _terminateAlarmService();
    MW_LOGI("END");
}

void MwMiniControllerMgr::_updateAll()
{
    for (const Entry& entry : _miniControllers)
        entry.controller->update();
}

void MwMiniControllerMgr::_onRecorderUpdated()
{
    const auto state = _model->getRecorderState();
    if (state == REC_STATE_READY) {
        MW_LOGI("destroy mini controller");
        _destoryAllMiniController();
        return;
    }
    MW_LOGI("update mini controller");
    _updateAll();
    _choosePanelSurface();
    if (MwSystemMgr::getInstance()->isLockscreenOn() && state == REC_STATE_RECORDING)
        _createLockscreenMiniController();
}

void MwMiniControllerMgr::_onPlayerUpdated()
{
    MW_LOGI("BEGIN");
    switch (_model->getPlayerState()) {
    case PLAY_STATE_NONE:
        _later(&MwMiniControllerMgr::_playbackEnded);
        break;
    case PLAY_STATE_PLAYING:
        _updateAll();
        _choosePanelSurface();
        if (MwSystemMgr::getInstance()->isLockscreenOn())
            _createLockscreenMiniController();
        break;
    case PLAY_STATE_PAUSED:
        if (_miniControllers.empty())
            break;
        _requestAlarmService();
        _updateAll();
        break;
    default:
        break;
    }
    MW_LOGI("END");
}

void MwMiniControllerMgr::_playbackEnded()
{
    // A recording may have begun meanwhile: its surfaces are not this playback's.
    if (_model->getPlayerState() != PLAY_STATE_NONE || isRecording(*_model))
        return;
    MW_LOGI("destroy mini controller");
    _destoryAllMiniController();
}

void MwMiniControllerMgr::_onSystemInfo(MwSignalMgr::SystemInfo info)
{
    MW_LOGI("system info signal: [%d]", info);
    switch (info) {
    case MwSignalMgr::LOCKSCREEN_CHANGED: {
        if (!MwSystemMgr::getInstance()->isLockscreenOn())
            return _destroyMiniController(LOCKSCREEN);
        if (_model->getPlayerState() != PLAY_STATE_PLAYING && !isRecording(*_model))
            return;
        return _createLockscreenMiniController();
    }
    case MwSignalMgr::TIME_ZONE_CHANGED:
    case MwSignalMgr::REGION_FORMAT_CHANGED:
    case MwSignalMgr::CALL_REJECT_CHANGED:
        return _updateAll();
    default:
        return;
    }
}

void MwMiniControllerMgr::_onLifeCycle(MwSignalMgr::LifeCycle lifeCycle)
{
    MW_LOGI("Life Cycle : [%d]", lifeCycle);
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

void MwMiniControllerMgr::_appPause()
{
    _choosePanelSurface();
    if (_model->getPlayerState() == PLAY_STATE_PAUSED)
        _requestAlarmService();
}

void MwMiniControllerMgr::_appResume()
{
    _choosePanelSurface();
    if (_alarmAppControl)
        _terminateAlarmService();
}

void MwMiniControllerMgr::_appTerminate()
{
    _destoryAllMiniController();
    _removeListeners();
}

// Out of the callback of a button or a window that this may delete.
void MwMiniControllerMgr::_later(void (MwMiniControllerMgr::*operation)())
{
    panekit::WTimer::addJob([this, operation, alive = std::weak_ptr<void>(_alive)](void*) {
        if (!alive.expired())
            (this->*operation)();
    });
}

bool MwMiniControllerMgr::_dispatchCommandToAppController(MwMiniController::ActionType action)
{
    switch (action) {
    case MwMiniController::ACTION_START_RECORD:
    case MwMiniController::ACTION_STOP_PLAY:
        return true;
    case MwMiniController::ACTION_PAUSE_RECORD:
        return _dispatch(MwAppController::PAUSE_RECORDING, "recording pause failed!!!");
    case MwMiniController::ACTION_RESUME_RECORD:
        return _dispatch(MwAppController::RESUME_RECORDING, "recording resume failed!!!");
    case MwMiniController::ACTION_STOP_RECORD:
        _stopRecord();
        return true;
    case MwMiniController::ACTION_CANCEL_RECORD:
        _later(&MwMiniControllerMgr::_cancelRecord);
        return true;
    case MwMiniController::ACTION_RESUME_PLAY:
        return _dispatch(MwAppController::RESUME_PLAYING, "recording resume failed!!!");
    case MwMiniController::ACTION_PAUSE_PLAY:
        return _dispatch(MwAppController::PAUSE_PLAYING, "recording pause failed!!!");
    case MwMiniController::ACTION_NEXT_PLAY:
        return _dispatch(MwAppController::PLAY_NEXT, "play next failed!!!");
    case MwMiniController::ACTION_PREV_PLAY:
        return _dispatch(MwAppController::PLAY_PREVIOUS, "play previous failed!!!");
    case MwMiniController::ACTION_REQUEST_HIDE:
        _later(&MwMiniControllerMgr::_hideLockscreen);
        return true;
    }
    MW_LOGE("Invalid minicontroller action signal!");
    return true;
}

bool MwMiniControllerMgr::_dispatch(MwAppController::Command command, const char* failure)
{
    if (_appController->dispatchCommand(command))
        return true;
    MW_LOGE("%s", failure);
    return false;
}

void MwMiniControllerMgr::_stopRecord()
{
    if (!_model->isTooShort()) {
        _appController->dispatchCommandAsync(MwAppController::STOP_RECORDING, _stopCb, nullptr);
        return;
    }
    MW_LOGI("current elapsedTime is under 1 sec");
    mwPost("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT");
    _appController->dispatchCommandAsync(MwAppController::CANCEL_RECORDING, _tooShortCb, nullptr);
}

void MwMiniControllerMgr::_tooShortCb(MwAppController::Command, MwAppController::Result result, void*)
{
    MW_LOGI("async Command result [%d]", result);
    if (result == MwAppController::FAIL)
        MW_LOGE("STOP_RECORDING failed");
}

void MwMiniControllerMgr::_stopCb(MwAppController::Command, MwAppController::Result result, void*)
{
    MW_LOGI("async Command result [%d]", result);
    if (result == MwAppController::FAIL) {
        MW_LOGE("STOP_RECORDING failed");
        return;
    }
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MINI_CONTROLLER_RECORDING_SAVED);
}

void MwMiniControllerMgr::_cancelRecord()
{
    if (_dispatch(MwAppController::CANCEL_RECORDING, "recording cancel failed!!!"))
        _model->clearBookMark();
    ui_app_exit();
}

void MwMiniControllerMgr::_requestAlarmService()
{
    MW_LOGI("BEGIN");
    if (const int result = _alarmAppControl.close(); result != 0)
        MW_LOGE("app_control_destroy failed : [%d]", result);
    MwHandle<app_control_h, app_control_destroy> request;
    int result = app_control_create(request.out());
    if (result != 0) {
        MW_LOGE("app_control_create failed : [%d]", result);
        return;
    }
    result = app_control_set_app_id(request.get(), ALARM_SERVICE_ID);
    if (result == 0) {
        void* expected
            = MwAppReplies::expect(_alive, [this](app_control_h, app_control_result_e answer) { _alarmReply(answer); });
        result = app_control_send_launch_request(request.get(), MwAppReplies::replyCb, expected);
    }
    if (result != 0) {
        MW_LOGE("app_control_set_app_id failed : [%d]", result);
        return;
    }
    _alarmAppControl = std::move(request);
    MW_LOGI("END");
}

void MwMiniControllerMgr::_alarmReply(app_control_result_e result)
{
    MW_LOGI("BEGIN - result : [%d]", result);
    if (_model->getPlayerState() != PLAY_STATE_PAUSED) {
        MW_LOGE("player status is not paused!!!");
        return;
    }
    if (result == APP_CONTROL_RESULT_SUCCEEDED)
        _destoryAllMiniController();
    MW_LOGI("END");
}

void MwMiniControllerMgr::_terminateAlarmService()
{
    if (!_alarmAppControl) {
        MW_LOGE("_alarmAppControl is nullptr");
        return;
    }
    if (const int result = app_control_send_terminate_request(_alarmAppControl.get()); result != 0)
        MW_LOGE("app_control_send_terminate_request failed : [%d]", result);
    if (const int result = _alarmAppControl.close(); result != 0)
        MW_LOGE("app_control_destroy failed : [%d]", result);
}
