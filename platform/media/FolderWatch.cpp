#include "media/FolderWatch.h"

#include <filesystem>
#include <set>
#include <system_error>
#include <utility>

namespace media {

namespace {

    constexpr double SETTLING_SECONDS = 0.3;
    constexpr double LONGEST_BURST_SECONDS = 1.0;

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
    ecore_file_init();
    _arm();
}

FolderWatch::~FolderWatch()
{
    if (_timer != nullptr)
        ecore_timer_del(_timer);
    _disarm();
    ecore_file_shutdown();
}

void FolderWatch::_arm()
{
    _disarm();
    std::set<std::string> places;
    for (const std::string& folder : _folders)
        places.insert(nearestExisting(folder));
    for (const std::string& place : places) {
        if (Ecore_File_Monitor* monitor = ecore_file_monitor_add(place.c_str(), _changedCb, this); monitor != nullptr)
            _monitors.push_back(monitor);
    }
}

void FolderWatch::_disarm()
{
    for (Ecore_File_Monitor* monitor : std::exchange(_monitors, {}))
        ecore_file_monitor_del(monitor);
}

// A file that is being written announces itself all the time; its end is what counts.
void FolderWatch::_changedCb(void* data, Ecore_File_Monitor*, Ecore_File_Event event, const char*)
{
    if (event != ECORE_FILE_EVENT_MODIFIED && event != ECORE_FILE_EVENT_NONE)
        static_cast<FolderWatch*>(data)->_settle();
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
