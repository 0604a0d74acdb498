#include "Mpris.h"

#include <cstring>

#include <unistd.h>

namespace host {

namespace {

    constexpr auto NAME = "org.mpris.MediaPlayer2.mewlo_lite";
    constexpr auto PATH = "/org/mpris/MediaPlayer2";
    constexpr auto ROOT_INTERFACE = "org.mpris.MediaPlayer2";
    constexpr auto PLAYER_INTERFACE = "org.mpris.MediaPlayer2.Player";

    int methodCalled(sd_bus_message* message, void* self, sd_bus_error*)
    {
        const std::string method = sd_bus_message_get_member(message);
        const int result = sd_bus_reply_method_return(message, nullptr);
        static_cast<const Mpris*>(self)->call(method); // last: it may end the object
        return result;
    }

    int seekCalled(sd_bus_message* message, void* self, sd_bus_error*)
    {
        int64_t offset = 0;
        const int result = sd_bus_message_read(message, "x", &offset);
        if (result < 0)
            return result;
        sd_bus_reply_method_return(message, nullptr);
        static_cast<const Mpris*>(self)->call(offset < 0 ? "SeekBack" : "SeekForward");
        return 1;
    }

    int ignoredCall(sd_bus_message* message, void*, sd_bus_error*)
    {
        return sd_bus_reply_method_return(message, nullptr);
    }

    int readText(
        sd_bus*, const char*, const char*, const char* property, sd_bus_message* reply, void* self, sd_bus_error*)
    {
        const std::string_view name = property;
        const char* text = "None";
        if (name == "PlaybackStatus")
            text = static_cast<const Mpris*>(self)->state().status.c_str();
        else if (name == "Identity")
            text = "Mewlo Lite";
        else if (name == "DesktopEntry")
            text = "com.tovanic.mewlo-lite";
        return sd_bus_message_append(reply, "s", text);
    }

    int readTruth(
        sd_bus*, const char*, const char*, const char* property, sd_bus_message* reply, void* self, sd_bus_error*)
    {
        const std::string_view name = property;
        const bool skips = name == "CanGoNext" || name == "CanGoPrevious";
        const bool truth = skips ? static_cast<const Mpris*>(self)->state().canSkip : name.starts_with("Can");
        return sd_bus_message_append(reply, "b", truth ? 1 : 0);
    }

    int readNumber(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
    {
        return sd_bus_message_append(reply, "d", 1.0);
    }

    int readPosition(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
    {
        return sd_bus_message_append(reply, "x", int64_t{0});
    }

    int readList(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
    {
        return sd_bus_message_append(reply, "as", 0);
    }

    int readMetadata(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* self, sd_bus_error*)
    {
        const auto& title = static_cast<const Mpris*>(self)->state().title;
        return sd_bus_message_append(reply, "a{sv}", 2, "mpris:trackid", "o", "/com/tovanic/mewlo_lite/track",
            "xesam:title", "s", title.c_str());
    }

    constexpr auto CHANGES = SD_BUS_VTABLE_PROPERTY_EMITS_CHANGE;

    const sd_bus_vtable ROOT_TABLE[] = {
        SD_BUS_VTABLE_START(0),
        SD_BUS_METHOD("Raise", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Quit", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_PROPERTY("CanQuit", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("CanRaise", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("HasTrackList", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("Identity", "s", readText, 0, 0),
        SD_BUS_PROPERTY("DesktopEntry", "s", readText, 0, 0),
        SD_BUS_PROPERTY("SupportedUriSchemes", "as", readList, 0, 0),
        SD_BUS_PROPERTY("SupportedMimeTypes", "as", readList, 0, 0),
        SD_BUS_VTABLE_END,
    };

    const sd_bus_vtable PLAYER_TABLE[] = {
        SD_BUS_VTABLE_START(0),
        SD_BUS_METHOD("Play", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Pause", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("PlayPause", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Stop", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Next", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Previous", "", "", methodCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Seek", "x", "", seekCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("SetPosition", "ox", "", ignoredCall, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("OpenUri", "s", "", ignoredCall, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_SIGNAL("Seeked", "x", 0),
        SD_BUS_PROPERTY("PlaybackStatus", "s", readText, 0, CHANGES),
        SD_BUS_PROPERTY("LoopStatus", "s", readText, 0, 0),
        SD_BUS_PROPERTY("Rate", "d", readNumber, 0, 0),
        SD_BUS_PROPERTY("MinimumRate", "d", readNumber, 0, 0),
        SD_BUS_PROPERTY("MaximumRate", "d", readNumber, 0, 0),
        SD_BUS_PROPERTY("Volume", "d", readNumber, 0, 0),
        SD_BUS_PROPERTY("Shuffle", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("Metadata", "a{sv}", readMetadata, 0, CHANGES),
        SD_BUS_PROPERTY("Position", "x", readPosition, 0, 0),
        SD_BUS_PROPERTY("CanGoNext", "b", readTruth, 0, CHANGES),
        SD_BUS_PROPERTY("CanGoPrevious", "b", readTruth, 0, CHANGES),
        SD_BUS_PROPERTY("CanPlay", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("CanPause", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("CanSeek", "b", readTruth, 0, 0),
        SD_BUS_PROPERTY("CanControl", "b", readTruth, 0, 0),
        SD_BUS_VTABLE_END,
    };

}

Mpris::Mpris(BusInLoop& bus, Called called)
    : _bus(bus)
    , _called(std::move(called))
{
    if (!_add(ROOT_INTERFACE, ROOT_TABLE) || !_add(PLAYER_INTERFACE, PLAYER_TABLE))
        return;
    // A second instance is a player of its own.
    for (const std::string& name : {std::string(NAME), NAME + (".instance" + std::to_string(::getpid()))})
        if (_name.empty() && sd_bus_request_name(bus.get(), name.c_str(), 0) >= 0)
            _name = name;
}

Mpris::~Mpris()
{
    if (!_name.empty() && _bus.isOpen())
        sd_bus_release_name_async(_bus.get(), nullptr, _name.c_str(), nullptr, nullptr);
}

bool Mpris::_add(const char* interface, const sd_bus_vtable* table)
{
    sd_bus_slot* slot = nullptr;
    if (sd_bus_add_object_vtable(_bus.get(), &slot, PATH, interface, table, this) < 0)
        return false;
    _slots.emplace_back(slot);
    return true;
}

void Mpris::setState(const State& state)
{
    if (_state == state)
        return;
    _state = state;
    if (isOpen())
        sd_bus_emit_properties_changed(
            _bus.get(), PATH, PLAYER_INTERFACE, "PlaybackStatus", "Metadata", "CanGoNext", "CanGoPrevious", nullptr);
}

}
