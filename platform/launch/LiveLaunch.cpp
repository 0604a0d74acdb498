#include "launch/LiveLaunch.h"

#include "launch/Identity.h"
#include "launch/Spawn.h"
#include "state/Log.h"
#include "state/Trees.h"
#include <MainLoop.h>

#include <Ecore.h>

#include <csignal>
#include <fcntl.h>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>

namespace platform {

namespace {

    uint64_t nextId()
    {
        static uint64_t last = 0;
        return ++last;
    }

    bool hasRunning(const std::string& id)
    {
        host::BusInLoop* bus = host::sessionBus();
        return bus != nullptr && isAppId(id) && host::hasOwner(bus->get(), busNameOf(id).c_str());
    }

}

std::map<uint64_t, std::unique_ptr<LiveLaunch>>& LiveLaunch::_all()
{
    static auto* all = new std::map<uint64_t, std::unique_ptr<LiveLaunch>>;
    return *all;
}

LiveLaunch::LiveLaunch(const app_control_s& request, app_control_reply_cb callback, void* userData)
    : _request(request)
    , _callback(callback)
    , _userData(userData)
{
    _request.pending.reset(); // it answers a request of its own, not this one
}

LiveLaunch::~LiveLaunch()
{
    if (_statusHandler != nullptr)
        ecore_main_fd_handler_del(_statusHandler);
    if (_status >= 0)
        ::close(_status);
}

int LiveLaunch::start(const app_control_s& request, app_control_reply_cb callback, void* userData)
{
    const std::string operation = request.fields.text("operation");
    const auto entry = request.appId.empty() ? findAppByOperation(operation) : findApp(request.appId);
    const std::string id = entry ? entry->id : request.appId;
    const bool running = !request.isGroup() && hasRunning(id);
    if (!entry && !running) {
        PLATFORM_LOGE("no application for [%s] [%s]", request.appId.c_str(), operation.c_str());
        return APP_CONTROL_ERROR_APP_NOT_FOUND;
    }
    std::unique_ptr<LiveLaunch> live(new LiveLaunch(request, callback, userData));
    live->_id = nextId();
    live->_request.appId = id;
    const bool sent = running ? live->_sendTo(host::sessionBus()->get(), busNameOf(id).c_str()) : live->_spawn(*entry);
    if (!sent)
        return APP_CONTROL_ERROR_LAUNCH_FAILED;
    *live->_request.launch = live->_id;
    live->_reportStarted();
    _all()[live->_id] = std::move(live);
    return APP_CONTROL_ERROR_NONE;
}

// After the sender's call has returned, like every other report.
void LiveLaunch::_reportStarted() const
{
    if (!_request.wantsStarted || _callback == nullptr)
        return;
    later([id = _id] {
        const auto found = _all().find(id);
        if (found == _all().end())
            return;
        app_control_s request = found->second->_request;
        app_control_s reply;
        found->second->_callback(&request, &reply, APP_CONTROL_RESULT_APP_STARTED, found->second->_userData);
    });
}

bool LiveLaunch::_sendTo(sd_bus* bus, const char* destination)
{
    const host::Message call = host::newCall(bus, destination, OBJECT_PATH, INTERFACE, "Launch");
    if (call == nullptr || !_request.toWire().appendTo(call.get()))
        return false;
    sd_bus_message_set_auto_start(call.get(), 0);
    _reply = host::callAsync(
        bus, call, [this](sd_bus_message* reply) { _received(reply); }, host::FOREVER);
    return _reply != nullptr;
}

bool LiveLaunch::_spawn(const AppEntry& entry)
{
    std::vector<std::string> command = commandOf(entry, _request);
    if (command.empty())
        return false;
    switch (entry.reply) {
    case ReplyKind::PROTOCOL:
        return _spawnWithProtocol(command);
    case ReplyKind::EXIT:
        return _spawnForStatus(command);
    case ReplyKind::NONE:
        break;
    }
    if (spawn(command, -1) < 0)
        return false;
    later([id = _id] {
        if (const auto found = _all().find(id); found != _all().end())
            found->second->_finish(APP_CONTROL_RESULT_APP_STARTED, {});
    });
    return true;
}

bool LiveLaunch::_spawnWithProtocol(const std::vector<std::string>& command)
{
    int ends[2];
    if (::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends) != 0)
        return false;
    std::vector<std::string> words = command;
    words.push_back("--app-control-fd=" + std::to_string(INHERITED_DESCRIPTOR));
    const pid_t process = spawn(words, ends[1]);
    ::close(ends[1]);
    if (process < 0) {
        ::close(ends[0]);
        return false;
    }
    _peer = host::peerOn(ends[0], host::PeerRole::CALLER);
    return _peer != nullptr && _sendTo(_peer->get(), nullptr);
}

