#include "MwMiniController.h"

#include "MwLog.h"
#include "MwModel.h"
#include "MwRecorder.h"

MwMiniController::MwMiniController(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : _model(model)
    , _appController(appController)
    , _windowController(windowController)
{
}

bool MwMiniController::isRecording() const
{
    const int state = _model->getRecorderState();
    return state == MwRecorder::REC_STATE_RECORDING || state == MwRecorder::REC_STATE_PAUSED;
}

void MwMiniController::_emit(ActionType action)
{
    MW_LOGI("BEGIN");
    _actionSignal.emit(action);
    MW_LOGI("END");
}
