#include <panekit/WAppEventHandler.h>

#include <utility>

namespace panekit {

WAppEventHandler::~WAppEventHandler() { remove(); }

bool WAppEventHandler::add(app_event_type_e event, Handler handler)
{
    remove();
    _handler = std::move(handler);
    return app_add_event_handler(&_registration, event, _eventCb, this) == APP_ERROR_NONE;
}

void WAppEventHandler::remove()
{
    if (const auto registration = std::exchange(_registration, nullptr); registration)
        app_remove_event_handler(registration);
}

void WAppEventHandler::_eventCb(app_event_info_h info, void* userData)
{
    const auto* self = static_cast<WAppEventHandler*>(userData);
    // The handler may remove or replace itself while it runs.
    const Handler handler = self ? self->_handler : nullptr;
    if (handler)
        handler(info);
}

}
