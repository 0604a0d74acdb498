#include "MwLockscreenMiniController.h"

#include <Elementary.h>

#include <algorithm>

#include "MwLog.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr MwMiniSurfaceLook LOOK = {"mewlo-minicontrol.LOCKSCREEN", MINICONTROL_VIEWER_LOCKSCREEN,
    "edje/MwMiniLockScreen.edj", "mini_lockscreen", "title_text_swallow", "mini_lockscreen_time_text", "c_source"};
constexpr int WIDTH = 720; // design units
constexpr int SIDES = 11;
constexpr int HEIGHT = 234;
constexpr int RECORDING_TEXT_SIZE = 40;
constexpr int PLAYING_TEXT_SIZE = 32;
constexpr auto RECORDING_COLOR = "ATO018";
constexpr auto PLAYING_COLOR = "ATO047";
constexpr double TIME_INTERVAL = 0.3; // seconds
constexpr double BLINK_INTERVAL = 1.0;

constexpr auto STYLE = "mewlo/circle_button/lockscreen";
constexpr MwMiniButton STOP = {"mini_lockscreen_stop_btn", STYLE, "miniLockscreen/ls_controller_btn_stop.png", "AO047",
    nullptr, nullptr, "IDS_MW_BODY_STOP"};
constexpr MwMiniButton PAUSE_RECORD = {"mini_lockscreen_pause_btn", STYLE, "miniLockscreen/ls_controller_btn_pause.png",
    "AO047", nullptr, nullptr, "IDS_MW_BODY_PAUSE"};
constexpr MwMiniButton RESUME_RECORD
    = {"mini_lockscreen_record_btn", STYLE, "miniLockscreen/player_button_recorder.png", "AO116",
        "miniLockscreen/player_Power_bg.png", "AO128", "IDS_MW_SK_RESUME"};
constexpr MwMiniButton PLAY = {"mini_lockscreen_play_play_btn", STYLE, "miniLockscreen/ls_controller_btn_play.png",
    "AO047", nullptr, nullptr, "IDS_MW_BUTTON_PLAY"};
constexpr MwMiniButton PAUSE_PLAY = {"mini_lockscreen_play_pause_btn", STYLE,
    "miniLockscreen/ls_controller_btn_pause.png", "AO047", nullptr, nullptr, "IDS_MW_BODY_PAUSE"};
constexpr MwMiniButton PREVIOUS = {"mini_lockscreen_play_pre_btn", STYLE, "miniLockscreen/ls_controller_btn_pre_02.png",
    "AO046", nullptr, nullptr, "IDS_MW_BUTTON_PREVIOUS"};
constexpr MwMiniButton NEXT = {"mini_lockscreen_play_next_btn", STYLE, "miniLockscreen/ls_controller_btn_next_02.png",
    "AO046", nullptr, nullptr, "IDS_MW_BUTTON_NEXT"};

// The service's event brings no data along.
MwLockscreenMiniController* live = nullptr;

}

