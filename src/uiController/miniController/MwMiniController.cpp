#include "MwMiniController.h"

#include <app.h>
#include <vconf.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr unsigned int MINUTE = 60; // seconds
constexpr unsigned int HOUR = 3600;

}

MwMiniController::MwMiniController(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : _model(model)
    , _appController(appController)
    , _windowController(windowController)
{
}

bool MwMiniController::isRecording() const { return mwIsRecordingOrPaused(_model->getRecorderState()); }

std::string MwMiniController::getRecordingText() const
{
    if (_model->getRecorderState() == REC_STATE_PAUSED)
        return mwTranslate("IDS_MW_BODY_PAUSED_M_NOUN");
    return mwTranslate(MwSystemMgr::getInstance()->getRejectCall() ? "IDS_MW_SBODY_REJECTING_CALLS_ABB"
                                                                   : "IDS_MW_HEADER_RECORDING_M_VOICE");
}

std::string MwMiniController::getTimeText() const
{
    const auto seconds = static_cast<unsigned int>(_model->getElapsedTime() / 1000);
    const unsigned int minutes = seconds % HOUR / MINUTE;
    return seconds < HOUR ? mwFormat("%02u:%02u", minutes, seconds % MINUTE)
                          : mwFormat("%02u:%02u:%02u", seconds / HOUR, minutes, seconds % MINUTE);
}

void MwMiniController::openProgram()
{
    char* id = nullptr;
    app_context_h context = nullptr;
    app_get_id(&id);
    const std::string own = mwAdopt(id);
    if (const int result = app_manager_get_app_context(own.c_str(), &context); result != 0) {
        MW_LOGE("app_manager_get_app_context().. [0x%x]", static_cast<unsigned>(result));
        return;
    }
    if (vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 0) != 0)
        MW_LOGE("vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, VCONFKEY_IDLE_UNLOCK)");
    if (const int result = app_manager_resume_app(context); result != 0)
        MW_LOGE("app_manager_resume_app().. [0x%x]", static_cast<unsigned>(result));
    app_manager_context_destroy(context);
}

void MwMiniController::_emit(ActionType action)
{
    MW_LOGI("BEGIN");
    _actionSignal.emit(action);
    MW_LOGI("END");
}
