#include "Commands.h"

#include <Ecore.h>
#include <app_control.h>

#include <cstdio>
#include <string>
#include <unistd.h>

#include "MwHandle.h"
#include "MwText.h"

namespace {

constexpr double REPLY_AFTER_TERMINATE_SECONDS = 10.0;

using AppControl = MwHandle<app_control_h, app_control_destroy>;

std::string extra(app_control_h reply, const char* key)
{
    char* value = nullptr;
    return reply != nullptr && app_control_get_extra_data(reply, key, &value) == 0 ? mwAdopt(value) : std::string();
}

// Prints what came back. A path is believed only when there is such a file: a recording that was discarded has none.
int report(app_control_h reply, app_control_result_e result)
{
    const std::string path = extra(reply, APP_CONTROL_DATA_SELECTED);
    if (result == APP_CONTROL_RESULT_SUCCEEDED && !path.empty() && ::access(path.c_str(), R_OK) == 0) {
        std::puts(path.c_str());
        return tool::OK;
    }
    const std::string error = extra(reply, "error");
    std::fprintf(stderr, "mewlo-tool: %s\n", error.empty() ? "no recording was made" : error.c_str());
    return tool::FAILED;
}

void replyCb(app_control_h, app_control_h reply, app_control_result_e result, void* status)
{
    if (result == APP_CONTROL_RESULT_APP_STARTED)
        return;
    *static_cast<int*>(status) = report(reply, result);
    ecore_main_loop_quit();
}

// Ctrl-C ends the other instance, which saves what it has and replies.
Eina_Bool terminateCb(void* request, int, void*)
{
    app_control_send_terminate_request(static_cast<app_control_h>(request));
    const auto giveUp = [](void*) -> Eina_Bool {
        ecore_main_loop_quit();
        return ECORE_CALLBACK_CANCEL;
    };
    ecore_timer_add(REPLY_AFTER_TERMINATE_SECONDS, giveUp, nullptr);
    return ECORE_CALLBACK_DONE;
}

bool fill(app_control_h request, const std::string& mime, const std::string& limit)
{
    return app_control_set_operation(request, APP_CONTROL_OPERATION_CREATE_CONTENT) == 0
        && app_control_set_app_id(request, "com.tovanic.mewlo-lite") == 0
        && app_control_set_launch_mode(request, APP_CONTROL_LAUNCH_MODE_GROUP) == 0
        && (mime.empty() || app_control_set_mime(request, mime.c_str()) == 0)
        && (limit.empty() || app_control_add_extra_data(request, "SIZE", limit.c_str()) == 0);
}

}

int tool::request(const Arguments& arguments)
{
    const std::string limit = option(arguments, "--max-kb");
    long kilobytes = 0;
    if (arguments.size() % 2 != 0 || (!limit.empty() && !parseNumber(limit, kilobytes))) {
        std::fputs("usage: mewlo-tool request [--mime TYPE] [--max-kb N]\n", stderr);
        return WRONG_USE;
    }
    ecore_init();
    int status = FAILED;
    {
        AppControl request;
        if (app_control_create(request.out()) != 0 || !fill(request.get(), option(arguments, "--mime"), limit)
            || app_control_send_launch_request(request.get(), replyCb, &status) != 0) {
            std::fputs("mewlo-tool: the recorder cannot be started\n", stderr);
        } else {
            ecore_event_handler_add(ECORE_EVENT_SIGNAL_EXIT, terminateCb, request.get());
            ecore_main_loop_begin();
        }
    }
    ecore_shutdown();
    return status;
}
