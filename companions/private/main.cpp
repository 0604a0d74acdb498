// Opens and closes the private storage for the recorder: the request's extra "value" is "on" or "off", the reply's
// extra "result" is "Success" when that was done.
#include "app.h"
#include "storage.h"
#include "vconf.h"

#include <cstdlib>
#include <memory>
#include <string>

#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr mode_t OWNER_ONLY = 0700;

std::string extra(app_control_h request, const char* key)
{
    char* value = nullptr;
    if (app_control_get_extra_data(request, key, &value) != 0)
        return {};
    const std::unique_ptr<char, decltype(&std::free)> owner(value, &std::free);
    return value;
}

// The root is made with the first question for it.
bool isUsable(const std::string& root)
{
    struct stat status { };
    return ::stat(root.c_str(), &status) == 0 && S_ISDIR(status.st_mode) && ::chmod(root.c_str(), OWNER_ONLY) == 0
        && ::access(root.c_str(), W_OK | X_OK) == 0;
}

bool execute(const std::string& value)
{
    if (value == "on")
        return isUsable(storage_private_root()) && vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 1) == 0;
    return value == "off" && vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, 0) == 0;
}

void control(app_control_h request, bool, void*)
{
    const bool done = execute(extra(request, "value"));
    app_control_h reply = nullptr;
    if (app_control_create(&reply) == 0) {
        app_control_add_extra_data(reply, "result", done ? "Success" : "Fail");
        app_control_reply_to_launch_request(
            reply, request, done ? APP_CONTROL_RESULT_SUCCEEDED : APP_CONTROL_RESULT_FAILED);
        app_control_destroy(reply);
    }
    ui_app_exit();
}

}

int main(int argc, char** argv)
{
    app_set_id("com.tovanic.setting.private");
    const ui_app_lifecycle_s lifecycle = {nullptr, control, nullptr, nullptr, nullptr};
    return service_app_main(argc, argv, &lifecycle, nullptr);
}
