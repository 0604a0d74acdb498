#include "MwPrivateStorage.h"

#include <unistd.h>

#include <cstdlib>
#include <string>
#include <utility>

#include "MwAppReplies.h"
#include "MwLog.h"
#include "MwSystemMgr.h"

namespace {

constexpr auto PRIVATE_STORAGE_APP_ID = "com.tovanic.setting.private";

double patience()
{
    constexpr double SECONDS = 10;
    const char* chosen = std::getenv("MEWLO_PRIVATE_SECONDS");
    return chosen != nullptr ? std::strtod(chosen, nullptr) : SECONDS;
}

}

MwPrivateStorage::~MwPrivateStorage()
{
    cancel();
    handBack();
}

void MwPrivateStorage::open(std::function<void(bool open)> opened)
{
    cancel();
    _opened = std::move(opened);
    _wasClosed = !MwSystemMgr::getInstance()->isPrivateModeEnabled();
    if (!_requestPrivateModeAppControl(true))
        return _answer(false);
    _patience = panekit::WTimer::addTimer(patience(), [this](void*) {
        MW_LOGW("the private storage does not answer");
        if (_privateModeRequest)
            MW_CALL(app_control_send_terminate_request, _privateModeRequest.get());
        _answer(false);
        return false;
    });
}

void MwPrivateStorage::handBack()
{
    if (std::exchange(_isOpenedHere, false))
        _requestPrivateModeAppControl(false);
}

void MwPrivateStorage::close()
{
    _isOpenedHere = false;
    _requestPrivateModeAppControl(false);
}

void MwPrivateStorage::cancel()
{
    if (_privateModeRequest)
        MW_CALL(app_control_send_terminate_request, _privateModeRequest.get());
    _opened = nullptr;
    _answer(false);
}

void MwPrivateStorage::_answer(bool open)
{
    panekit::WTimer::destroy(_patience);
    if (const int result = _privateModeRequest.close(); result != 0)
        MW_LOGE("app_control_destroy failed : [%d]!!!", result);
    _alive = std::make_shared<int>(0); // a late reply is nobody's
    _isOpenedHere = _isOpenedHere || (open && _wasClosed);
    if (const auto opened = std::exchange(_opened, nullptr))
        opened(open);
}

bool MwPrivateStorage::_requestPrivateModeAppControl(bool mount)
{
    MwHandle<app_control_h, app_control_destroy> request;
    if (!MW_CALL(app_control_create, request.out())
        || !MW_CALL(app_control_set_app_id, request.get(), PRIVATE_STORAGE_APP_ID)
        || !MW_CALL(app_control_add_extra_data, request.get(), "type", "move_to_private")
        || !MW_CALL(app_control_add_extra_data, request.get(), "pid", std::to_string(::getpid()).c_str())
        || !MW_CALL(app_control_add_extra_data, request.get(), "value", mount ? "on" : "off")
        || !MW_CALL(app_control_set_launch_mode, request.get(), APP_CONTROL_LAUNCH_MODE_GROUP))
        return false;
    if (!mount)
        return MW_CALL(app_control_send_launch_request, request.get(), nullptr, nullptr);
    void* answer = MwAppReplies::expect(
        _alive, [this](app_control_h reply, app_control_result_e result) { _privateModeReply(reply, result); });
    if (!MW_CALL(app_control_send_launch_request, request.get(), MwAppReplies::replyCb, answer))
        return false;
    _privateModeRequest = std::move(request);
    return true;
}

void MwPrivateStorage::_privateModeReply(app_control_h reply, app_control_result_e result)
{
    MW_LOGW("result : [%d]", result);
    const bool open = result == APP_CONTROL_RESULT_SUCCEEDED && MwAppReplies::extraOf(reply, "result") == "Success";
    MW_CALL(app_control_send_terminate_request, _privateModeRequest.get());
    _answer(open);
}
