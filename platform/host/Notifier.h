// One desktop notification that is replaced by the next one. Main loop only.
#pragma once

#include "BusInLoop.h"

#include <string>

namespace host {

class Notifier {
public:
    // False when there is no session bus. Failed notifications go to the receiver.
    bool show(const std::string& text, const std::function<void(const std::string& text)>& failed);

private:
    uint32_t _id = 0; // of the notification on the screen
    Slot _call;
};

}
