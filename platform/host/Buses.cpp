#include "BusInLoop.h"

#include <systemd/sd-id128.h>
#include <unistd.h>

namespace host {

namespace {

    class SharedBus {
    public:
        explicit SharedBus(int (*open)(sd_bus**))
            : _open(open)
        {
        }

        BusInLoop* get()
        {
            if (!_tried) {
                _tried = true;
                sd_bus* bus = nullptr;
                if (_open(&bus) >= 0)
                    _bus = std::make_unique<BusInLoop>(bus);
            }
            return _bus != nullptr && _bus->isOpen() ? _bus.get() : nullptr;
        }

        void close()
        {
            _bus.reset();
            _tried = false;
        }

    private:
        int (*_open)(sd_bus**);
        bool _tried = false;
        std::unique_ptr<BusInLoop> _bus;
    };

    // Never destroyed with the statics: the loop is gone by then.
    SharedBus& session()
    {
        static auto* bus = new SharedBus(sd_bus_open_user);
        return *bus;
    }

    SharedBus& system()
    {
        static auto* bus = new SharedBus(sd_bus_open_system);
        return *bus;
    }

    // Both ends belong to the same user; the kernel says so and sd-bus asks it.
    int startPeer(sd_bus* bus, int descriptor, PeerRole role)
    {
        int result = sd_bus_set_fd(bus, descriptor, descriptor);
        if (result >= 0 && role == PeerRole::CALLED) {
            sd_id128_t id = {};
            result = sd_id128_randomize(&id);
            if (result >= 0)
                result = sd_bus_set_server(bus, 1, id);
        }
        return result >= 0 ? sd_bus_start(bus) : result;
    }

}

BusInLoop* sessionBus() { return session().get(); }

BusInLoop* systemBus() { return system().get(); }

void closeBuses()
{
    session().close();
    system().close();
}

std::unique_ptr<BusInLoop> peerOn(int descriptor, PeerRole role)
{
    sd_bus* bus = nullptr;
    if (sd_bus_new(&bus) < 0) {
        ::close(descriptor);
        return nullptr;
    }
    if (startPeer(bus, descriptor, role) < 0) {
        sd_bus_close(bus);
        sd_bus_unref(bus);
        return nullptr;
    }
    return std::make_unique<BusInLoop>(bus);
}

}
