#include "MwMiniController.h"

#include "MwLog.h"

MwMiniController::MwMiniController(
    MwModel* model, MwAppController* appController, panekit::WWindowController* windowController)
    : _model(model)
    , _appController(appController)
    , _windowController(windowController)
{
}

void MwMiniController::_emit(ActionType action)
{
    MW_LOGI("BEGIN");
    _actionSignal.emit(action);
    MW_LOGI("END");
}
