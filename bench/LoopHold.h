// How long the main loop is held: measured between two of its waits.
#pragma once

#include <Ecore.h>

#include <algorithm>
#include <ctime>
#include <sys/select.h>

#include "bench/Engines.h"

namespace bench {

class LoopHold {
public:
    // One at a time, for as long as the loop runs.
    static void install() { ecore_main_loop_select_func_set(_select); }
    static void restart()
    {
        _wake();
        _longest = 0;
        _longestCpu = 0;
    }
    // Milliseconds, by the clock and in the thread's own time.
    static double longest() { return _longest; }
    static double longestCpu() { return _longestCpu; }

private:
    static double _cpu()
    {
        timespec time{};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return static_cast<double>(time.tv_sec) * 1000 + static_cast<double>(time.tv_nsec) / 1e6;
    }
    static void _wake()
    {
        _awake = milliseconds();
        _awakeCpu = _cpu();
    }
    static int _select(int count, fd_set* read, fd_set* write, fd_set* except, timeval* timeout)
    {
        _longest = std::max(_longest, milliseconds() - _awake);
        _longestCpu = std::max(_longestCpu, _cpu() - _awakeCpu);
        const int result = ::select(count, read, write, except, timeout);
        _wake();
        return result;
    }

    static inline double _awake = 0;
    static inline double _awakeCpu = 0;
    static inline double _longest = 0;
    static inline double _longestCpu = 0;
};

}
