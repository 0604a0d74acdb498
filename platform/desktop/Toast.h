#pragma once

#include <string>

namespace platform {

// A short text at the bottom of the main window, replacing the one before; false when there is no window. Main loop.
bool showToast(const std::string& text);

}
