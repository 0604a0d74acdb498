// Shows in the desktop's tray what the recorder does in the background; a click brings the recorder back. Without a
// tray every change is only logged.
#include "TrayIcon.h"

#include "app.h"
#include "message_port.h"
#include "state/Log.h"

#include <cstring>
#include <memory>

namespace {

constexpr auto RECORDER = "com.tovanic.mewlo-lite";
constexpr auto RECORDER_BUS_NAME = "com.tovanic.mewlo_lite";
constexpr auto PORT = "mewlo_indicator_port";
constexpr auto DATA = "mewlo_indicator_data";

struct Shown {
    const char* data;
    const char* icon;
    const char* title;
};

constexpr Shown LOOKS[] = {
    {.data = "bg_recording_start", .icon = "media-record", .title = "Recording"},
    {.data = "bg_recording_pause", .icon = "media-playback-pause", .title = "Recording paused"},
    {.data = "bg_playing_start", .icon = "media-playback-start", .title = "Playing"},
    {.data = "bg_playing_pause", .icon = "media-playback-pause", .title = "Playback paused"},
};

std::unique_ptr<TrayIcon> tray;
host::Slot recorderWatch;

void show(const char* data)
{
    TrayIcon::Look look;
    for (const Shown& entry : LOOKS)
        if (std::strcmp(entry.data, data) == 0)
            look = {entry.icon, entry.title};
    PLATFORM_LOGI("%s", look.title.empty() ? "nothing in the background" : look.title.c_str());
    if (tray != nullptr)
        tray->setLook(look);
}

void messageCb(int, const bundle* message, void*)
{
    if (const char* data = bundle_get_str(message, DATA))
        show(data);
}

void raiseRecorder()
{
    app_context_h context = nullptr;
    if (app_manager_get_app_context(RECORDER, &context) != APP_ERROR_NONE)
        return;
    app_manager_resume_app(context);
    app_manager_context_destroy(context);
}

// A recorder that was killed cannot take its icon away.
void watchRecorder(sd_bus* bus)
{
    recorderWatch = host::onSignal(bus, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
        "NameOwnerChanged", [](sd_bus_message* message) {
            const char* name = nullptr;
            const char* before = nullptr;
            const char* now = nullptr;
            if (sd_bus_message_read(message, "sss", &name, &before, &now) >= 0
                && std::strcmp(name, RECORDER_BUS_NAME) == 0 && *now == '\0')
                show("");
        });
}

bool create(void*)
{
    host::BusInLoop* bus = host::sessionBus();
    if (bus == nullptr || message_port_register(PORT, messageCb, nullptr) < 0) {
        PLATFORM_LOGE("there is no session bus to listen on");
        return false;
    }
    watchRecorder(bus->get());
    tray = std::make_unique<TrayIcon>(*bus, raiseRecorder);
    bus->setClosed(ui_app_exit); // the session has ended
    return true;
}

void terminate(void*)
{
    recorderWatch.reset();
    tray.reset();
}

}

int main(int argc, char** argv)
{
    app_set_id("com.tovanic.indicator");
    const ui_app_lifecycle_s lifecycle = {create, nullptr, nullptr, nullptr, terminate};
    return service_app_main(argc, argv, &lifecycle, nullptr);
}