// The toolkit reaps every child, so the status of the program cannot be waited for; a shell writes it into a pipe.
bool LiveLaunch::_spawnForStatus(const std::vector<std::string>& command)
{
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0)
        return false;
    std::vector<std::string> words = {"/bin/sh", "-c", "\"$@\" 3>&-; echo $? >&3", "sh"};
    words.insert(words.end(), command.begin(), command.end());
    _process = spawn(words, ends[1]);
    ::close(ends[1]);
    _status = ends[0];
    if (_process < 0)
        return false;
    _statusHandler = ecore_main_fd_handler_add(
        _status, ECORE_FD_READ,
        [](void* self, Ecore_Fd_Handler*) -> Eina_Bool {
            static_cast<LiveLaunch*>(self)->_statusReady();
            return ECORE_CALLBACK_RENEW;
        },
        this, nullptr, nullptr);
    return _statusHandler != nullptr;
}

void LiveLaunch::_statusReady()
{
    char buffer[64];
    const ssize_t length = ::read(_status, buffer, sizeof(buffer));
    if (length > 0) {
        _statusText.append(buffer, static_cast<size_t>(length));
        return;
    }
    if (!_statusText.empty() && _statusText.back() == '\n')
        _statusText.pop_back();
    _finish(parseInt(_statusText) == 0 ? APP_CONTROL_RESULT_SUCCEEDED : APP_CONTROL_RESULT_FAILED, {});
}

void LiveLaunch::_received(sd_bus_message* reply)
{
    int result = APP_CONTROL_RESULT_FAILED;
    bundle_s extras;
    if (sd_bus_message_is_method_error(reply, nullptr) > 0) {
        PLATFORM_LOGI("%s: %s", _request.appId.c_str(), sd_bus_message_get_error(reply)->message);
        return _finish(APP_CONTROL_RESULT_FAILED, {});
    }
    if (sd_bus_message_read(reply, "i", &result) < 0 || !extras.readFrom(reply))
        PLATFORM_LOGE("%s: the reply is not understood", _request.appId.c_str());
    _finish(result == APP_CONTROL_RESULT_SUCCEEDED ? APP_CONTROL_RESULT_SUCCEEDED : APP_CONTROL_RESULT_FAILED, extras);
}

void LiveLaunch::_finish(app_control_result_e result, const bundle_s& extras)
{
    const auto found = _all().find(_id);
    if (found == _all().end())
        return;
    const std::unique_ptr<LiveLaunch> self = std::move(found->second); // lives until the callback has returned
    _all().erase(found);
    *_request.launch = 0;
    if (_callback == nullptr)
        return;
    app_control_s reply;
    reply.fromWire(extras);
    _callback(&_request, &reply, result, _userData);
}

void LiveLaunch::_terminate()
{
    if (_process > 0)
        ::kill(-_process, SIGTERM);
    else if (_peer != nullptr)
        host::send(_peer->get(), host::newCall(_peer->get(), nullptr, OBJECT_PATH, INTERFACE, "Terminate"));
}

int LiveLaunch::terminate(const app_control_s& request)
{
    bool any = false;
    for (const auto& [id, live] : _all()) {
        const bool own = *request.launch != 0 ? id == *request.launch : live->_request.appId == request.appId;
        if (!own || (live->_process <= 0 && live->_peer == nullptr))
            continue;
        live->_terminate();
        any = true;
    }
    if (any)
        return APP_CONTROL_ERROR_NONE;
    if (!hasRunning(request.appId))
        return APP_CONTROL_ERROR_APP_NOT_FOUND;
    sd_bus* bus = host::sessionBus()->get();
    const std::string name = busNameOf(request.appId);
    return host::send(bus, host::newCall(bus, name.c_str(), OBJECT_PATH, INTERFACE, "Terminate"))
        ? APP_CONTROL_ERROR_NONE
        : APP_CONTROL_ERROR_LAUNCH_FAILED;
}

}

namespace {

using platform::LiveLaunch;

bool isSendable(app_control_h control)
{
    return control != nullptr && (!control->appId.empty() || !control->fields.text("operation").empty());
}

void replyFailed(const std::shared_ptr<app_control_s>& request, app_control_reply_cb callback, void* userData)
{
    if (callback == nullptr)
        return;
    app_control_s reply;
    callback(request.get(), &reply, APP_CONTROL_RESULT_FAILED, userData);
}

}

int app_control_send_launch_request(app_control_h control, app_control_reply_cb callback, void* user_data)
{
    if (!isSendable(control))
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    if (platform::isOnMainLoop())
        return LiveLaunch::start(*control, callback, user_data);
    const auto request = std::make_shared<app_control_s>(*control);
    const bool posted = platform::onMainLoop([=] {
        if (LiveLaunch::start(*request, callback, user_data) != APP_CONTROL_ERROR_NONE)
            replyFailed(request, callback, user_data);
    });
    return posted ? APP_CONTROL_ERROR_NONE : APP_CONTROL_ERROR_LAUNCH_FAILED;
}

int app_control_send_terminate_request(app_control_h control)
{
    if (!isSendable(control))
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    if (platform::isOnMainLoop())
        return LiveLaunch::terminate(*control);
    const auto request = std::make_shared<app_control_s>(*control);
    const bool posted = platform::onMainLoop([=] { LiveLaunch::terminate(*request); });
    return posted ? APP_CONTROL_ERROR_NONE : APP_CONTROL_ERROR_LAUNCH_FAILED;
}
