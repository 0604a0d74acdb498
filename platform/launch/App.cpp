#include "app.h"

#include "launch/AppControl.h"
#include "launch/AppProcess.h"
#include "launch/Identity.h"
#include "launch/Toolkit.h"

using platform::AppProcess;

struct app_context_s {
    std::string appId;
};

namespace {

int runApp(int argc, char** argv, const ui_app_lifecycle_s* lifecycle, void* userData, platform::Toolkit toolkit)
{
    if (lifecycle == nullptr || argc < 1 || AppProcess::current() != nullptr)
        return EXIT_FAILURE;
    AppProcess process(*lifecycle, userData, toolkit);
    return process.run(argc, argv);
}

}

int ui_app_main(int argc, char** argv, const ui_app_lifecycle_s* lifecycle, void* user_data)
{
    return runApp(argc, argv, lifecycle, user_data, platform::Toolkit::ELEMENTARY);
}

int service_app_main(int argc, char** argv, const ui_app_lifecycle_s* lifecycle, void* user_data)
{
    return runApp(argc, argv, lifecycle, user_data, platform::Toolkit::NONE);
}

void ui_app_exit(void)
{
    if (AppProcess::current() != nullptr)
        AppProcess::current()->exit();
}

void ui_app_close(void)
{
    if (AppProcess::current() != nullptr)
        AppProcess::current()->close();
}

void ui_app_set_window_visible(bool visible)
{
    if (AppProcess::current() != nullptr)
        AppProcess::current()->setWindowVisible(visible);
}

void ui_app_set_window(void* window) { platform::setMainWindow(window); }

int app_manager_get_app_context(const char* app_id, app_context_h* context)
{
    if (app_id == nullptr || context == nullptr || !platform::isAppId(app_id))
        return APP_ERROR_INVALID_PARAMETER;
    const bool running = (AppProcess::current() != nullptr && platform::appId() == app_id)
        || host::hasOwnerOnSessionBus(platform::busNameOf(app_id).c_str());
    if (!running)
        return APP_ERROR_NOT_FOUND;
    *context = new app_context_s{app_id};
    return APP_ERROR_NONE;
}

// Our own window comes back without a request: that would begin a new session of the application.
int app_manager_resume_app(app_context_h context)
{
    if (context == nullptr)
        return APP_ERROR_INVALID_PARAMETER;
    if (AppProcess::current() != nullptr && platform::appId() == context->appId) {
        platform::raiseMainWindow();
        return APP_ERROR_NONE;
    }
    app_control_s request;
    request.appId = context->appId;
    request.fields.set("operation", {APP_CONTROL_OPERATION_MAIN});
    const int sent = app_control_send_launch_request(&request, nullptr, nullptr);
    return sent == APP_CONTROL_ERROR_NONE ? APP_ERROR_NONE : APP_ERROR_FAILED;
}

int app_manager_context_destroy(app_context_h context)
{
    delete context;
    return APP_ERROR_NONE;
}
