// The running application: starts, receives requests, decides between pause and resume, ends. Main loop only.
#pragma once

#include "app.h"
#include "host/BusInLoop.h"
#include "launch/AppControl.h"
#include "launch/CommandLine.h"
#include "state/KeyTree.h"

#include <memory>

namespace platform {

enum class Toolkit { ELEMENTARY, NONE };

class AppProcess {
public:
    AppProcess(const ui_app_lifecycle_s& lifecycle, void* userData, Toolkit toolkit);
    ~AppProcess();
    AppProcess(const AppProcess&) = delete;
    AppProcess& operator=(const AppProcess&) = delete;

    static AppProcess* current(); // null outside run

    int run(int argc, char** argv);
    void exit();
    void close();
    void setWindowVisible(bool visible);
    [[nodiscard]] bool isResumed() const { return _resumed; }

private:
    enum class Instance { OURS, OTHER, FAILED };

    Instance _becomeInstance(const CommandLine& line);
    int _runToolkit(const CommandLine& line, char** argv);
    bool _handOver(const CommandLine& line);
    bool _openSocket(int descriptor);
    void _loop(const CommandLine& line);
    void _launched(app_control_s& request);
    void _callerGone();
    void _apply();
    void _setResumed(bool resumed);

    const ui_app_lifecycle_s _lifecycle;
    void* const _userData;
    const Toolkit _toolkit;
    std::unique_ptr<host::BusInLoop> _socket; // to the program that started us
    std::weak_ptr<PendingReply> _socketRequest;
    bool _waitsForLaunch = false;
    bool _launchedOnce = false;
    bool _started = false; // the first resume may come
    bool _visible = true;
    bool _resumed = false;
    bool _ending = false;
    bool _looping = false;
    KeyTree::WatchId _lockWatch = 0;
};

}
