#include "BusInLoop.h"

#include <poll.h>

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <utility>

namespace host {

namespace {

    uint64_t monotonicMicroseconds()
    {
        timespec now = {};
        ::clock_gettime(CLOCK_MONOTONIC, &now);
        return static_cast<uint64_t>(now.tv_sec) * 1000000 + static_cast<uint64_t>(now.tv_nsec) / 1000;
    }

}

BusInLoop::BusInLoop(sd_bus* bus)
    : _bus(bus)
{
    _handler = ecore_main_fd_handler_add(
        sd_bus_get_fd(bus), ECORE_FD_READ,
        [](void* self, Ecore_Fd_Handler*) -> Eina_Bool {
            static_cast<BusInLoop*>(self)->_process();
            return ECORE_CALLBACK_RENEW;
        },
        this, nullptr, nullptr);
    _enterer = ecore_idle_enterer_add(
        [](void* self) -> Eina_Bool {
            static_cast<BusInLoop*>(self)->_prepare();
            return ECORE_CALLBACK_RENEW;
        },
        this);
}

BusInLoop::~BusInLoop()
{
    _alive.reset();
    _closed = nullptr;
    _detach();
    if (!_processing && sd_bus_is_ready(_bus) > 0) // a peer that never answered would block here
        sd_bus_flush(_bus);
    sd_bus_close(_bus);
    sd_bus_unref(_bus);
}

// Before the loop sleeps: what does the connection wait for? Data may also lie read but unprocessed inside it.
void BusInLoop::_prepare()
{
    uint64_t until = FOREVER;
    if (sd_bus_get_timeout(_bus, &until) >= 0 && until == 0) {
        const std::weak_ptr<bool> alive = _alive;
        _process();
        if (alive.expired())
            return;
    }
    const int events = isOpen() ? sd_bus_get_events(_bus) : -1;
    if (events < 0)
        return _process(); // lost: lets outstanding calls fail
    unsigned flags = (events & POLLIN) != 0 ? static_cast<unsigned>(ECORE_FD_READ) : 0u;
    if ((events & POLLOUT) != 0)
        flags |= ECORE_FD_WRITE;
    ecore_main_fd_handler_active_set(_handler, static_cast<Ecore_Fd_Handler_Flags>(flags));
    _armTimer();
}

void BusInLoop::_armTimer()
{
    if (_timer != nullptr)
        ecore_timer_del(std::exchange(_timer, nullptr));
    uint64_t until = FOREVER;
    if (sd_bus_get_timeout(_bus, &until) < 0 || until == FOREVER)
        return;
    const uint64_t now = monotonicMicroseconds();
    _timer = ecore_timer_add(
        until > now ? static_cast<double>(until - now) / 1e6 : 0.0,
        [](void* data) -> Eina_Bool {
            auto* self = static_cast<BusInLoop*>(data);
            self->_timer = nullptr;
            self->_process();
            return ECORE_CALLBACK_CANCEL;
        },
        this);
}

void BusInLoop::_process()
{
    if (!isOpen() || std::exchange(_processing, true))
        return;
    const std::weak_ptr<bool> alive = _alive;
    sd_bus* bus = sd_bus_ref(_bus);
    int result = 1;
    while (result > 0 && !alive.expired())
        result = sd_bus_process(bus, nullptr);
    sd_bus_unref(bus);
    if (alive.expired())
        return;
    _processing = false;
    if (result >= 0 && sd_bus_is_open(_bus) >= 0)
        return;
    _detach();
    if (const auto closed = std::exchange(_closed, nullptr))
        closed();
}

void BusInLoop::_detach()
{
    if (_timer != nullptr)
        ecore_timer_del(std::exchange(_timer, nullptr));
    if (_handler != nullptr)
        ecore_main_fd_handler_del(std::exchange(_handler, nullptr));
    if (_enterer != nullptr)
        ecore_idle_enterer_del(std::exchange(_enterer, nullptr));
}

}
