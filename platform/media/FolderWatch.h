#pragma once

#include <Ecore.h>

#include <functional>
#include <string>
#include <vector>

namespace media {

// Calls back soon after files in some folders were added, changed, removed or renamed by anybody; a burst gives one
// call. A folder that does not exist yet is noticed when it appears. Main loop only.
class FolderWatch {
public:
    FolderWatch(std::vector<std::string> folders, std::function<void()> changed);
    ~FolderWatch();
    FolderWatch(const FolderWatch&) = delete;
    FolderWatch& operator=(const FolderWatch&) = delete;

private:
    static Eina_Bool _changedCb(void* data, Ecore_Fd_Handler* handler);
    static Eina_Bool _settledCb(void* data);
    void _arm();
    void _disarm();
    void _settle();

    std::vector<std::string> _folders;
    std::function<void()> _changed;
    int _inotify = -1;
    Ecore_Fd_Handler* _handler = nullptr;
    Ecore_Timer* _timer = nullptr;
    double _firstChange = 0; // when the burst began, seconds
};

}
