#include "MwNotiMiniController.h"

#include <Ecore_X.h>
#include <Elementary.h>
#include <app.h>
#include <vconf.h>

#include <utility>

#include "MwLog.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr MwMiniSurfaceLook LOOK = {"mewlo_mini_controller", MINICONTROL_VIEWER_PANEL, "edje/MwMiniNotification.edj",
    "mini_controller", "rec_info_state_swallow", "rec_info_time", "*"};
constexpr int WIDTH = 720; // design units
constexpr int HEIGHT = 172;
constexpr int RECORDING_TEXT_SIZE = 40;
constexpr int PLAYING_TEXT_SIZE = 32;
constexpr auto TEXT_COLOR = "ATO020";
constexpr double STATUS_INTERVAL = 0.05; // seconds
constexpr double BLINK_INTERVAL = 1.0;

constexpr auto RECORD_STYLE = "mewlo/circle_button/noti_record";
constexpr auto PLAY_STYLE = "mewlo/circle_button/noti_play";
constexpr MwMiniButton STOP = {"mini_controller_stop_btn", RECORD_STYLE,
    "miniNotification/recorder_player_button_stop.png", "AO104", nullptr, nullptr, "IDS_MW_BODY_STOP"};
constexpr MwMiniButton PAUSE_RECORD = {"mini_controller_pause_btn", RECORD_STYLE,
    "miniNotification/recorder_player_button_pause.png", "AO104", nullptr, nullptr, "IDS_MW_BODY_PAUSE"};
constexpr MwMiniButton RESUME_RECORD
    = {"mini_controller_pause_btn", RECORD_STYLE, "miniNotification/player_button_recorder.png", "AO116",
        "miniNotification/player_button_recorder_bg.png", "AO128", "IDS_MW_SK_RESUME"};
constexpr MwMiniButton PLAY = {"mini_controller_play_play_btn", PLAY_STYLE, "miniNotification/player_button_play.png",
    "AO001i", "miniNotification/player_button_bg.png", "AO104", "IDS_MW_BUTTON_PLAY"};
constexpr MwMiniButton PAUSE_PLAY
    = {"mini_controller_play_play_btn", PLAY_STYLE, "miniNotification/player_button_pause.png", "AO001i",
        "miniNotification/player_button_bg.png", "AO104", "IDS_MW_BODY_PAUSE"};
constexpr MwMiniButton PREVIOUS = {"mini_controller_play_prev_btn", PLAY_STYLE,
    "miniNotification/player_button_prev.png", "AO104", nullptr, nullptr, "IDS_MW_BUTTON_PREVIOUS"};
constexpr MwMiniButton NEXT = {"mini_controller_play_next_btn", PLAY_STYLE, "miniNotification/player_button_next.png",
    "AO104", nullptr, nullptr, "IDS_MW_BUTTON_NEXT"};
constexpr MwMiniButton MENU = {"mini_controller_menu_btn", "mewlo/noti_menu",
    "miniNotification/album_default_recorder.png", "AO104", nullptr, nullptr, "IDS_MW_APP_NAME"};
constexpr MwMiniButton CLOSE
    = {"close_button", "on_white_bg_mewlo", nullptr, nullptr, nullptr, nullptr, "IDS_MW_BUTTON_CLOSE"};

// The service's event brings no data along.
MwNotiMiniController* live = nullptr;

bool isSideways(int rotation) { return rotation == 90 || rotation == 270; }

}

