#pragma once

#include <app_control.h>

#include <functional>
#include <memory>
#include <string>

// Replies to launch requests. One may come when its request, and even who asked, are long gone. Main loop only.
namespace MwAppReplies {

using Handler = std::function<void(app_control_h reply, app_control_result_e result)>;

// The user data to send with replyCb: the handler is called as long as the owner lives, until the last reply.
void* expect(const std::weak_ptr<void>& owner, Handler handler);
void replyCb(app_control_h request, app_control_h reply, app_control_result_e result, void* userData);
// Empty when there is none.
std::string extraOf(app_control_h reply, const char* key);

}
