#include "notification.h"

#include "desktop/Toast.h"
#include "host/Notifier.h"
#include "launch/AppProcess.h"
#include "state/Log.h"
#include <MainLoop.h>
#include <Mutex.h>

#include <optional>
#include <string>

namespace {

constexpr int INVALID_PARAMETER = -22;

struct Last {
    platform::Mutex mutex;
    std::optional<std::string> text GUARDED_BY(mutex);
};

Last& last()
{
    static auto* remembered = new Last;
    return *remembered;
}

host::Notifier& notifier()
{
    static auto* only = new host::Notifier;
    return *only;
}

void logMessage(const std::string& text) { PLATFORM_LOGI("status message: %s", text.c_str()); }

// In the window while the user looks at it, else on the desktop.
void show(const std::string& text)
{
    const platform::AppProcess* process = platform::AppProcess::current();
    const bool resumed = process != nullptr && process->isResumed();
    if (resumed && platform::showToast(text))
        return;
    if (process == nullptr || !notifier().show(text, logMessage))
        logMessage(text);
}

}

int notification_status_message_post(const char* message)
{
    if (message == nullptr)
        return INVALID_PARAMETER;
    {
        const platform::Lock lock(last().mutex);
        last().text = message;
    }
    platform::onMainLoop([text = std::string(message)] { show(text); });
    return 0;
}

const char* notification_status_message_last(void)
{
    const platform::Lock lock(last().mutex);
    return last().text ? last().text->c_str() : nullptr;
}
