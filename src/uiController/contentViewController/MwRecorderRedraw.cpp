// The recorder screen: redraw from the model.
#include "MwRecorderContentViewController.h"

#include <cstdlib>
#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <panekit/WPopupController.h>

#include "MwCircleRecordingEffect.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwModel.h"
#include "MwRecordingTime.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WTimer;

namespace {

constexpr auto TIME_PART = "recording_time";
constexpr auto TIME_CLIP_PART = "recording_time_clip_rect";
constexpr auto FILE_NAME_PART = "file_name_text";
constexpr auto SUBTITLE_PART = "subtitle_text";
constexpr auto EFFECT_PART = "recording_effect";
constexpr double STATUS_UPDATE_INTERVAL = 0.05;
constexpr double BLINK_INTERVAL = 1.0;

}

void MwRecorderContentViewController::_updateContentView()
{
    if (!_isComplete())
        return;
    _destroyAllButtons();
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
    _lastShownSeconds = 0;
    _setCallRejection(false);
    _destroyRecordingStatusUpdateTimer();
    _updateFileName(getModel()->getRenameString());
    _updateSubtitle();
    _updateRecordingEffect(false);
    _updateBlinking(false);
    _updateRecordingTime();
    _createRecordButton();
    _createRecordingsButton();
}

void MwRecorderContentViewController::_updateRecording()
{
    _updateBlinking(false);
    _createRecordingStatusUpdateTimer();
    _updateFileName(getModel()->getCurrentRecordingFileName());
    _updateRecordingEffect(true);
    _createStopButton();
    if (!getModel()->isRequestMode())
        _createBookmarkButton();
    _createPauseButton();
    _createDiscardButton();
}

void MwRecorderContentViewController::_updatePaused()
{
    _updateRecordingTime();
    _destroyRecordingStatusUpdateTimer();
    _updateBlinking(true);
    _updateRecordingEffect(false);
    _createStopButton();
    if (!getModel()->isRequestMode())
        _createBookmarkButton();
    _createResumeButton();
    _createDiscardButton();
}

void MwRecorderContentViewController::_updateFileName(const std::string& name)
{
    if (name.empty())
        MW_LOGW("clear file name");
    const std::string markup = name.empty() ? "" : mwAdopt(elm_entry_utf8_to_markup(name.c_str()));
    elm_object_part_text_set(getEvasObject(), FILE_NAME_PART, markup.c_str());
}

void MwRecorderContentViewController::_updateSubtitle()
{
    if (getModel()->getFileFormat() == MwModel::FORMAT_AMR) {
        elm_object_domain_translatable_part_text_set(
            getEvasObject(), SUBTITLE_PART, textdomain(nullptr), "IDS_MW_BODY_MWRECLIMITFORMMS");
        return;
    }
    elm_object_domain_part_text_translatable_set(getEvasObject(), SUBTITLE_PART, textdomain(nullptr), EINA_FALSE);
    elm_object_part_text_set(getEvasObject(), SUBTITLE_PART, "");
}

void MwRecorderContentViewController::_updateRecordingTime()
{
    const int maximum = getModel()->isRequestMode() ? getModel()->getEstimatedRecordingMaxTime() : 0;
    const unsigned int seconds
        = mwShownSeconds(getModel()->getElapsedTime(), static_cast<unsigned int>(maximum > 0 ? maximum : 0));
    if (seconds != 0 && seconds == _lastShownSeconds)
        return;
    elm_object_part_text_set(getEvasObject(), TIME_PART, mwRecordingTimeText(seconds).c_str());
    _lastShownSeconds = seconds;
}

void MwRecorderContentViewController::_createRecordingStatusUpdateTimer()
{
    if (!_statusUpdateTimer.expired()) {
        MW_LOGW("Recording status update timer is already running!");
        return;
    }
    MW_LOGW("Create recording status update timer!");
    _statusUpdateTimer = WTimer::addTimer(STATUS_UPDATE_INTERVAL, [this](void*) {
        const auto state = getModel()->getRecorderState();
        if (state != REC_STATE_RECORDING) {
            MW_LOGE("Invalid recorder state! [%d]", mwNumber(state));
            return false;
        }
        _updateRecordingTime();
        return true;
    });
}

void MwRecorderContentViewController::_destroyRecordingStatusUpdateTimer() { WTimer::destroy(_statusUpdateTimer); }

void MwRecorderContentViewController::_updateBlinking(bool blink)
{
    if (!blink) {
        WTimer::destroy(_blinkTimer);
        elm_layout_signal_emit(getEvasObject(), "show_recording_time", "*");
        return;
    }
    if (_blinkTimer.expired())
        _blinkTimer = WTimer::addTimer(BLINK_INTERVAL, [this](void*) { return _blink(); });
}

bool MwRecorderContentViewController::_blink()
{
    const char* state = edje_object_part_state_get(elm_layout_edje_get(getEvasObject()), TIME_CLIP_PART, nullptr);
    const bool isShown = state && std::string(state) == "default";
    elm_layout_signal_emit(getEvasObject(), isShown ? "hide_recording_time" : "show_recording_time", "*");
    return true;
}

void MwRecorderContentViewController::_updateRecordingEffect(bool show)
{
    Evas_Object* canvas = elm_object_part_content_get(getEvasObject(), EFFECT_PART);
    if (show) {
        elm_layout_signal_emit(getEvasObject(), "show_recording_effect", "");
        if (canvas)
            return;
        auto* effect = new MwCircleRecordingEffect(getModel());
        if (!effect->create(getEvasObject()))
            effect->destroy();
        return;
    }
    elm_layout_signal_emit(getEvasObject(), "reset_recording_effect", "");
    if (!canvas)
        return;
    auto* effect = MwCircleRecordingEffect::fromCanvas(canvas);
    if (!effect) {
        MW_LOGE("recordingEffect is nullptr");
        return;
    }
    effect->destroy();
}

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

void MwRecorderContentViewController::_createUpdateNextRecordingFileNameTimer()
{
    if (!_nextNameIdler.expired()) {
        MW_LOGW("update next recording file name ider is already running!");
        return;
    }
    MW_LOGW("create idler to update next recording file name");
    _nextNameIdler = WTimer::addIdler([this](void*) {
        _updateNextRecordingFileName();
        return false;
    });
}

void MwRecorderContentViewController::_updateNextRecordingFileName()
{
    if (!_isComplete())
        return;
    getModel()->updateLastRecordedFileNumber();
    if (!_isRecordingOrPaused())
        return;
    getModel()->updateNextRecordingFileName();
    _updateFileName(getModel()->getCurrentRecordingFileName());
}
