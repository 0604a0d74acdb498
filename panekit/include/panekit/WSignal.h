#pragma once

#include <Evas.h>
#include <dlog.h>
#include <panekit/WSignalIdGenerator.h>

#include <functional>
#include <list>
#include <map>
#include <memory>
#include <utility>

namespace panekit {

template <typename Signature>
class WSignal;

// A typed listener list, owned as a plain member by whoever announces something. Main loop only, so there is no lock;
// listeners may add and remove listeners (themselves included) and emit the same signal again while it is emitting.
// A signal is never destroyed from inside one of its own listeners.
template <typename... Args>
class WSignal<void(Args...)> {
public:
    using Callback = std::function<void(Args...)>;

    WSignal() = default;
    WSignal(const WSignal&) = delete;
    WSignal& operator=(const WSignal&) = delete;
    virtual ~WSignal() { removeAll(); }

    // Answers the identifier to remove the listener by; never 0. A listener added during an emission is called from the
    // next one on. With an object the listener goes when the object is deleted.
    unsigned int addListener(Callback callback, Evas_Object* object = nullptr)
    {
        auto record = std::make_unique<Listener>(
            Listener{std::move(callback), object, false, WSignalIdGenerator::generate(), this});
        const unsigned int id = record->id;
        _watchObject(*record);
        if (_emitting)
            _pending.push_back(std::move(record));
        else
            _listeners[id] = std::move(record);
        return id;
    }

    void removeListener(unsigned int id)
    {
        const auto found = _listeners.find(id);
        if (found == _listeners.end()) {
            __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "WAPP", "Already removed listener! =%d", static_cast<int>(id));
            return;
        }
        _unwatchObject(*found->second);
        if (_emitting)
            found->second->removed = true;
        else
            _listeners.erase(found);
    }

    // Calls the listeners in the order they registered.
    void emit(Args... args)
    {
        // Only the outermost emission cleans up: an inner one would destroy records that the outer one still walks
        // over.
        const bool outermost = !std::exchange(_emitting, true);
        _emit(args...);
        if (!outermost)
            return;
        _emitting = false;
        std::erase_if(_listeners, [](const auto& entry) { return entry.second->removed; });
        for (auto& record : std::exchange(_pending, {})) {
            if (!record->removed)
                _listeners[record->id] = std::move(record);
        }
    }

    void removeAll()
    {
        for (auto& [id, record] : _listeners) {
            _unwatchObject(*record);
            record->removed = true;
        }
        for (auto& record : _pending)
            _unwatchObject(*record);
        _pending.clear();
        if (!_emitting)
            _listeners.clear();
    }

protected:
    virtual void _emit(Args... args)
    {
        for (auto& [id, record] : _listeners) {
            if (!record->removed)
                record->callback(args...);
        }
    }

private:
    struct Listener {
        Callback callback;
        Evas_Object* object; // borrowed; its deletion removes the listener
        bool removed; // removed during an emission, purged after it
        unsigned int id;
        WSignal* owner;
    };

    void _watchObject(Listener& record)
    {
        if (record.object != nullptr)
            evas_object_event_callback_add(record.object, EVAS_CALLBACK_DEL, _objectDeletedCb, &record);
    }

    void _unwatchObject(Listener& record)
    {
        if (record.object != nullptr)
            evas_object_event_callback_del_full(record.object, EVAS_CALLBACK_DEL, _objectDeletedCb, &record);
        record.object = nullptr;
    }

    static void _objectDeletedCb(void* data, Evas*, Evas_Object*, void*)
    {
        auto* record = static_cast<Listener*>(data);
        record->object = nullptr;
        if (record->owner->_emitting) {
            record->removed = true;
            return;
        }
        if (record->id != 0)
            record->owner->removeListener(record->id);
    }

    bool _emitting = false;
    std::list<std::unique_ptr<Listener>> _pending;
    std::map<unsigned int, std::unique_ptr<Listener>> _listeners;
};

}
