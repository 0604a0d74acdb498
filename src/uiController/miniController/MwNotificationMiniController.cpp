#include "MwNotificationMiniController.h"

#include <notification_control.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwText.h"

namespace {

constexpr auto PAUSE = "pause";
constexpr auto RESUME = "resume";
constexpr auto STOP = "stop";
constexpr auto CANCEL = "cancel";

}

MwNotificationMiniController::~MwNotificationMiniController() { notification_control_withdraw(); }

void MwNotificationMiniController::update()
{
    if (!isRecording())
        return;
    const bool paused = getModel()->getRecorderState() == REC_STATE_PAUSED;
    const std::string title = getModel()->getCurrentRecordingFileName();
    // A running time would be a new notification every second.
    const std::string text = paused ? getRecordingText() + " \u00b7 " + getTimeText() : getRecordingText();
    const std::string pauseOrResume = mwTranslate(paused ? "IDS_MW_SK_RESUME" : "IDS_MW_BODY_PAUSE");
    const std::string stop = mwTranslate("IDS_MW_BODY_STOP");
    const std::string cancel = mwTranslate("IDS_MW_BUTTON_CANCEL");
    const notification_control_action_s actions[] = {
        {NOTIFICATION_CONTROL_OPENED, ""},
        {paused ? RESUME : PAUSE, pauseOrResume.c_str()},
        {STOP, stop.c_str()},
        {CANCEL, cancel.c_str()},
    };
    const int result
        = notification_control_post(title.c_str(), text.c_str(), actions, std::size(actions), _pressedCb, this);
    if (result != 0)
        MW_LOGE("notification_control_post failed : [%d]", result);
}

void MwNotificationMiniController::_pressedCb(const char* key, void* data)
{
    static_cast<MwNotificationMiniController*>(data)->_pressed(key);
}

void MwNotificationMiniController::_pressed(const std::string& key)
{
    MW_LOGI("notification action: [%s]", key.c_str());
    if (key == NOTIFICATION_CONTROL_OPENED)
        return openProgram();
    if (key == PAUSE)
        return pauseRecord();
    if (key == RESUME)
        return resumeRecord();
    if (key == STOP)
        return stopRecord();
    if (key != CANCEL)
        return;
    const bool asked = _cancelQuestion.ask([this](MwCancelQuestion::Answer answer) {
        if (answer == MwCancelQuestion::Answer::DISCARD)
            cancelRecord();
    });
    if (!asked)
        MW_LOGE("nobody can be asked");
}
