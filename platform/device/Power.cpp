#include "device.h"

#include "host/Inhibitor.h"
#include "state/Log.h"
#include "state/Trees.h"
#include <MainLoop.h>
#include <Mutex.h>
#include <StateKeys.h>

#include <Ecore.h>

#include <memory>
#include <set>
#include <string>

#include <unistd.h>

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;

constexpr const char* NAMES[] = {"cpu", "display", "display_dim"};

struct Held {
    platform::Mutex mutex;
    std::set<power_lock_e> locks GUARDED_BY(mutex);
};

Held& held()
{
    static auto* all = new Held;
    return *all;
}

// What the desktop was asked for; main loop only.
struct Requests {
    std::unique_ptr<host::Inhibitor> sleep;
    std::unique_ptr<host::Inhibitor> idle;
    std::unique_ptr<host::ScreenSaverInhibitor> screenSaver;
};

Requests& requests()
{
    static auto* all = new Requests;
    return *all;
}

bool isLock(power_lock_e lock) { return lock >= POWER_LOCK_CPU && lock <= POWER_LOCK_DISPLAY_DIM; }

void publish(const std::set<power_lock_e>& locks)
{
    const std::string key = platform::KEY_LOCKS + std::to_string(::getpid());
    std::string text;
    for (const power_lock_e lock : locks)
        text += (text.empty() ? "" : " ") + std::string(NAMES[lock]);
    if (text.empty())
        platform::stateTree().remove(key);
    else
        platform::stateTree().write(key, text);
}

void apply()
{
    std::set<power_lock_e> locks;
    {
        const platform::Lock lock(held().mutex);
        locks = held().locks;
    }
    Requests& asked = requests();
    const bool display = locks.contains(POWER_LOCK_DISPLAY) || locks.contains(POWER_LOCK_DISPLAY_DIM);
    if (!locks.contains(POWER_LOCK_CPU))
        asked.sleep.reset();
    else if (asked.sleep == nullptr) {
        constexpr host::Inhibitor::Wish IDLE = {"idle", "block"}; // where blocking sleep is not allowed
        asked.sleep = std::make_unique<host::Inhibitor>("Recording", host::Inhibitor::Wish{"sleep", "block"}, &IDLE);
    }
    if (!display) {
        asked.idle.reset();
        asked.screenSaver.reset();
    } else if (asked.idle == nullptr) {
        asked.idle = std::make_unique<host::Inhibitor>("Recording", host::Inhibitor::Wish{"idle", "block"});
        asked.screenSaver = std::make_unique<host::ScreenSaverInhibitor>();
    }
}

template <typename Change>
int change(power_lock_e lock, Change apply_to)
{
    if (!isLock(lock))
        return INVALID_PARAMETER;
    {
        const platform::Lock guard(held().mutex);
        apply_to(held().locks);
        publish(held().locks);
    }
    platform::onMainLoop(apply);
    return NONE;
}

Eina_Bool expiredCb(void* lock)
{
    device_power_release_lock(static_cast<power_lock_e>(reinterpret_cast<intptr_t>(lock)));
    return ECORE_CALLBACK_CANCEL;
}

}

int device_power_request_lock(power_lock_e lock, int timeout)
{
    if (timeout < 0)
        return INVALID_PARAMETER;
    const int result = change(lock, [=](auto& locks) { locks.insert(lock); });
    if (result == NONE && timeout > 0)
        platform::onMainLoop([=] {
            ecore_timer_add(timeout / 1000.0, expiredCb, reinterpret_cast<void*>(static_cast<intptr_t>(lock)));
        });
    return result;
}

int device_power_release_lock(power_lock_e lock)
{
    return change(lock, [=](auto& locks) { locks.erase(lock); });
}

int device_power_wakeup(bool)
{
    platform::onMainLoop(host::wakeDisplay);
    return NONE;
}
