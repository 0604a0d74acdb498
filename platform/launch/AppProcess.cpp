#include "launch/AppProcess.h"

#include "device/HostWatchers.h"
#include "launch/AppControl.h"
#include "launch/Identity.h"
#include "launch/LaunchDoor.h"
#include "launch/Toolkit.h"
#include "state/Log.h"
#include "state/Trees.h"
#include "vconf.h"
#include <MainLoop.h>
#include <StateKeys.h>

#include <Ecore.h>

#include <csignal>

namespace platform {

namespace {

    AppProcess* running = nullptr;

    constexpr double ACTIVATION_LIMIT = 20.0; // seconds for the request that an activation announced

    Eina_Bool signalCb(void* process, int, void*)
    {
        static_cast<AppProcess*>(process)->close();
        return ECORE_CALLBACK_CANCEL; // the toolkit would quit the loop before the pause
    }

    app_control_s ordinaryRequest(const CommandLine& line)
    {
        app_control_s request;
        request.fields.set("operation", {APP_CONTROL_OPERATION_DEFAULT});
        if (!line.mime.empty())
            request.fields.set("mime", {line.mime});
        return request;
    }

}

AppProcess::AppProcess(const ui_app_lifecycle_s& lifecycle, void* userData, Toolkit toolkit)
    : _lifecycle(lifecycle)
    , _userData(userData)
    , _toolkit(toolkit)
{
    running = this;
}

AppProcess::~AppProcess() { running = nullptr; }

AppProcess* AppProcess::current() { return running; }

int AppProcess::run(int argc, char** argv)
{
    int status = EXIT_FAILURE;
    const auto line = parseCommandLine(argc, argv, status);
    if (!line)
        return status;
    prepareToolkitEnvironment();
    if (ecore_init() == 0)
        return EXIT_FAILURE;
    ::signal(SIGPIPE, SIG_IGN);
    setLaunchReceivers(
        {[this](app_control_s& request) { _launched(request); }, [this] { later([this] { close(); }); }});
    // Before elm_init: our handler must come before the toolkit's.
    Ecore_Event_Handler* signals = ecore_event_handler_add(ECORE_EVENT_SIGNAL_EXIT, signalCb, this);
    switch (_becomeInstance(*line)) {
    case Instance::OURS:
        status = _runToolkit(*line, argv);
        break;
    case Instance::OTHER:
        status = EXIT_SUCCESS;
        break;
    case Instance::FAILED:
        break;
    }
    ecore_event_handler_del(signals);
    setLaunchReceivers({});
    _socket.reset();
    host::closeBuses();
    ecore_shutdown();
    return status;
}

int AppProcess::_runToolkit(const CommandLine& line, char** argv)
{
    if (_toolkit == Toolkit::ELEMENTARY && !startToolkit(1, argv))
        return EXIT_FAILURE;
    startHostWatchers();
    const bool created = _lifecycle.create == nullptr || _lifecycle.create(_userData);
    if (created) {
        _loop(line);
        if (_lifecycle.terminate != nullptr)
            _lifecycle.terminate(_userData);
    }
    stopHostWatchers();
    if (_toolkit == Toolkit::ELEMENTARY)
        stopToolkit();
    return created ? EXIT_SUCCESS : EXIT_FAILURE;
}

// Only an ordinary start is a single instance: one that another program started belongs to that program.
AppProcess::Instance AppProcess::_becomeInstance(const CommandLine& line)
{
    if (line.socket >= 0)
        return _openSocket(line.socket) ? Instance::OURS : Instance::FAILED;
    _waitsForLaunch = line.activated;
    host::BusInLoop* bus = host::sessionBus();
    if (bus == nullptr)
        return Instance::OURS;
    openLaunchDoor(bus->get()); // before the name: the first request may follow at once
    if (sd_bus_request_name(bus->get(), busNameOf(appId()).c_str(), 0) != -EEXIST)
        return Instance::OURS;
    return line.activated || _handOver(line) ? Instance::OTHER : Instance::OURS;
}

// True when the running instance has the request.
bool AppProcess::_handOver(const CommandLine& line)
{
    sd_bus* bus = host::sessionBus()->get();
    const auto call = host::newCall(bus, busNameOf(appId()).c_str(), OBJECT_PATH, INTERFACE, "Launch");
    if (call == nullptr || !ordinaryRequest(line).toWire().appendTo(call.get()) || !host::send(bus, call))
        return false;
    return host::hasOwner(bus, busNameOf(appId()).c_str()); // its answer proves that the bus has the request, too
}

bool AppProcess::_openSocket(int descriptor)
{
    _waitsForLaunch = true;
    _socket = host::peerOn(descriptor, host::PeerRole::CALLED);
    if (_socket == nullptr || !openLaunchDoor(_socket->get())) {
        PLATFORM_LOGE("the socket of the caller cannot be used");
        return false;
    }
    _socket->setClosed([this] { _callerGone(); });
    return true;
}

void AppProcess::_loop(const CommandLine& line)
{
    _lockWatch = stateTree().watch(VCONFKEY_IDLE_LOCK_STATE, [this](const std::string&) { _apply(); });
    Ecore_Timer* limit = nullptr;
    if (_waitsForLaunch && line.activated)
        limit = ecore_timer_add(
            ACTIVATION_LIMIT,
            [](void* self) -> Eina_Bool {
                if (!static_cast<AppProcess*>(self)->_launchedOnce)
                    static_cast<AppProcess*>(self)->exit();
                return ECORE_CALLBACK_RENEW;
            },
            this);
    if (!_waitsForLaunch) {
        app_control_s request = ordinaryRequest(line);
        _launched(request);
    }
    _looping = true;
    if (!_ending)
        ecore_main_loop_begin();
    _looping = false;
    if (limit != nullptr)
        ecore_timer_del(limit);
    if (!_ending) // the toolkit quit by itself, its last window is gone
        _setResumed(false);
    _ending = true;
    stateTree().unwatch(std::exchange(_lockWatch, 0));
}

void AppProcess::_launched(app_control_s& request)
{
    if (_ending)
        return;
    const bool first = !std::exchange(_launchedOnce, true);
    if (_socket != nullptr && first)
        _socketRequest = request.pending;
    if (_lifecycle.control != nullptr)
        _lifecycle.control(&request, first, _userData);
    if (_ending)
        return;
    if (!first)
        return raiseMainWindow();
    ecore_idler_add(
        [](void*) -> Eina_Bool {
            if (running != nullptr) {
                running->_started = true;
                running->_apply();
            }
            return ECORE_CALLBACK_CANCEL;
        },
        nullptr);
}

// Nobody waits for the result any more: what is recorded is saved, as if the window had been closed. A caller that
// has its reply closes the socket, too; that means nothing.
void AppProcess::_callerGone()
{
    const auto pending = _socketRequest.lock();
    if (!_launchedOnce)
        return exit();
    if (pending != nullptr && !pending->isAnswered())
        close();
}

void AppProcess::_apply()
{
    if (!_started || _ending)
        return;
    const bool locked = stateInt(VCONFKEY_IDLE_LOCK_STATE).value_or(0) != 0;
    _setResumed(_visible && !locked);
}

void AppProcess::_setResumed(bool resumed)
{
    if (_resumed == resumed)
        return;
    _resumed = resumed;
    const auto callback = resumed ? _lifecycle.resume : _lifecycle.pause;
    if (callback != nullptr)
        callback(_userData);
}

void AppProcess::setWindowVisible(bool visible)
{
    _visible = visible;
    _apply();
}

void AppProcess::exit()
{
    _ending = true;
    if (_looping)
        ecore_main_loop_quit();
}

void AppProcess::close()
{
    if (_ending)
        return;
    _ending = true; // no resume any more
    _setResumed(false);
    exit();
}

}
