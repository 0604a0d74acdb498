// Mutexes whose rules the compiler checks: tools/style runs clang's thread-safety analysis, which refuses a use of what
// is GUARDED_BY a mutex without holding it. For other compilers the rules are empty.
#pragma once

#include <mutex>

#ifdef __clang__
#define THREAD_RULE(rule) __attribute__((rule))
#else
#define THREAD_RULE(rule)
#endif

#define GUARDED_BY(mutex) THREAD_RULE(guarded_by(mutex))
// The caller holds the mutex; also behind the parameters of a lambda.
#define REQUIRES(mutex) THREAD_RULE(requires_capability(mutex))
// The caller does not hold the mutex, which is taken inside.
#define EXCLUDES(mutex) THREAD_RULE(locks_excluded(mutex))

namespace platform {

template <typename Standard>
class THREAD_RULE(capability("mutex")) CheckedMutex {
public:
    void lock() THREAD_RULE(acquire_capability()) { _mutex.lock(); }
    void unlock() THREAD_RULE(release_capability()) { _mutex.unlock(); }
    [[nodiscard]] bool try_lock() THREAD_RULE(try_acquire_capability(true)) { return _mutex.try_lock(); }

private:
    Standard _mutex;
};

using Mutex = CheckedMutex<std::mutex>;
using RecursiveMutex = CheckedMutex<std::recursive_mutex>;

// Holds a mutex as long as it lives, but for the time between unlock() and lock(); a std::condition_variable_any waits
// with it.
template <typename Held>
class THREAD_RULE(scoped_lockable) Lock {
public:
    explicit Lock(Held& mutex) THREAD_RULE(acquire_capability(mutex))
        : _lock(mutex)
    {
    }
    ~Lock() THREAD_RULE(release_capability()) = default;
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

    void lock() THREAD_RULE(acquire_capability()) { _lock.lock(); }
    void unlock() THREAD_RULE(release_capability()) { _lock.unlock(); }

private:
    std::unique_lock<Held> _lock;
};

}
