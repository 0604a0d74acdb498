#pragma once

#include <Ecore.h>

#include <functional>

namespace support {

// Runs the main loop until the condition holds; false when it does not within the limit (seconds).
inline bool runUntil(const std::function<bool()>& condition, double limit = 5.0)
{
    // The timer wakes a loop that has nothing else to do, so that the limit is kept.
    Ecore_Timer* tick = ecore_timer_add(
        0.01, [](void*) -> Eina_Bool { return ECORE_CALLBACK_RENEW; }, nullptr);
    const double end = ecore_time_get() + limit;
    bool met = condition();
    while (!met && ecore_time_get() < end) {
        ecore_main_loop_iterate_may_block(EINA_TRUE);
        met = condition();
    }
    ecore_timer_del(tick);
    return met;
}

// Lets the main loop run for a while (seconds).
inline void runFor(double seconds)
{
    runUntil([] { return false; }, seconds);
}

}
