#include "Notifier.h"

namespace host {

namespace {

    constexpr int32_t SHOWN_FOR = 3000; // milliseconds

    bool appendNotification(sd_bus_message* call, uint32_t replaces, const std::string& text)
    {
        return sd_bus_message_append(call, "susssasa{sv}i", "Mewlo Lite", replaces, "com.tovanic.mewlo-lite",
                   "Mewlo Lite", text.c_str(), 0, 2, "transient", "b", 1, "desktop-entry", "s",
                   "com.tovanic.mewlo-lite", SHOWN_FOR)
            >= 0;
    }

}

bool Notifier::show(const std::string& text, const std::function<void(const std::string& text)>& failed)
{
    BusInLoop* bus = sessionBus();
    if (bus == nullptr)
        return false;
    const Message call = newCall(bus->get(), "org.freedesktop.Notifications", "/org/freedesktop/Notifications",
        "org.freedesktop.Notifications", "Notify");
    if (call == nullptr || !appendNotification(call.get(), _id, text))
        return false;
    _call = callAsync(bus->get(), call, [this, text, failed](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) > 0 || sd_bus_message_read(reply, "u", &_id) < 0)
            failed(text);
    });
    return _call != nullptr;
}

}
