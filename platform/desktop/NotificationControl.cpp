#include "notification_control.h"

#include "host/LastingNotification.h"

#include <memory>

namespace {

using host::LastingNotification;

constexpr int INVALID_PARAMETER = -22;
constexpr int NOT_SUPPORTED = -95;

struct Control {
    explicit Control(notification_control_changed_cb changedCb, void* changedUserData)
        : notification({[changedCb, changedUserData] { changedCb(changedUserData); },
            [this](const std::string& key) {
                if (pressed != nullptr)
                    pressed(key.c_str(), pressedData);
            }})
    {
    }
    notification_control_pressed_cb pressed = nullptr;
    void* pressedData = nullptr;
    LastingNotification notification;
};

std::unique_ptr<Control>& control()
{
    static auto* only = new std::unique_ptr<Control>; // the bus goes before the statics
    return *only;
}

}

int notification_control_watch(notification_control_changed_cb changed, void* user_data)
{
    if (changed == nullptr || control() != nullptr)
        return INVALID_PARAMETER;
    if (host::sessionBus() == nullptr)
        return NOT_SUPPORTED;
    control() = std::make_unique<Control>(changed, user_data);
    return 0;
}

void notification_control_unwatch(void) { control().reset(); }

bool notification_control_is_supported(void)
{
    return control() != nullptr && host::sessionBus() != nullptr && control()->notification.isSupported();
}

int notification_control_post(const char* title, const char* text, const notification_control_action_s* actions,
    int count, notification_control_pressed_cb pressed, void* user_data)
{
    if (title == nullptr || text == nullptr || (actions == nullptr && count > 0))
        return INVALID_PARAMETER;
    if (!notification_control_is_supported())
        return NOT_SUPPORTED;
    LastingNotification::Content content{title, text, {}};
    for (int i = 0; i < count; ++i)
        content.actions.push_back({actions[i].key, actions[i].label});
    control()->pressed = pressed;
    control()->pressedData = user_data;
    control()->notification.show(content);
    return 0;
}

void notification_control_withdraw(void)
{
    if (control() == nullptr)
        return;
    control()->pressed = nullptr;
    control()->notification.withdraw();
}