MwLockscreenMiniController::MwLockscreenMiniController(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : MwMiniController(model, appController, windowController)
    , _surface(LOOK)
{
    live = this;
}

MwLockscreenMiniController::~MwLockscreenMiniController() { live = nullptr; }

void MwLockscreenMiniController::create()
{
    MW_LOGI("BEGIN");
    const bool created = _surface.create(_minicontrolEventCb, _seenChangedCb, this);
    if (_surface.getWindow()) {
        _surface.resize(MwMiniSurface::scaled(WIDTH) - MwMiniSurface::scaled(SIDES), MwMiniSurface::scaled(HEIGHT));
        evas_object_show(_surface.getWindow());
    }
    if (!created)
        return;
    MwSignalMgr::getInstance()->getSystemInfoSignal().addListener(
        [this](MwSignalMgr::SystemInfo info) { _onSystemInfo(info); }, _surface.getLayout());
    MW_LOGI("END");
}

void MwLockscreenMiniController::destroy()
{
    _destroyUpdateTimeTimer();
    _destroyPauseBlinkTimer();
    delete this;
}

void MwLockscreenMiniController::_minicontrolEventCb(minicontrol_provider_event_e event, bundle*)
{
    if (event != MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE)
        return;
    MW_LOGI("MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE");
    if (live)
        live->requestHide();
}

void MwLockscreenMiniController::update()
{
    MW_LOGI("BEGIN");
    if (!getModel()) {
        MW_LOGE("getModel() is nullptr");
        return;
    }
    _surface.removeButtons();
    _destroyUpdateTimeTimer();
    _destroyPauseBlinkTimer();
    _isTimeShown = true;
    _surface.signal("show_rec_time_animated");
    const auto playerState = getModel()->getPlayerState();
    MW_LOGI("player state: [%d]", mwNumber(playerState));
    if (playerState == PLAY_STATE_PLAYING || playerState == PLAY_STATE_PAUSED) {
        _showPlaying(playerState == PLAY_STATE_PAUSED);
    } else {
        MW_LOGI("No playing!");
        MW_LOGI("recorder state: [%d]", mwNumber(getModel()->getRecorderState()));
        if (isRecording())
            _showRecording(getModel()->getRecorderState() == REC_STATE_PAUSED);
        else
            MW_LOGI("no recordering or playing state!");
    }
    _surface.restoreFocus();
}

void MwLockscreenMiniController::_showPlaying(bool paused)
{
    _surface.signal(paused ? "mini_lockscreen_state_play_paused" : "mini_lockscreen_state_playing");
    // Without the list on the screen the model knows no records; the file has a name all the same.
    const std::string path = getModel()->getCurrentPlayPath();
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(path);
    _setInfoText(info ? info->displayName : path.substr(path.rfind('/') + 1));
    if (!getModel()->isPlayViewShown())
        _surface.addButton(PREVIOUS, _clickedCb<&MwLockscreenMiniController::_prePlayButtonClicked>, this);
    if (paused)
        _surface.addButton(PLAY, _clickedCb<&MwLockscreenMiniController::_playPlayButtonClicked>, this);
    else
        _surface.addButton(PAUSE_PLAY, _clickedCb<&MwLockscreenMiniController::_pausePlayButtonClicked>, this);
    if (!getModel()->isPlayViewShown())
        _surface.addButton(NEXT, _clickedCb<&MwLockscreenMiniController::_nextPlayButtonClicked>, this);
}

void MwLockscreenMiniController::_showRecording(bool paused)
{
    _surface.signal(paused ? "mini_lockscreen_state_recording_paused" : "mini_lockscreen_state_recording");
    _setInfoText(getRecordingText());
    _setTimeText();
    _watchTime();
    if (paused)
        _surface.addButton(RESUME_RECORD, _clickedCb<&MwLockscreenMiniController::_resumeRecordButtonClicked>, this);
    else
        _surface.addButton(PAUSE_RECORD, _clickedCb<&MwLockscreenMiniController::_pauseRecordButtonClicked>, this);
    _surface.addButton(STOP, _clickedCb<&MwLockscreenMiniController::_stopRecordButtonClicked>, this);
}

void MwLockscreenMiniController::_setInfoText(const std::string& text)
{
    const bool plays = getModel()->getPlayerState() != PLAY_STATE_NONE;
    _surface.setInfo(
        text, plays ? PLAYING_COLOR : RECORDING_COLOR, plays ? PLAYING_TEXT_SIZE : RECORDING_TEXT_SIZE, true);
}

void MwLockscreenMiniController::_setTimeText() { _surface.setTime(getTimeText()); }

// Nothing ticks that nobody sees.
void MwLockscreenMiniController::_watchTime()
{
    if (!_surface.isSeen() || !MwSystemMgr::getInstance()->isLCDOn())
        return;
    if (getModel()->getRecorderState() == REC_STATE_RECORDING)
        _createUpdateTimeTimer();
    else
        _createPauseBlinkTimer();
}

void MwLockscreenMiniController::_createUpdateTimeTimer()
{
    if (!_updateTimeTimer.expired()) {
        MW_LOGI("Recording status update timer is already running!");
        return;
    }
    MW_LOGI("Create recording status update timer!");
    _updateTimeTimer = panekit::WTimer::addTimer(TIME_INTERVAL, [this](void*) {
        _setTimeText();
        return true;
    });
}

void MwLockscreenMiniController::_destroyUpdateTimeTimer() { panekit::WTimer::destroy(_updateTimeTimer); }

void MwLockscreenMiniController::_createPauseBlinkTimer()
{
    _pauseBlinkTimer = panekit::WTimer::addTimer(BLINK_INTERVAL, [this](void*) {
        _isTimeShown = !_isTimeShown;
        _surface.signal(_isTimeShown ? "show_rec_time_animated" : "hide_rec_time_animated");
        return true;
    });
}

void MwLockscreenMiniController::_destroyPauseBlinkTimer() { panekit::WTimer::destroy(_pauseBlinkTimer); }

void MwLockscreenMiniController::_seenChangedCb(void* data)
{
    auto* self = static_cast<MwLockscreenMiniController*>(data);
    if (self->_surface.isSeen() && self->isRecording())
        return self->update();
    self->_destroyUpdateTimeTimer();
    self->_destroyPauseBlinkTimer();
}

void MwLockscreenMiniController::_onSystemInfo(MwSignalMgr::SystemInfo info)
{
    MW_LOGI("system info signal: [%d]", info);
    if (info != MwSignalMgr::POWER_STATE_CHANGED)
        return;
    if (!MwSystemMgr::getInstance()->isLCDOn()) {
        _destroyUpdateTimeTimer();
        _destroyPauseBlinkTimer();
    } else if (isRecording()) {
        update();
    }
}
