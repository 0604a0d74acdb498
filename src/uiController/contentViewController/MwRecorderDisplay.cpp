#include "MwRecorderDisplay.h"

#include <cstdlib>
#include <libintl.h>

#include <Elementary.h>

#include "MwCircleRecordingEffect.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwRecordingTime.h"
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

MwRecorderDisplay::MwRecorderDisplay(Evas_Object* layout, MwModel* model)
    : _layout(layout)
    , _model(model)
{
}

MwRecorderDisplay::~MwRecorderDisplay()
{
    WTimer::destroy(_blinkTimer);
    WTimer::destroy(_statusUpdateTimer);
}

void MwRecorderDisplay::_updateFileName(const std::string& name)
{
    if (name.empty())
        MW_LOGW("clear file name");
    const std::string markup = name.empty() ? "" : mwAdopt(elm_entry_utf8_to_markup(name.c_str()));
    elm_object_part_text_set(_layout, FILE_NAME_PART, markup.c_str());
}

void MwRecorderDisplay::_updateSubtitle()
{
    if (_model->getFileFormat() == MwModel::FORMAT_AMR) {
        elm_object_domain_translatable_part_text_set(
            _layout, SUBTITLE_PART, textdomain(nullptr), "IDS_MW_BODY_MWRECLIMITFORMMS");
        return;
    }
    elm_object_domain_part_text_translatable_set(_layout, SUBTITLE_PART, textdomain(nullptr), EINA_FALSE);
    elm_object_part_text_set(_layout, SUBTITLE_PART, "");
}

void MwRecorderDisplay::resetRecordingTime() { _lastShownSeconds = 0; }

void MwRecorderDisplay::_updateRecordingTime()
{
    const int maximum = _model->isRequestMode() ? _model->getEstimatedRecordingMaxTime() : 0;
    const unsigned int seconds
        = mwShownSeconds(_model->getElapsedTime(), static_cast<unsigned int>(maximum > 0 ? maximum : 0));
    if (seconds != 0 && seconds == _lastShownSeconds)
        return;
    elm_object_part_text_set(_layout, TIME_PART, mwRecordingTimeText(seconds).c_str());
    _lastShownSeconds = seconds;
}

void MwRecorderDisplay::_createRecordingStatusUpdateTimer()
{
    if (!_statusUpdateTimer.expired()) {
        MW_LOGW("Recording status update timer is already running!");
        return;
    }
    MW_LOGW("Create recording status update timer!");
    _statusUpdateTimer = WTimer::addTimer(STATUS_UPDATE_INTERVAL, [this](void*) {
        const auto state = _model->getRecorderState();
        if (state != REC_STATE_RECORDING) {
            MW_LOGE("Invalid recorder state! [%d]", mwNumber(state));
            return false;
        }
        _updateRecordingTime();
        return true;
    });
}

void MwRecorderDisplay::_destroyRecordingStatusUpdateTimer() { WTimer::destroy(_statusUpdateTimer); }

void MwRecorderDisplay::_updateBlinking(bool blink)
{
    if (!blink) {
        WTimer::destroy(_blinkTimer);
        elm_layout_signal_emit(_layout, "show_recording_time", "*");
        return;
    }
    if (_blinkTimer.expired())
        _blinkTimer = WTimer::addTimer(BLINK_INTERVAL, [this](void*) { return _blink(); });
}

bool MwRecorderDisplay::_blink()
{
    const char* state = edje_object_part_state_get(elm_layout_edje_get(_layout), TIME_CLIP_PART, nullptr);
    const bool isShown = state && std::string(state) == "default";
    elm_layout_signal_emit(_layout, isShown ? "hide_recording_time" : "show_recording_time", "*");
    return true;
}

void MwRecorderDisplay::_updateRecordingEffect(bool show)
{
    Evas_Object* canvas = elm_object_part_content_get(_layout, EFFECT_PART);
    if (show) {
        elm_layout_signal_emit(_layout, "show_recording_effect", "");
        if (canvas)
            return;
        auto* effect = new MwCircleRecordingEffect(_model);
        if (!effect->create(_layout))
            effect->destroy();
        return;
    }
    elm_layout_signal_emit(_layout, "reset_recording_effect", "");
    if (!canvas)
        return;
    auto* effect = MwCircleRecordingEffect::fromCanvas(canvas);
    if (!effect) {
        MW_LOGE("recordingEffect is nullptr");
        return;
    }
    effect->destroy();
}

void MwRecorderDisplay::_updateBookMarkEffect(unsigned int seconds)
{
    elm_layout_signal_emit(_layout, "show_bookmark_effect", "c_source");
    elm_object_part_text_set(_layout, "bookmark_time", mwRecordingTimeText(seconds).c_str());
}
