// One D-Bus connection driven by the Ecore loop. Main loop only.
//
// A connection that is lost closes by itself: outstanding calls fail, the closed callback runs once, and nothing
// keeps the loop awake. Callbacks of the connection may destroy the object.
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>

#include <Ecore.h>
#include <systemd/sd-bus.h>

namespace host {

class BusInLoop {
public:
    explicit BusInLoop(sd_bus* bus); // adopts
    ~BusInLoop();
    BusInLoop(const BusInLoop&) = delete;
    BusInLoop& operator=(const BusInLoop&) = delete;

    [[nodiscard]] sd_bus* get() const { return _bus; }
    [[nodiscard]] bool isOpen() const { return _handler != nullptr; }
    void setClosed(std::function<void()> closed) { _closed = std::move(closed); }

private:
    void _prepare();
    void _armTimer();
    void _process();
    void _detach();

    sd_bus* _bus;
    Ecore_Fd_Handler* _handler = nullptr;
    Ecore_Idle_Enterer* _enterer = nullptr;
    Ecore_Timer* _timer = nullptr;
    std::function<void()> _closed;
    bool _processing = false;
    std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

// The two buses of the desktop, opened at the first use; null when there is none or it was lost. They stay until
// closeBuses, which is for the end of the process and for tests.
BusInLoop* sessionBus();
BusInLoop* systemBus();
void closeBuses();

// A peer on the inherited or created end of a socket pair; null when the descriptor is not usable. Takes the
// descriptor in any case.
enum class PeerRole { CALLER, CALLED };
std::unique_ptr<BusInLoop> peerOn(int descriptor, PeerRole role);

struct SlotUnref {
    void operator()(sd_bus_slot* slot) const { sd_bus_slot_unref(slot); }
};
using Slot = std::unique_ptr<sd_bus_slot, SlotUnref>;
struct MessageUnref {
    void operator()(sd_bus_message* message) const { sd_bus_message_unref(message); }
};
using Message = std::unique_ptr<sd_bus_message, MessageUnref>;

using Receiver = std::function<void(sd_bus_message* message)>;

constexpr uint64_t FOREVER = UINT64_MAX;
constexpr uint64_t DEFAULT_TIMEOUT = 0;

Message newCall(sd_bus* bus, const char* destination, const char* path, const char* interface, const char* member);
// The receiver gets the reply, or an error message (sd_bus_message_is_method_error). A destroyed slot cancels; a
// null answer means that nothing was sent and the receiver is never called.
Slot callAsync(sd_bus* bus, const Message& call, Receiver reply, uint64_t timeout = DEFAULT_TIMEOUT);
// Fire and forget; false when it cannot be sent.
bool send(sd_bus* bus, const Message& call);
// Null fields match anything.
Slot onSignal(
    sd_bus* bus, const char* sender, const char* path, const char* interface, const char* member, Receiver receiver);
bool hasOwner(sd_bus* bus, const char* name);
// For other threads: asks over a connection of its own.
bool hasOwnerOnSessionBus(const char* name);

// The next item as text if it is a text, a number or a truth value, through any number of variants. Consumes it.
std::optional<std::string> anyText(sd_bus_message* message);
// Calls back for every entry of the dictionary a{sv} that comes next; the callback may leave the value unread.
void forEachProperty(
    sd_bus_message* message, const std::function<void(const std::string& name, sd_bus_message* value)>& entry);

}
