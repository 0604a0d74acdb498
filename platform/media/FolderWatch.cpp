#include "media/FolderWatch.h"

#include <filesystem>
#include <set>
#include <system_error>
#include <utility>

#include <sys/inotify.h>
#include <unistd.h>

namespace media {

namespace {

    constexpr double SETTLING_SECONDS = 0.3;
    constexpr double LONGEST_BURST_SECONDS = 1.0;
    // Not that a file is being written: its end is what counts, and a recording would wake us fifty times a second.
    constexpr uint32_t EVENTS
        = IN_CREATE | IN_DELETE | IN_MOVE | IN_CLOSE_WRITE | IN_ATTRIB | IN_DELETE_SELF | IN_MOVE_SELF | IN_ONLYDIR;

    // The folder itself, or as long as it does not exist the nearest one above it.
    std::string nearestExisting(const std::string& folder)
    {
        std::filesystem::path path = folder;
        std::error_code ignored;
        while (path.has_parent_path() && path != path.root_path() && !std::filesystem::is_directory(path, ignored))
            path = path.parent_path();
        return path.string();
    }

}

FolderWatch::FolderWatch(std::vector<std::string> folders, std::function<void()> changed)
    : _folders(std::move(folders))
    , _changed(std::move(changed))
{
    _arm();
}

FolderWatch::~FolderWatch()
{
    if (_timer != nullptr)
        ecore_timer_del(_timer);
    _disarm();
}

void FolderWatch::_arm()
{
    _disarm();
    _inotify = ::inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
    if (_inotify < 0)
        return;
    std::set<std::string> places;
    for (const std::string& folder : _folders)
        places.insert(nearestExisting(folder));
    for (const std::string& place : places)
        (void)::inotify_add_watch(_inotify, place.c_str(), EVENTS);
    _handler = ecore_main_fd_handler_add(_inotify, ECORE_FD_READ, _changedCb, this, nullptr, nullptr);
}

void FolderWatch::_disarm()
{
    if (_handler != nullptr)
        ecore_main_fd_handler_del(std::exchange(_handler, nullptr));
    if (_inotify >= 0)
        ::close(std::exchange(_inotify, -1));
}

Eina_Bool FolderWatch::_changedCb(void* data, Ecore_Fd_Handler*)
{
    auto* self = static_cast<FolderWatch*>(data);
    alignas(inotify_event) char events[4096];
    while (::read(self->_inotify, events, sizeof events) > 0) { }
    self->_settle();
    return ECORE_CALLBACK_RENEW;
}

void FolderWatch::_settle()
{
    const double now = ecore_time_get();
    if (_timer == nullptr) {
        _firstChange = now;
        _timer = ecore_timer_add(SETTLING_SECONDS, _settledCb, this);
    } else if (now - _firstChange < LONGEST_BURST_SECONDS) {
        ecore_timer_reset(_timer);
    }
}

Eina_Bool FolderWatch::_settledCb(void* data)
{
    auto* self = static_cast<FolderWatch*>(data);
    self->_timer = nullptr;
    self->_arm(); // folders may have come or gone
    const auto changed = self->_changed; // may end the watch
    changed();
    return ECORE_CALLBACK_CANCEL;
}

}
