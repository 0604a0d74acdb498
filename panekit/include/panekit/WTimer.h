#pragma once

#include <functional>
#include <memory>

namespace panekit {

// A timer, job or idler of the main loop. The framework owns it; callers keep a weak pointer, which expires when it
// ends. Main loop only.
class WTimer {
public:
    using Weak = std::weak_ptr<WTimer>;
    // Answers true to go on.
    using Callback = std::function<bool(void* userData)>;

    // Calls back every interval (seconds) until the callback answers false.
    static Weak addTimer(double interval, Callback callback, void* userData = nullptr);
    // Runs once in the next pass of the main loop.
    static Weak addJob(std::function<void(void* userData)> callback, void* userData = nullptr);
    // Runs when the main loop has nothing else to do, until the callback answers false.
    static Weak addIdler(Callback callback, void* userData = nullptr);
    // Ends it if it is alive; allowed inside its own callback.
    static void destroy(const Weak& timer);

    WTimer(const WTimer&) = delete;
    WTimer& operator=(const WTimer&) = delete;
    ~WTimer();

    // The toolkit's timer; null for jobs and idlers. Borrowed.
    [[nodiscard]] void* handle() const;

private:
    struct Impl;
    explicit WTimer(std::shared_ptr<Impl> impl);
    static Weak _adopt(const std::shared_ptr<Impl>& impl);
    std::shared_ptr<Impl> _impl;
};

}

// The Ecore_Timer behind a weak timer, null when it has ended.
void* wuitimer_get_timer_handle(const panekit::WTimer::Weak& timer);
