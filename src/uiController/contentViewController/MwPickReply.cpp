#include "MwPickReply.h"

#include <app.h>
#include <app_control.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"

bool mwReplyWithRecording(MwModel& model, const std::string& path)
{
    if (path.empty() || !model.fitsRequest(path)) {
        MW_LOGE("there is no such recording any more");
        return false;
    }
    MwHandle<app_control_h, app_control_destroy> reply;
    if (!MW_CALL(app_control_create, reply.out()))
        return false;
    MW_CALL(app_control_add_extra_data, reply.get(), APP_CONTROL_DATA_SELECTED, path.c_str());
    MW_CALL(app_control_reply_to_launch_request, reply.get(), model.getRequestHandle(), APP_CONTROL_RESULT_SUCCEEDED);
    reply.close();
    model.setRequestHandle(nullptr);
    ui_app_exit();
    return true;
}
