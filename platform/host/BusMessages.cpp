#include "BusInLoop.h"

namespace host {

namespace {

    // The receiver lives as long as the slot, on the heap.
    int deliver(sd_bus_message* message, void* receiver, sd_bus_error*)
    {
        const Receiver copy = *static_cast<Receiver*>(receiver); // it may destroy its own slot
        copy(message);
        return 0;
    }

    void destroyReceiver(void* receiver) { delete static_cast<Receiver*>(receiver); }

    Slot adopt(int result, sd_bus_slot* slot, std::unique_ptr<Receiver> receiver)
    {
        if (result < 0)
            return nullptr;
        sd_bus_slot_set_destroy_callback(slot, destroyReceiver);
        (void)receiver.release(); // the slot's now
        return Slot(slot);
    }

    template <typename Number>
    std::optional<std::string> numberText(sd_bus_message* message, char type)
    {
        Number number = 0;
        if (sd_bus_message_read_basic(message, type, &number) < 0)
            return std::nullopt;
        return std::to_string(number);
    }

}

Message newCall(sd_bus* bus, const char* destination, const char* path, const char* interface, const char* member)
{
    sd_bus_message* call = nullptr;
    if (sd_bus_message_new_method_call(bus, &call, destination, path, interface, member) < 0)
        return nullptr;
    return Message(call);
}

Slot callAsync(sd_bus* bus, const Message& call, Receiver reply, uint64_t timeout)
{
    if (call == nullptr)
        return nullptr;
    auto receiver = std::make_unique<Receiver>(std::move(reply));
    sd_bus_slot* slot = nullptr;
    const int result = sd_bus_call_async(bus, &slot, call.get(), deliver, receiver.get(), timeout);
    return adopt(result, slot, std::move(receiver));
}

bool send(sd_bus* bus, const Message& call)
{
    return call != nullptr && sd_bus_message_set_expect_reply(call.get(), 0) >= 0
        && sd_bus_send(bus, call.get(), nullptr) >= 0;
}

Slot onSignal(
    sd_bus* bus, const char* sender, const char* path, const char* interface, const char* member, Receiver callback)
{
    auto receiver = std::make_unique<Receiver>(std::move(callback));
    sd_bus_slot* slot = nullptr;
    const int result
        = sd_bus_match_signal_async(bus, &slot, sender, path, interface, member, deliver, nullptr, receiver.get());
    return adopt(result, slot, std::move(receiver));
}

bool hasOwner(sd_bus* bus, const char* name)
{
    sd_bus_message* reply = nullptr;
    int owned = 0;
    const int result = sd_bus_call_method(bus, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
        "NameHasOwner", nullptr, &reply, "s", name);
    const Message keeper(reply);
    return result >= 0 && sd_bus_message_read(reply, "b", &owned) >= 0 && owned != 0;
}

bool hasOwnerOnSessionBus(const char* name)
{
    sd_bus* bus = nullptr;
    if (sd_bus_open_user(&bus) < 0)
        return false;
    const bool owned = hasOwner(bus, name);
    sd_bus_close(bus);
    sd_bus_unref(bus);
    return owned;
}

std::optional<std::string> anyText(sd_bus_message* message)
{
    char type = 0;
    const char* contents = nullptr;
    if (sd_bus_message_peek_type(message, &type, &contents) <= 0)
        return std::nullopt;
    const char* text = nullptr;
    int truth = 0;
    switch (type) {
    case SD_BUS_TYPE_VARIANT: {
        if (sd_bus_message_enter_container(message, type, contents) < 0)
            return std::nullopt;
        const auto inner = anyText(message);
        while (sd_bus_message_at_end(message, 0) == 0 && sd_bus_message_skip(message, nullptr) > 0) { }
        sd_bus_message_exit_container(message);
        return inner;
    }
    case SD_BUS_TYPE_STRING:
    case SD_BUS_TYPE_OBJECT_PATH:
        return sd_bus_message_read_basic(message, type, &text) >= 0 ? std::optional<std::string>(text) : std::nullopt;
    case SD_BUS_TYPE_BOOLEAN:
        return sd_bus_message_read_basic(message, type, &truth) >= 0
            ? std::optional<std::string>(truth != 0 ? "1" : "0")
            : std::nullopt;
    case SD_BUS_TYPE_INT32:
        return numberText<int32_t>(message, type);
    case SD_BUS_TYPE_UINT32:
        return numberText<uint32_t>(message, type);
    case SD_BUS_TYPE_INT64:
        return numberText<int64_t>(message, type);
    case SD_BUS_TYPE_UINT64:
        return numberText<uint64_t>(message, type);
    default:
        sd_bus_message_skip(message, nullptr);
        return std::nullopt;
    }
}

void forEachProperty(
    sd_bus_message* message, const std::function<void(const std::string& name, sd_bus_message* value)>& entry)
{
    if (sd_bus_message_enter_container(message, SD_BUS_TYPE_ARRAY, "{sv}") < 0)
        return;
    while (sd_bus_message_enter_container(message, SD_BUS_TYPE_DICT_ENTRY, "sv") > 0) {
        const char* name = nullptr;
        if (sd_bus_message_read_basic(message, SD_BUS_TYPE_STRING, &name) < 0)
            return;
        entry(name, message);
        while (sd_bus_message_at_end(message, 0) == 0 && sd_bus_message_skip(message, nullptr) > 0) { }
        sd_bus_message_exit_container(message);
    }
    sd_bus_message_exit_container(message);
}

}
