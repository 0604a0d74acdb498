#pragma once

#include <app_control.h>

#include <map>
#include <string>
#include <vector>

namespace ui {

// A launch request that was sent.
struct Launch {
    app_control_reply_cb callback;
    void* userData;
};
extern std::vector<Launch> launches;

// Replies as the launched application does.
void answer(const Launch& launch, app_control_result_e result, const std::map<std::string, std::string>& extras = {});

}
