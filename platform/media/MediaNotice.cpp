#include "media/MediaNotice.h"

#include <Ecore.h>

#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <sys/inotify.h>
#include <unistd.h>

namespace media {

Notice::Notice(std::string stampPath)
    : _path(std::move(stampPath))
{
}

Notice::~Notice() { unwatch(); }

void Notice::touch(int pid)
{
    const int file = ::open(_path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0644);
    if (file < 0)
        return;
    char text[16];
    const int length = std::snprintf(text, sizeof text, "%-11d\n", pid);
    // One write of fixed length: readers never see a torn number. Its modification event is the notice.
    if (::pwrite(file, text, static_cast<size_t>(length), 0) != length)
        (void)::futimens(file, nullptr);
    ::close(file);
}

bool Notice::watch(std::function<void(int pid)> callback)
{
    unwatch();
    // On the very first start the database, which makes the folder, may still be opening.
    std::error_code ignored;
    std::filesystem::create_directories(std::filesystem::path(_path).parent_path(), ignored);
    const int file = ::open(_path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0644);
    if (file >= 0)
        ::close(file);
    _inotify = ::inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
    if (_inotify < 0 || ::inotify_add_watch(_inotify, _path.c_str(), IN_MODIFY | IN_ATTRIB) < 0) {
        unwatch();
        return false;
    }
    _callback = std::move(callback);
    _handler = ecore_main_fd_handler_add(_inotify, ECORE_FD_READ, _readyCb, this, nullptr, nullptr);
    return _handler != nullptr;
}

void Notice::unwatch()
{
    if (_handler != nullptr)
        ecore_main_fd_handler_del(_handler);
    if (_inotify >= 0)
        ::close(_inotify);
    _handler = nullptr;
    _inotify = -1;
    _callback = nullptr;
}

unsigned char Notice::_readyCb(void* data, _Ecore_Fd_Handler*)
{
    static_cast<Notice*>(data)->_ready();
    return ECORE_CALLBACK_RENEW;
}

void Notice::_ready()
{
    alignas(inotify_event) char events[4096];
    while (::read(_inotify, events, sizeof events) > 0) { }
    char text[16] = {};
    const int file = ::open(_path.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return;
    const bool read = ::read(file, text, sizeof text - 1) > 0;
    ::close(file);
    const auto callback = _callback; // may unwatch
    if (read && callback)
        callback(std::atoi(text));
}

}
