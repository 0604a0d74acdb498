#include "support/FaultyCalls.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdarg>
#include <cstring>
#include <dlfcn.h>
#include <fcntl.h>
#include <tuple>
#include <unistd.h>
#include <utility>

namespace {

char watched[512];
std::atomic<int> calls = 0;
std::atomic<int> target = 0;
std::atomic<support::faults::Effect> effect = support::faults::Effect::COUNT;
int failure = 0;

bool isWatched(const char* path)
{
    return watched[0] != '\0' && path != nullptr && std::strncmp(path, watched, std::strlen(watched)) == 0;
}

std::string pathOf(int file)
{
    char link[64];
    char path[512];
    std::snprintf(link, sizeof link, "/proc/self/fd/%d", file);
    const ssize_t size = ::readlink(link, path, sizeof path);
    return size > 0 ? std::string(path, static_cast<size_t>(size)) : std::string();
}

bool isWatched(int file) { return watched[0] != '\0' && isWatched(pathOf(file).c_str()); }

// Whether this call is to fail.
template <typename Place>
bool meets(Place place)
{
    if (!isWatched(place) || ++calls != target)
        return false;
    if (effect == support::faults::Effect::KILL)
        ::kill(::getpid(), SIGKILL);
    errno = failure;
    return effect == support::faults::Effect::FAIL;
}

std::function<void(support::faults::Deed, const std::string&, off_t, std::string_view)> observer;

void tell(support::faults::Deed deed, int file, off_t at, std::string_view data = {})
{
    if (const int error = errno; observer && isWatched(file)) {
        observer(deed, pathOf(file), at, data);
        errno = error;
    }
}
template <typename... Arguments>
void done(ssize_t, Arguments...)
{
}
void done(ssize_t result, int file, const void* data, size_t, off_t at)
{
    if (result > 0)
        tell(support::faults::Deed::WRITTEN, file, at, {static_cast<const char*>(data), static_cast<size_t>(result)});
}
void done(int result, int file, off_t size)
{
    if (result == 0)
        tell(support::faults::Deed::CUT, file, size);
}
void done(int result, int file)
{
    if (result == 0)
        tell(support::faults::Deed::FLUSHED, file, 0);
}

template <typename Result, typename Arguments>
void report(Result result, const Arguments& arguments)
{
    std::apply([result](auto... each) { done(result, each...); }, arguments);
}

template <typename Function>
Function* real(const char* name)
{
    return reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, name));
}

}

namespace support::faults {

void arm(const std::string& below, int number, Effect wanted, int error)
{
    calls = 0;
    target = number;
    effect = wanted;
    failure = error;
    std::strncpy(watched, below.c_str(), sizeof watched - 1);
}

void disarm() { watched[0] = '\0'; }

int count() { return calls; }

void observe(std::function<void(Deed, const std::string&, off_t, std::string_view)> wanted)
{
    observer = std::move(wanted);
}

}

// The thread sanitizer stands in front of the same calls and cannot be stood before.
#ifndef __SANITIZE_THREAD__

#define FAULTY(type, name, parameters, arguments, place)                                                               \
    type name parameters                                                                                               \
    {                                                                                                                  \
        static auto* const next = real<type parameters>(#name);                                                        \
        if (meets(place))                                                                                              \
            return -1;                                                                                                 \
        const type result = next arguments;                                                                            \
        report(result, std::tuple arguments);                                                                          \
        return result;                                                                                                 \
    }

extern "C" {
FAULTY(ssize_t, write, (int file, const void* data, size_t size), (file, data, size), file)
FAULTY(ssize_t, pwrite, (int file, const void* data, size_t size, off_t at), (file, data, size, at), file)
FAULTY(ssize_t, pwrite64, (int file, const void* data, size_t size, off64_t at), (file, data, size, at), file)
FAULTY(ssize_t, copy_file_range, (int from, off64_t* start, int to, off64_t* at, size_t size, unsigned int flags),
    (from, start, to, at, size, flags), to)
FAULTY(int, fsync, (int file), (file), file)
FAULTY(int, fdatasync, (int file), (file), file)
FAULTY(int, ftruncate, (int file, off_t size), (file, size), file)
FAULTY(int, ftruncate64, (int file, off64_t size), (file, size), file)
FAULTY(int, rename, (const char* from, const char* to) noexcept, (from, to), from)
FAULTY(int, renameat2, (int a, const char* from, int b, const char* to, unsigned int flags) noexcept,
    (a, from, b, to, flags), from)
FAULTY(int, link, (const char* from, const char* to) noexcept, (from, to), to)
FAULTY(int, unlink, (const char* path) noexcept, (path), path)

int open(const char* path, int flags, ...)
{
    static auto* const next = real<int(const char*, int, ...)>("open");
    mode_t mode = 0;
    if ((flags & (O_CREAT | O_TMPFILE)) != 0) {
        va_list arguments;
        va_start(arguments, flags);
        mode = va_arg(arguments, mode_t);
        va_end(arguments);
    }
    return (flags & O_CREAT) != 0 && meets(path) ? -1 : next(path, flags, mode);
}
}

#endif
