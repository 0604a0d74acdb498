#include "launch/AppControl.h"

#include "state/Log.h"
#include <MainLoop.h>

#include <utility>

namespace platform {

namespace {

    bool sendReply(sd_bus_message* call, int result, const bundle_s& extras)
    {
        sd_bus_message* reply = nullptr;
        const bool sent = sd_bus_message_new_method_return(call, &reply) >= 0
            && sd_bus_message_append_basic(reply, SD_BUS_TYPE_INT32, &result) >= 0 && extras.appendTo(reply)
            && sd_bus_send(sd_bus_message_get_bus(call), reply, nullptr) >= 0;
        sd_bus_message_unref(reply);
        sd_bus_flush(sd_bus_message_get_bus(call)); // the process may end right afterwards
        return sent;
    }

    void refuse(sd_bus_message* call, const char* why)
    {
        sd_bus_reply_method_errorf(call, "com.tovanic.AppControl1.NoReply", "%s", why);
        sd_bus_flush(sd_bus_message_get_bus(call));
    }

    void answerAndRelease(sd_bus_message* call, int result, const bundle_s& extras)
    {
        if (!sendReply(call, result, extras)) {
            PLATFORM_LOGE("the reply cannot be sent");
            refuse(call, "the reply cannot be sent");
        }
        sd_bus_message_unref(call);
    }

}

PendingReply::PendingReply(sd_bus_message* call)
    : _call(sd_bus_message_ref(call))
{
}

PendingReply::~PendingReply()
{
    if (_call == nullptr)
        return;
    onMainLoop([call = _call] {
        refuse(call, "the request was dropped");
        sd_bus_message_unref(call);
    });
}

bool PendingReply::isAnswered() const
{
    const Lock lock(_mutex);
    return _call == nullptr;
}

int PendingReply::answer(app_control_result_e result, const bundle_s& extras)
{
    sd_bus_message* call = nullptr;
    {
        const Lock lock(_mutex);
        call = std::exchange(_call, nullptr);
    }
    if (call == nullptr) {
        PLATFORM_LOGW("the request was answered before");
        return APP_CONTROL_ERROR_NO_REPLY_EXPECTED;
    }
    onMainLoop([=] { answerAndRelease(call, result, extras); });
    return APP_CONTROL_ERROR_NONE;
}

}
