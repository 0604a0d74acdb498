#include "MwLaunchRequests.h"

#include "MwLog.h"
#include "MwModel.h"
#include "MwRequestParser.h"

namespace {

constexpr int SMALLEST_REFUSED_LIMIT = 2; // kilobytes

bool isTiny(const MwModel& asked) { return asked.getSizeLimit() <= SMALLEST_REFUSED_LIMIT; }

void refuse(app_control_h request, const char* error)
{
    MwHandle<app_control_h, app_control_destroy> reply;
    if (const int result = app_control_create(reply.out()); result != 0) {
        MW_LOGE("app_control_create failed:[%d]", result);
        return;
    }
    if (error)
        MW_CALL(app_control_add_extra_data, reply.get(), "error", error);
    MW_CALL(app_control_reply_to_launch_request, reply.get(), request, APP_CONTROL_RESULT_FAILED);
}

}

MwLaunchRequests::MwLaunchRequests(MwModel& model)
    : _model(model)
{
}

MwLaunchRequests::Result MwLaunchRequests::receive(app_control_h request)
{
    if (_model.isStorageHeld())
        return _receiveDuringTake(request);
    _take(request);
    if (!isTiny(_model))
        return TAKEN;
    // No recording fits.
    refuse(_model.getRequestHandle(), "min_size_error");
    _model.setRequestHandle(nullptr);
    return REFUSED;
}

MwLaunchRequests::Result MwLaunchRequests::_receiveDuringTake(app_control_h request)
{
    MwModel asked;
    MwRequestParser().parse(request, &asked);
    if (isTiny(asked)) {
        refuse(request, "min_size_error");
        return REFUSED;
    }
    if (!asked.isRequestMode())
        return IGNORED;
    // An instance that already serves a request ends with its answer.
    if (_model.isRequestMode()) {
        refuse(request, nullptr);
        return REFUSED;
    }
    if (_waiting)
        refuse(_waiting.get(), nullptr);
    MW_CALL(app_control_clone, _waiting.out(), request);
    return WAITS;
}

void MwLaunchRequests::recorderUpdated()
{
    if (!_waiting || _model.isStorageHeld())
        return;
    _take(_waiting.get());
    _waiting.close();
}

void MwLaunchRequests::_take(app_control_h request)
{
    MwRequestParser().parse(request, &_model);
    _model.setRequestHandle(request);
}
