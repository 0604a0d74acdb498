#include "MwAppReplies.h"

#include <cstdint>
#include <map>
#include <utility>

#include "MwLog.h"
#include "MwText.h"

namespace {

// What travels with a request is a number.
struct Expected {
    std::weak_ptr<void> owner;
    MwAppReplies::Handler handler;
};

std::map<uintptr_t, Expected>& expectedReplies()
{
    static std::map<uintptr_t, Expected> replies;
    return replies;
}

}

namespace MwAppReplies {

void* expect(const std::weak_ptr<void>& owner, Handler handler)
{
    static uintptr_t last = 0;
    std::erase_if(expectedReplies(), [](const auto& entry) { return entry.second.owner.expired(); });
    expectedReplies()[++last] = {owner, std::move(handler)};
    return reinterpret_cast<void*>(last); // NOLINT(performance-no-int-to-ptr): a number
}

void replyCb(app_control_h, app_control_h reply, app_control_result_e result, void* userData)
{
    MW_LOGW("BEGIN - result : [%d], data : [%p]", result, userData);
    if (!userData) {
        MW_LOGE("user_data == nullptr");
        return;
    }
    const auto found = expectedReplies().find(reinterpret_cast<uintptr_t>(userData));
    if (found == expectedReplies().end())
        return;
    const Expected expected = found->second;
    if (result != APP_CONTROL_RESULT_APP_STARTED || expected.owner.expired())
        expectedReplies().erase(found);
    if (!expected.owner.expired())
        expected.handler(reply, result);
}

std::string extraOf(app_control_h reply, const char* key)
{
    char* value = nullptr;
    return reply && app_control_get_extra_data(reply, key, &value) == 0 ? mwAdopt(value) : std::string();
}

}
