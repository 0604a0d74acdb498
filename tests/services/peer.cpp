// The other side of the launch tests. What it does stands in the extra "do" of the request, or else in its
// environment; what happens to it goes, one word a line, to the file PEER_LOG.
#include "app.h"
#include "message_port.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include <csignal>
#include <unistd.h>

namespace {

app_control_h kept = nullptr;

void note(const std::string& word)
{
    const char* path = std::getenv("PEER_LOG");
    std::FILE* file = path != nullptr ? std::fopen(path, "a") : nullptr;
    if (file == nullptr)
        return;
    std::fprintf(file, "%s\n", word.c_str());
    std::fclose(file);
}

std::string extra(app_control_h request, const char* key)
{
    char* value = nullptr;
    app_control_get_extra_data(request, key, &value);
    const std::string text = value != nullptr ? value : "";
    std::free(value);
    return text;
}

void reply(app_control_h request, app_control_result_e result)
{
    app_control_h answer = nullptr;
    app_control_create(&answer);
    app_control_add_extra_data(answer, "path", "/tmp/one.m4a");
    note("reply " + std::to_string(app_control_reply_to_launch_request(answer, request, result)));
    app_control_destroy(answer);
}

// Starts the same program as another application would.
void callAnother(const char* task)
{
    app_control_h request = nullptr;
    app_control_create(&request);
    app_control_set_app_id(request, "org.example.peer-one");
    app_control_set_launch_mode(request, APP_CONTROL_LAUNCH_MODE_GROUP);
    app_control_add_extra_data(request, "do", task);
    note("call " + std::to_string(app_control_send_launch_request(request, nullptr, nullptr)));
    app_control_destroy(request);
}

void control(app_control_h request, bool first, void*)
{
    const std::string task = extra(request, "do");
    note((first ? "first " : "again ") + task);
    if (task.empty() && std::getenv("PEER_CALLS") != nullptr) {
        callAnother(std::getenv("PEER_CALLS"));
    } else if (task == "reply" || task == "fail") {
        reply(request, task == "reply" ? APP_CONTROL_RESULT_SUCCEEDED : APP_CONTROL_RESULT_FAILED);
        ui_app_exit();
    } else if (task == "stay") {
        reply(request, APP_CONTROL_RESULT_SUCCEEDED);
    } else if (task == "clone") { // both belong to one call: the second answer comes too late
        app_control_clone(&kept, request);
        reply(request, APP_CONTROL_RESULT_SUCCEEDED);
        reply(kept, APP_CONTROL_RESULT_FAILED);
        app_control_destroy(kept);
        ui_app_exit();
    } else if (task == "keep") {
        app_control_clone(&kept, request);
    } else if (task == "crash") {
        ::raise(SIGKILL);
    } else if (task == "exit") {
        ui_app_exit();
    }
}

void messageCb(int, const bundle* message, void*)
{
    const char* data = bundle_get_str(message, "mewlo_indicator_data");
    note(std::string("message ") + (data != nullptr ? data : ""));
}

bool create(void*)
{
    note("create");
    if (std::getenv("PEER_PORT") != nullptr)
        note(message_port_register(std::getenv("PEER_PORT"), messageCb, nullptr) > 0 ? "port" : "no port");
    return std::getenv("PEER_REFUSES") == nullptr;
}

}

int main(int argc, char** argv)
{
    const char* id = std::getenv("PEER_ID");
    app_set_id(id != nullptr ? id : "org.example.peer-one");
    const ui_app_lifecycle_s lifecycle = {
        create, control, [](void*) { note("pause"); }, [](void*) { note("resume"); }, [](void*) { note("terminate"); }};
    const bool window = std::getenv("PEER_TOOLKIT") != nullptr;
    const int status
        = window ? ui_app_main(argc, argv, &lifecycle, nullptr) : service_app_main(argc, argv, &lifecycle, nullptr);
    note("end");
    return status;
}
