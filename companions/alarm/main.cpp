// Replies after ten minutes (MEWLO_ALARM_SECONDS): the paused playback has waited long enough. A terminate request
// ends it without a reply.
#include "app.h"

#include <Ecore.h>

#include <cstdlib>

namespace {

constexpr double DEFAULT_WAIT = 600.0; // seconds

app_control_h request = nullptr;

double waitTime()
{
    const char* text = std::getenv("MEWLO_ALARM_SECONDS");
    const double seconds = text != nullptr ? std::strtod(text, nullptr) : 0.0;
    return seconds > 0.0 ? seconds : DEFAULT_WAIT;
}

Eina_Bool expiredCb(void*)
{
    app_control_reply_to_launch_request(nullptr, request, APP_CONTROL_RESULT_SUCCEEDED);
    ui_app_exit();
    return ECORE_CALLBACK_CANCEL;
}

void control(app_control_h received, bool first, void*)
{
    if (!first)
        return;
    app_control_clone(&request, received);
    ecore_timer_add(waitTime(), expiredCb, nullptr);
}

void terminate(void*)
{
    if (request != nullptr)
        app_control_destroy(request);
}

}

int main(int argc, char** argv)
{
    app_set_id("com.tovanic.mewlo-alarmservice");
    const ui_app_lifecycle_s lifecycle = {nullptr, control, nullptr, nullptr, terminate};
    return service_app_main(argc, argv, &lifecycle, nullptr);
}
