#include "Mpris.h"

#include <algorithm>
#include <tuple>

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
        static_cast<const Mpris*>(self)->handlers().called(method); // last: it may end the object
        return result;
    }

    constexpr int64_t MICROSECONDS = 1000; // in a millisecond

    // Beyond the end means the next one.
    int seekCalled(sd_bus_message* message, void* self, sd_bus_error*)
    {
        int64_t offset = 0;
        const int result = sd_bus_message_read(message, "x", &offset);
        if (result < 0)
            return result;
        sd_bus_reply_method_return(message, nullptr);
        const auto* mpris = static_cast<const Mpris*>(self);
        if (!mpris->state().canSeek)
            return 1;
        const int64_t target = mpris->handlers().position() + offset / MICROSECONDS;
        if (mpris->state().length > 0 && target > mpris->state().length)
            mpris->handlers().called("Next");
        else
            mpris->seekTo(static_cast<int>(std::max<int64_t>(target, 0)));
        return 1;
    }

    // A place outside, or of a track that is over, is ignored.
    int setPositionCalled(sd_bus_message* message, void* self, sd_bus_error*)
    {
        const char* track = nullptr;
        int64_t position = 0;
        const int result = sd_bus_message_read(message, "ox", &track, &position);
        if (result < 0)
            return result;
        sd_bus_reply_method_return(message, nullptr);
        const auto* mpris = static_cast<const Mpris*>(self);
        const int64_t target = position / MICROSECONDS;
        if (mpris->trackId() == track && target >= 0 && target <= mpris->state().length)
            mpris->seekTo(static_cast<int>(target));
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
        const auto& state = static_cast<const Mpris*>(self)->state();
        const bool truth = skips ? state.canSkip : name == "CanSeek" ? state.canSeek : name.starts_with("Can");
        return sd_bus_message_append(reply, "b", truth ? 1 : 0);
    }

    int readNumber(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
    {
        return sd_bus_message_append(reply, "d", 1.0);
    }

    int readPosition(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* self, sd_bus_error*)
    {
        const auto* mpris = static_cast<const Mpris*>(self);
        const int position = mpris->state().hasPosition ? mpris->handlers().position() : 0;
        return sd_bus_message_append(reply, "x", position * MICROSECONDS);
    }

    int readList(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void*, sd_bus_error*)
    {
        return sd_bus_message_append(reply, "as", 0);
    }

    int readMetadata(sd_bus*, const char*, const char*, const char*, sd_bus_message* reply, void* self, sd_bus_error*)
    {
        const auto* mpris = static_cast<const Mpris*>(self);
        const std::string track = mpris->trackId();
        const auto& [title, length] = std::tie(mpris->state().title, mpris->state().length);
        if (length <= 0)
            return sd_bus_message_append(
                reply, "a{sv}", 2, "mpris:trackid", "o", track.c_str(), "xesam:title", "s", title.c_str());
        return sd_bus_message_append(reply, "a{sv}", 3, "mpris:trackid", "o", track.c_str(), "xesam:title", "s",
            title.c_str(), "mpris:length", "x", length * MICROSECONDS);
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
        SD_BUS_METHOD("SetPosition", "ox", "", setPositionCalled, SD_BUS_VTABLE_UNPRIVILEGED),
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
        SD_BUS_PROPERTY("CanSeek", "b", readTruth, 0, CHANGES),
        SD_BUS_PROPERTY("CanControl", "b", readTruth, 0, 0),
        SD_BUS_VTABLE_END,
    };

}

Mpris::Mpris(BusInLoop& bus, Handlers handlers)
    : _bus(bus)
    , _handlers(std::move(handlers))
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
    if (state.title != _state.title || state.length != _state.length)
        ++_track;
    _state = state;
    if (isOpen())
        sd_bus_emit_properties_changed(_bus.get(), PATH, PLAYER_INTERFACE, "PlaybackStatus", "Metadata", "CanGoNext",
            "CanGoPrevious", "CanSeek", nullptr);
}

std::string Mpris::trackId() const { return "/com/tovanic/mewlo_lite/track/" + std::to_string(_track); }

void Mpris::seekTo(int milliseconds) const
{
    if (_state.canSeek)
        _handlers.seek(milliseconds);
}

void Mpris::tellSeeked(int milliseconds)
{
    if (isOpen())
        sd_bus_emit_signal(_bus.get(), PATH, PLAYER_INTERFACE, "Seeked", "x", milliseconds * MICROSECONDS);
}

}
