#pragma once

#include <functional>

#include <app.h>

namespace panekit {

// One registration for an application event, made by add() and dropped by remove() or the destructor. Main loop only.
class WAppEventHandler {
public:
    using Handler = std::function<void(app_event_info_h info)>;

    WAppEventHandler() = default;
    ~WAppEventHandler();
    WAppEventHandler(const WAppEventHandler&) = delete;
    WAppEventHandler& operator=(const WAppEventHandler&) = delete;

    bool add(app_event_type_e event, Handler handler);
    void remove();

private:
    static void _eventCb(app_event_info_h info, void* userData);
    Handler _handler;
    app_event_handler_h _registration = nullptr;
};

}
