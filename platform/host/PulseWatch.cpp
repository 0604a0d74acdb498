#include "PulseWatch.h"

#include <pulse/pulseaudio.h>

#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <utility>

namespace host {

namespace {

    constexpr auto RETRY = std::chrono::seconds(3);
    constexpr auto LEAST_RETRY = std::chrono::milliseconds(500);

    class LoopLock {
    public:
        explicit LoopLock(pa_threaded_mainloop* loop)
            : _loop(loop)
        {
            pa_threaded_mainloop_lock(_loop);
        }
        ~LoopLock() { pa_threaded_mainloop_unlock(_loop); }
        LoopLock(const LoopLock&) = delete;
        LoopLock& operator=(const LoopLock&) = delete;

    private:
        pa_threaded_mainloop* _loop;
    };

    std::string property(const pa_proplist* properties, const char* key)
    {
        const char* value = pa_proplist_gets(properties, key);
        return value != nullptr ? value : "";
    }

    bool isOurs(const pa_proplist* properties)
    {
        return property(properties, PA_PROP_APPLICATION_PROCESS_ID) == std::to_string(getpid());
    }

    // What others listen for (a meeting, a meter, a voice command) is no recording.
    bool isRecorder(const pa_proplist* properties)
    {
        constexpr std::array<const char*, 9> RECORDERS
            = {"parec", "parecord", "pacat", "pw-record", "pw-cat", "arecord", "ffmpeg", "rec", "sox"};
        const std::string program = property(properties, PA_PROP_APPLICATION_PROCESS_BINARY);
        return property(properties, PA_PROP_MEDIA_ROLE) == "production"
            || std::find(RECORDERS.begin(), RECORDERS.end(), program) != RECORDERS.end();
    }

    std::string currentServer()
    {
        const char* server = getenv("PULSE_SERVER");
        return server != nullptr ? server : "";
    }

    bool isHeadsetPort(uint32_t type)
    {
        return type == PA_DEVICE_PORT_TYPE_HEADPHONES || type == PA_DEVICE_PORT_TYPE_HEADSET;
    }

    bool isWiredHeadset(const pa_proplist* properties)
    {
        const std::string form = property(properties, PA_PROP_DEVICE_FORM_FACTOR);
        return (form == "headphone" || form == "headset") && property(properties, PA_PROP_DEVICE_BUS) != "bluetooth";
    }

    // By the port in use where the device has ports, by the device's form otherwise.
    template <typename Info>
    bool isHeadsetInUse(const Info& info)
    {
        if (info.active_port != nullptr)
            return isHeadsetPort(info.active_port->type) && info.active_port->available != PA_PORT_AVAILABLE_NO;
        return isWiredHeadset(info.proplist);
    }

    bool hasPluggedHeadset(const pa_sink_info& info)
    {
        for (uint32_t i = 0; i < info.n_ports; ++i)
            if (isHeadsetPort(info.ports[i]->type) && info.ports[i]->available == PA_PORT_AVAILABLE_YES)
                return true;
        return info.n_ports == 0 && isWiredHeadset(info.proplist);
    }

}

// The lists of one look at the server; lives until the last of them has arrived.
struct PulseWatch::Query {
    PulseWatch* owner;
    unsigned asked;
    PulseSnapshot found;
    std::string defaultSource;
    int waiting = 0;

    void noteRole(const pa_proplist* properties)
    {
        const std::string role = property(properties, PA_PROP_MEDIA_ROLE);
        found.hasCall = found.hasCall || role == "phone";
        found.hasAlarm = found.hasAlarm || role == "alarm";
        found.hasNotification = found.hasNotification || role == "event" || role == "notification";
    }