MwNotiMiniController::MwNotiMiniController(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : MwMiniController(model, appController, windowController)
    , _surface(LOOK)
{
    live = this;
}

MwNotiMiniController::~MwNotiMiniController() { live = nullptr; }

void MwNotiMiniController::preload(Evas_Object* window)
{
    MwMiniSurface::preload(window, LOOK, {&MENU, &CLOSE, &PAUSE_RECORD, &RESUME_RECORD, &STOP, &PLAY});
}

void MwNotiMiniController::create()
{
    MW_LOGI("BEGIN");
    const bool created = _surface.create(_minicontrolEventCb, _seenChangedCb, this);
    if (_surface.getWindow()) {
        _rotation = elm_win_rotation_get(_surface.getWindow());
        _resize();
        evas_object_show(_surface.getWindow());
    }
    if (!created)
        return;
    _createCloseButton();
    _createMenuButton();
    _registerXEvent();
    MwSignalMgr::getInstance()->getSystemInfoSignal().addListener(
        [this](MwSignalMgr::SystemInfo info) { _onSystemInfo(info); }, _surface.getLayout());
    MW_LOGI("END");
}

void MwNotiMiniController::destroy()
{
    if (_clientMessageHandler)
        ecore_event_handler_del(std::exchange(_clientMessageHandler, nullptr));
    _destroyTimers();
    delete this;
}

// As wide as a phone's screen; on a wider one a bar of that length would only be in the way. The service clips the
// window where the screen is narrower, turned or not.
void MwNotiMiniController::_resize() { _surface.resize(MwMiniSurface::scaled(WIDTH), MwMiniSurface::scaled(HEIGHT)); }

void MwNotiMiniController::_createMenuButton()
{
    _surface.addFixedButton(MENU, _clickedCb<&MwNotiMiniController::_menuButtonClicked>, this);
}

void MwNotiMiniController::_createCloseButton()
{
    _surface.addFixedButton(CLOSE, _clickedCb<&MwNotiMiniController::_closeButtonClicked>, this);
}

void MwNotiMiniController::_registerXEvent()
{
    if (ECORE_X_EVENT_CLIENT_MESSAGE != 0) // not without X11
        _clientMessageHandler = ecore_event_handler_add(ECORE_X_EVENT_CLIENT_MESSAGE, _clientMessageCb, this);
}

unsigned char MwNotiMiniController::_clientMessageCb(void* data, int, void* event)
{
    auto* self = static_cast<MwNotiMiniController*>(data);
    const auto* message = static_cast<Ecore_X_Event_Client_Message*>(event);
    if (!self) {
        MW_LOGE("self is nullptr");
        return ECORE_CALLBACK_PASS_ON;
    }
    if (message->message_type != ECORE_X_ATOM_E_ILLUME_ROTATE_ROOT_ANGLE
        || static_cast<int>(message->data.l[0]) == self->_rotation)
        return ECORE_CALLBACK_PASS_ON;
    if (!self->_surface.getWindow()) {
        MW_LOGE("self->_win is nullptr");
        return ECORE_CALLBACK_PASS_ON;
    }
    self->_rotation = static_cast<int>(message->data.l[0]);
    self->_surface.signal(isSideways(self->_rotation) ? "sig_set_landscape_mode" : "sig_set_portrait_mode");
    self->_resize();
    return ECORE_CALLBACK_PASS_ON;
}

void MwNotiMiniController::_minicontrolEventCb(minicontrol_provider_event_e event, bundle*)
{
    if (event == MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE && live)
        live->_closeButtonClicked();
}

void MwNotiMiniController::_menuButtonClicked()
{
    MW_LOGI("BEGIN");
    openProgram();
    MW_LOGI("END");
}

// Playing ends with its surface only for the eye: the program has a window that the user did not close.
void MwNotiMiniController::_closeButtonClicked()
{
    if (isRecording()) {
        evas_object_hide(_surface.getWindow());
        return _requestCancelPopup();
    }
    if (!getWindowController())
        return ui_app_exit();
    _isClosed = true;
    evas_object_hide(_surface.getWindow());
    if (getModel()->getPlayerState() == PLAY_STATE_PLAYING)
        pausePlay();
}

void MwNotiMiniController::_requestCancelPopup()
{
    const bool asked = _cancelQuestion.ask([this](MwCancelQuestion::Answer answer) {
        if (answer == MwCancelQuestion::Answer::DISCARD)
            cancelRecord();
        else if (answer == MwCancelQuestion::Answer::GO_ON)
            evas_object_show(_surface.getWindow());
    });
    if (!asked)
        evas_object_show(_surface.getWindow());
}

void MwNotiMiniController::update()
{
    MW_LOGI("BEGIN");
    if (!getModel()) {
        MW_LOGE("getModel() is nullptr");
        return;
    }
    _surface.removeButtons();
    _destroyTimers();
    _isTimeShown = true;
    _surface.signal("show_rec_time_animated");
    const auto playerState = getModel()->getPlayerState();
    MW_LOGI("player state: [%d]", mwNumber(playerState));
    if (playerState == PLAY_STATE_PLAYING || playerState == PLAY_STATE_PAUSED) {
        _showPlaying(playerState == PLAY_STATE_PAUSED);
    } else {
        const auto recorderState = getModel()->getRecorderState();
        MW_LOGI("No playing!");
        MW_LOGI("recorder state: [%d]", mwNumber(recorderState));
        if (recorderState == REC_STATE_RECORDING)
            _showRecording();
        else if (recorderState == REC_STATE_PAUSED)
            _showRecordPaused();
        else
            MW_LOGI("no recordering or playing state!");
    }
    _surface.restoreFocus();
}

void MwNotiMiniController::_showPlaying(bool paused)
{
    _surface.signal(paused ? "mini_controller_state_play_paused" : "mini_controller_state_playing");
    const std::string path = getModel()->getCurrentPlayPath();
    _updateInfoText(path.substr(path.rfind('/') + 1));
    if (!getModel()->isPlayViewShown())
        _surface.addButton(PREVIOUS, _clickedCb<&MwNotiMiniController::_prevPlayButtonClicked>, this);
    if (paused)
        _surface.addButton(PLAY, _clickedCb<&MwNotiMiniController::_playButtonClicked>, this);
    else
        _surface.addButton(PAUSE_PLAY, _clickedCb<&MwNotiMiniController::_pauseButtonClicked>, this);
    if (!getModel()->isPlayViewShown())
        _surface.addButton(NEXT, _clickedCb<&MwNotiMiniController::_nextPlayButtonClicked>, this);
    if (!paused && std::exchange(_isClosed, false))
        evas_object_show(_surface.getWindow());
}

void MwNotiMiniController::_showRecording()
{
    _surface.signal("mini_controller_state_recording");
    _updateInfoText(getRecordingText());
    _updateRecordingTime();
    _watchTime();
    _surface.addButton(PAUSE_RECORD, _clickedCb<&MwNotiMiniController::_pauseRecordButtonClicked>, this);
    _surface.addButton(STOP, _clickedCb<&MwNotiMiniController::_stopRecordButtonClicked>, this);
}

void MwNotiMiniController::_showRecordPaused()
{
    _surface.signal("mini_controller_state_paused");
    _updateInfoText(getRecordingText());
    _updateRecordingTime();
    _watchTime();
    _surface.addButton(RESUME_RECORD, _clickedCb<&MwNotiMiniController::_resumeRecordButtonClicked>, this);
    _surface.addButton(STOP, _clickedCb<&MwNotiMiniController::_stopRecordButtonClicked>, this);
}

void MwNotiMiniController::_updateInfoText(const std::string& text)
{
    const bool plays = getModel()->getPlayerState() != PLAY_STATE_NONE;
    _surface.setInfo(text, TEXT_COLOR, plays ? PLAYING_TEXT_SIZE : RECORDING_TEXT_SIZE, plays);
}

void MwNotiMiniController::_updateRecordingTime()
{
    _shownTime = getTimeText();
    _surface.setTime(_shownTime);
}

// Nothing ticks that nobody sees.
void MwNotiMiniController::_watchTime()
{
    if (!_surface.isSeen() || !MwSystemMgr::getInstance()->isLCDOn())
        return;
    if (getModel()->getRecorderState() == REC_STATE_RECORDING)
        _createRecordingStatusUpdateTimer();
    else
        _createRecordPauseBlinkTimer();
}

void MwNotiMiniController::_createRecordingStatusUpdateTimer()
{
    if (!_statusUpdateTimer.expired()) {
        MW_LOGI("Recording status update timer is already running!");
        return;
    }
    MW_LOGI("Create recording status update timer!");
    _statusUpdateTimer = panekit::WTimer::addTimer(STATUS_INTERVAL, [this](void*) {
        if (getModel()->getRecorderState() != REC_STATE_RECORDING) {
            MW_LOGE("Invalid recorder state! [%d]", mwNumber(getModel()->getRecorderState()));
            return false;
        }
        if (getTimeText() != _shownTime)
            _updateRecordingTime();
        return true;
    });
}

void MwNotiMiniController::_createRecordPauseBlinkTimer()
{
    _pauseBlinkTimer = panekit::WTimer::addTimer(BLINK_INTERVAL, [this](void*) {
        _isTimeShown = !_isTimeShown;
        _surface.signal(_isTimeShown ? "show_rec_time_animated" : "hide_rec_time_animated");
        return true;
    });
}

void MwNotiMiniController::_destroyTimers()
{
    panekit::WTimer::destroy(_statusUpdateTimer);
    panekit::WTimer::destroy(_pauseBlinkTimer);
}

void MwNotiMiniController::_seenChangedCb(void* data)
{
    auto* self = static_cast<MwNotiMiniController*>(data);
    if (!self->_surface.isSeen())
        self->_destroyTimers();
    else if (self->isRecording())
        self->update();
}

void MwNotiMiniController::_onSystemInfo(MwSignalMgr::SystemInfo info)
{
    MW_LOGI("system info signal: [%d]", info);
    if (info == MwSignalMgr::THEME_CHANGED)
        return update(); // the text has its colour in it
    if (info != MwSignalMgr::POWER_STATE_CHANGED)
        return;
    if (!MwSystemMgr::getInstance()->isLCDOn())
        _destroyTimers();
    else if (isRecording())
        update();
}
