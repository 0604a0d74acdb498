#include "MwCancelQuestion.h"

#include <utility>

#include "MwAppReplies.h"
#include "MwLog.h"

namespace {

constexpr auto POPUP_APP_ID = "com.tovanic.mewlo-lite.popupapp";

}

MwCancelQuestion::~MwCancelQuestion()
{
    if (!_popupAppControl)
        return;
    if (const int result = app_control_send_terminate_request(_popupAppControl.get()); result != 0)
        MW_LOGE("app_control_send_terminate_request failed [%d]", result);
}

bool MwCancelQuestion::ask(std::function<void(Answer answer)> answered)
{
    if (_popupAppControl)
        return true;
    MwHandle<app_control_h, app_control_destroy> request;
    int result = app_control_create(request.out());
    if (result != 0) {
        MW_LOGE("app_control_create failed [%d]", result);
    } else if (result = app_control_set_app_id(request.get(), POPUP_APP_ID); result != 0) {
        MW_LOGE("app_control_set_app_id failed [%d]", result);
    } else {
        void* expected
            = MwAppReplies::expect(_alive, [this](app_control_h, app_control_result_e answer) { _reply(answer); });
        result = app_control_send_launch_request(request.get(), MwAppReplies::replyCb, expected);
        if (result != 0)
            MW_LOGE("app_control_send_launch_request failed [%d]", result);
    }
    if (result != 0) {
        MW_LOGE("ERROR END");
        return false;
    }
    _answered = std::move(answered);
    _popupAppControl = std::move(request);
    return true;
}

void MwCancelQuestion::_reply(app_control_result_e result)
{
    MW_LOGI("BEGIN - result : [%d]", result);
    _popupAppControl.close();
    const auto answered = std::exchange(_answered, nullptr);
    const Answer answer = result == APP_CONTROL_RESULT_SUCCEEDED ? Answer::DISCARD
        : result == APP_CONTROL_RESULT_FAILED                    ? Answer::GO_ON
                                                                 : Answer::NONE;
    if (answered)
        answered(answer); // may end this object
    MW_LOGI("END");
}
