#pragma once

#include <functional>
#include <string>

struct _Ecore_Fd_Handler;

namespace media {

// Tells other processes about commits: a stamp file beside the database is touched after each one (it holds the process
// id of the last writer), and everybody watches it with inotify. Watching the database's own files would wake too often
// and before the commit can be seen. The watch belongs to the main loop; touch from any thread.
class Notice {
public:
    explicit Notice(std::string stampPath);
    ~Notice();
    Notice(const Notice&) = delete;
    Notice& operator=(const Notice&) = delete;

    void touch(int pid);
    // Calls back with the process id of the writer after every touch, also of this process.
    bool watch(std::function<void(int pid)> callback);
    void unwatch();

private:
    static unsigned char _readyCb(void* data, _Ecore_Fd_Handler* handler);
    void _ready();

    std::string _path;
    std::function<void(int)> _callback;
    int _inotify = -1;
    _Ecore_Fd_Handler* _handler = nullptr;
};

}
