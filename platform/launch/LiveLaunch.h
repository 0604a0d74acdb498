// Launch requests under way: sends them and waits for their ends. Main loop only.
#pragma once

#include "host/BusInLoop.h"
#include "launch/Registry.h"

#include <map>
#include <memory>

struct _Ecore_Fd_Handler;

namespace platform {

class LiveLaunch {
public:
    // Sends a copy of the request; an error means that no callback will come.
    static int start(const app_control_s& request, app_control_reply_cb callback, void* userData);
    // Ends the launch of this request, else every launch of its application, else the running application.
    static int terminate(const app_control_s& request);
    ~LiveLaunch();
    LiveLaunch(const LiveLaunch&) = delete;
    LiveLaunch& operator=(const LiveLaunch&) = delete;

private:
    LiveLaunch(const app_control_s& request, app_control_reply_cb callback, void* userData);

    bool _sendTo(sd_bus* bus, const char* destination);
    bool _spawn(const AppEntry& entry);
    bool _spawnWithProtocol(const std::vector<std::string>& command);
    bool _spawnForStatus(const std::vector<std::string>& command);
    void _reportStarted() const;
    void _received(sd_bus_message* reply);
    void _statusReady();
    void _finish(app_control_result_e result, const bundle_s& extras);
    void _terminate();

    static std::map<uint64_t, std::unique_ptr<LiveLaunch>>& _all();

    app_control_s _request;
    app_control_reply_cb _callback;
    void* _userData;
    uint64_t _id = 0;
    std::unique_ptr<host::BusInLoop> _peer; // a program that we started
    host::Slot _reply;
    pid_t _process = -1; // of kind "exit"
    int _status = -1;
    std::string _statusText;
    _Ecore_Fd_Handler* _statusHandler = nullptr;
};

}
