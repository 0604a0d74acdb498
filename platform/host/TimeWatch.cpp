#include "TimeWatch.h"

#include <StateKeys.h>

#include <cerrno>
#include <cstdlib>
#include <ctime>
#include <limits>
#include <utility>

#include <sys/timerfd.h>
#include <unistd.h>

namespace host {

TimeWatch::TimeWatch(KeySink sink)
    : _sink(std::move(sink))
    , _properties("org.freedesktop.timedate1", "/org/freedesktop/timedate1", "org.freedesktop.timedate1",
          [this](const std::string& name, const std::string& value) {
              const char* own = std::getenv("TZ"); // the user's, for this program
              if (name == "Timezone" && !value.empty() && (own == nullptr || *own == '\0'))
                  _sink(platform::KEY_TIME_ZONE, value);
          })
{
}

void TimeWatch::start()
{
    _properties.start(systemBus());
    _timer = ::timerfd_create(CLOCK_REALTIME, TFD_NONBLOCK | TFD_CLOEXEC);
    if (_timer < 0)
        return;
    _arm();
    _handler = ecore_main_fd_handler_add(
        _timer, ECORE_FD_READ,
        [](void* self, Ecore_Fd_Handler*) -> Eina_Bool {
            static_cast<TimeWatch*>(self)->_fired();
            return ECORE_CALLBACK_RENEW;
        },
        this, nullptr, nullptr);
}

// A timer that never expires but is cancelled when somebody sets the clock.
void TimeWatch::_arm() const
{
    itimerspec never = {};
    never.it_value.tv_sec = std::numeric_limits<int>::max();
    ::timerfd_settime(_timer, TFD_TIMER_ABSTIME | TFD_TIMER_CANCEL_ON_SET, &never, nullptr);
}

void TimeWatch::_fired()
{
    uint64_t expirations = 0;
    if (::read(_timer, &expirations, sizeof(expirations)) < 0 && errno == ECANCELED)
        _sink(platform::KEY_TIME_CHANGED, std::to_string(std::time(nullptr)));
    _arm();
}

void TimeWatch::stop()
{
    _properties.stop();
    if (_handler != nullptr)
        ecore_main_fd_handler_del(std::exchange(_handler, nullptr));
    if (_timer >= 0)
        ::close(std::exchange(_timer, -1));
}

}