    void note(const pa_server_info& info)
    {
        found.defaultSink = info.default_sink_name != nullptr ? info.default_sink_name : "";
        defaultSource = info.default_source_name != nullptr ? info.default_source_name : "";
    }
    void note(const pa_sink_info& info)
    {
        found.isHeadsetPlugged = found.isHeadsetPlugged || hasPluggedHeadset(info);
        if (found.defaultSink == info.name)
            found.isHeadsetOut = isHeadsetInUse(info);
    }
    void note(const pa_source_info& info)
    {
        if (info.monitor_of_sink == PA_INVALID_INDEX)
            found.microphones.insert(info.name);
        if (defaultSource == info.name)
            found.isHeadsetIn = isHeadsetInUse(info);
    }
    void note(const pa_sink_input_info& info)
    {
        if (info.corked == 0 && !isOurs(info.proplist))
            noteRole(info.proplist);
    }
    void note(const pa_source_output_info& info)
    {
        // Without a client it belongs to a module; "peaks" is a level meter, which PipeWire tells by a property.
        const bool isMeter = (info.resample_method != nullptr && std::strcmp(info.resample_method, "peaks") == 0)
            || property(info.proplist, "resample.peaks") == "true";
        if (info.client == PA_INVALID_INDEX || info.corked != 0 || isMeter || isOurs(info.proplist))
            return;
        found.othersListen = true;
        found.othersRecord = found.othersRecord || isRecorder(info.proplist);
        noteRole(info.proplist);
    }

    void expect(pa_operation* operation)
    {
        if (operation == nullptr)
            return;
        ++waiting;
        pa_operation_unref(operation);
    }
    void arrived()
    {
        if (--waiting == 0)
            owner->_finish();
    }

