#include "TrayIcon.h"

#include <cstring>

#include <unistd.h>

namespace {

constexpr auto WATCHER = "org.kde.StatusNotifierWatcher";
constexpr auto WATCHER_PATH = "/StatusNotifierWatcher";
constexpr auto ITEM = "org.kde.StatusNotifierItem";
constexpr auto ITEM_PATH = "/StatusNotifierItem";

int activateCalled(sd_bus_message* call, void* self, sd_bus_error*)
{
    const int result = sd_bus_reply_method_return(call, nullptr);
    static_cast<const TrayIcon*>(self)->activate();
    return result;
}

int readText(sd_bus*, const char*, const char*, const char* property, sd_bus_message* reply, void* self, sd_bus_error*)
{
    const auto& look = static_cast<const TrayIcon*>(self)->look();
    const std::string_view name = property;
    std::string text;
    if (name == "Category")
        text = "ApplicationStatus";
    else if (name == "Id")
        text = "com.tovanic.mewlo-lite";
    else if (name == "Status")
        text = look.icon.empty() ? "Passive" : "Active";
    else if (name == "Title")
        text = look.title;
    else if (name == "IconName")
        text = look.icon;
    return sd_bus_message_append(reply, "s", text.c_str());
}

int readNoMenu(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
{
    return sd_bus_message_append(reply, "b", 0);
}

const sd_bus_vtable TABLE[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("Activate", "ii", "", activateCalled, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("SecondaryActivate", "ii", "", activateCalled, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("ContextMenu", "ii", "", activateCalled, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_PROPERTY("Category", "s", readText, 0, 0),
    SD_BUS_PROPERTY("Id", "s", readText, 0, 0),
    SD_BUS_PROPERTY("Title", "s", readText, 0, 0),
    SD_BUS_PROPERTY("Status", "s", readText, 0, 0),
    SD_BUS_PROPERTY("IconName", "s", readText, 0, 0),
    SD_BUS_PROPERTY("ItemIsMenu", "b", readNoMenu, 0, 0),
    SD_BUS_SIGNAL("NewTitle", "", 0),
    SD_BUS_SIGNAL("NewIcon", "", 0),
    SD_BUS_SIGNAL("NewStatus", "s", 0),
    SD_BUS_VTABLE_END,
};

}

TrayIcon::TrayIcon(host::BusInLoop& bus, std::function<void()> activated)
    : _bus(bus)
    , _activated(std::move(activated))
    , _name("org.kde.StatusNotifierItem-" + std::to_string(::getpid()) + "-1")
{
    sd_bus_slot* slot = nullptr;
    if (sd_bus_add_object_vtable(bus.get(), &slot, ITEM_PATH, ITEM, TABLE, this) >= 0)
        _slots.emplace_back(slot);
    sd_bus_request_name(bus.get(), _name.c_str(), 0);
    _slots.push_back(host::onSignal(bus.get(), "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
        "NameOwnerChanged", [this](sd_bus_message* message) {
            const char* name = nullptr;
            const char* before = nullptr;
            const char* now = nullptr;
            if (sd_bus_message_read(message, "sss", &name, &before, &now) >= 0 && std::strcmp(name, WATCHER) == 0
                && *now != '\0')
                _register();
        }));
    _register();
}

void TrayIcon::_register()
{
    const host::Message call = host::newCall(_bus.get(), WATCHER, WATCHER_PATH, WATCHER, "RegisterStatusNotifierItem");
    if (call != nullptr && sd_bus_message_append(call.get(), "s", _name.c_str()) >= 0)
        host::send(_bus.get(), call);
}

void TrayIcon::setLook(const Look& look)
{
    _look = look;
    sd_bus* bus = _bus.get();
    sd_bus_emit_signal(bus, ITEM_PATH, ITEM, "NewTitle", "");
    sd_bus_emit_signal(bus, ITEM_PATH, ITEM, "NewIcon", "");
    sd_bus_emit_signal(bus, ITEM_PATH, ITEM, "NewStatus", "s", look.icon.empty() ? "Passive" : "Active");
}