    template <typename Info>
    static void listCb(pa_context*, const Info* info, int end, void* data)
    {
        auto* self = static_cast<Query*>(data);
        if (end == 0 && info != nullptr)
            self->note(*info);
        else
            self->arrived();
    }
    static void serverCb(pa_context*, const pa_server_info* info, void* data)
    {
        auto* self = static_cast<Query*>(data);
        if (info != nullptr)
            self->note(*info);
        self->arrived();
    }
};

PulseWatch::PulseWatch() = default;

PulseWatch& PulseWatch::instance()
{
    static PulseWatch watch;
    return watch;
}

PulseWatch::~PulseWatch()
{
    if (_loop == nullptr)
        return;
    pa_threaded_mainloop_lock(_loop);
    _disconnect();
    pa_threaded_mainloop_unlock(_loop);
    pa_threaded_mainloop_stop(_loop);
    pa_threaded_mainloop_free(_loop);
}

bool PulseWatch::_start()
{
    const platform::Lock lock(_startMutex);
    if (_loop != nullptr)
        return true;
    _loop = pa_threaded_mainloop_new();
    return _loop != nullptr && pa_threaded_mainloop_start(_loop) == 0;
}

bool PulseWatch::_isConnectionOld() const { return _context != nullptr && _server != currentServer(); }

void PulseWatch::_disconnect()
{
    _isReady = false;
    _current.reset();
    if (_context == nullptr)
        return;
    pa_context* context = std::exchange(_context, nullptr);
    pa_context_set_state_callback(context, nullptr, nullptr);
    pa_context_set_subscribe_callback(context, nullptr, nullptr);
    pa_context_disconnect(context);
    pa_context_unref(context);
}

void PulseWatch::_connect()
{
    _disconnect();
    _lastAttempt = std::chrono::steady_clock::now();
    _server = currentServer();
    _context = pa_context_new(pa_threaded_mainloop_get_api(_loop), "Mewlo watch");
    pa_context_set_state_callback(
        _context,
        [](pa_context* context, void* data) {
            auto* self = static_cast<PulseWatch*>(data);
            switch (pa_context_get_state(context)) {
            case PA_CONTEXT_READY:
                self->_isReady = true;
                if (auto* wish = pa_context_subscribe(context, PA_SUBSCRIPTION_MASK_ALL, nullptr, nullptr);
                    wish != nullptr)
                    pa_operation_unref(wish);
                self->_query();
                break;
            case PA_CONTEXT_FAILED:
            case PA_CONTEXT_TERMINATED:
                self->_isReady = false;
                self->_publish({});
                self->_scheduleReconnect();
                break;
            default:
                break;
            }
        },
        this);
    pa_context_set_subscribe_callback(
        _context,
        [](pa_context*, pa_subscription_event_type_t, uint32_t, void* data) {
            static_cast<PulseWatch*>(data)->_query();
        },
        this);
    if (pa_context_connect(_context, nullptr, static_cast<pa_context_flags_t>(PA_CONTEXT_NOAUTOSPAWN), nullptr) < 0)
        _publish({});
}

// One look at a time; what changes meanwhile causes one more.
void PulseWatch::_query()
{
    if (!_isReady)
        return;
    if (_current) {
        _isDirty = true;
        return;
    }
    _isDirty = false;
    _current.reset(new Query{this, _asked, {}, {}, 0});
    Query* query = _current.get();
    query->found.isConnected = true;
    query->expect(pa_context_get_server_info(_context, Query::serverCb, query));
    query->expect(pa_context_get_sink_info_list(_context, Query::listCb<pa_sink_info>, query));
    query->expect(pa_context_get_source_info_list(_context, Query::listCb<pa_source_info>, query));
    query->expect(pa_context_get_sink_input_info_list(_context, Query::listCb<pa_sink_input_info>, query));
    query->expect(pa_context_get_source_output_info_list(_context, Query::listCb<pa_source_output_info>, query));
    if (query->waiting == 0)
        _finish();
}

void PulseWatch::_finish()
{
    const auto finished = std::move(_current);
    if (!_isReady)
        return;
    {
        const platform::Lock lock(_stateMutex);
        _answers = std::max(_answers, finished->asked);
    }
    _publish(finished->found);
    if (_isDirty)
        _query();
}

void PulseWatch::_publish(const PulseSnapshot& now)
{
    PulseSnapshot before;
    {
        const platform::Lock lock(_stateMutex);
        before = std::exchange(_now, now);
        if (!now.isConnected)
            _answers = _asked;
    }
    _answered.notify_all();
    if (before == now)
        return;
    const platform::Lock lock(_listenerMutex);
    for (const auto& [id, listener] : _listeners)
        listener(before, now);
}

void PulseWatch::_scheduleReconnect()
{
    {
        const platform::Lock lock(_listenerMutex);
        if (_listeners.empty() || std::exchange(_isReconnectDue, true))
            return;
    }
    pa_mainloop_api* api = pa_threaded_mainloop_get_api(_loop);
    timeval at{};
    pa_timeval_add(pa_gettimeofday(&at), std::chrono::microseconds(RETRY).count());
    api->time_new(
        api, &at,
        [](pa_mainloop_api* owner, pa_time_event* event, const timeval*, void* data) {
            auto* self = static_cast<PulseWatch*>(data);
            owner->time_free(event);
            self->_isReconnectDue = false;
            if (!self->_isReady)
                self->_connect();
        },
        this);
}

PulseSnapshot PulseWatch::snapshot()
{
    const platform::Lock lock(_stateMutex);
    return _now;
}

PulseSnapshot PulseWatch::refresh(std::chrono::milliseconds limit)
{
    if (!_start())
        return {};
    unsigned asked = 0;
    {
        const LoopLock loop(_loop);
        const auto now = std::chrono::steady_clock::now();
        asked = ++_asked;
        const bool isLost = _context == nullptr || !PA_CONTEXT_IS_GOOD(pa_context_get_state(_context));
        if (_isConnectionOld() || (isLost && now - _lastAttempt > LEAST_RETRY))
            _connect();
        else if (isLost)
            return {};
        else
            _query();
    }
    platform::Lock lock(_stateMutex);
    // The answer counts when it was asked for after this call began.
    _answered.wait_for(lock, limit, [&]() REQUIRES(_stateMutex) { return _answers >= asked; });
    return _now;
}

int PulseWatch::addListener(Listener listener)
{
    int id = 0;
    {
        const platform::Lock lock(_listenerMutex);
        id = ++_lastId;
        _listeners[id] = std::move(listener);
    }
    if (!_start())
        return id;
    const LoopLock loop(_loop);
    if (_context == nullptr || _isConnectionOld() || !PA_CONTEXT_IS_GOOD(pa_context_get_state(_context)))
        _connect();
    return id;
}

void PulseWatch::removeListener(int id)
{
    const platform::Lock lock(_listenerMutex);
    _listeners.erase(id);
}

}
