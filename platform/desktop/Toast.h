#pragma once

#include <string>

namespace platform {

// A short text above the lowest row of buttons in the main window, replacing the one before. False when there is no
// window, or none with the application's theme. Main loop.
bool showToast(const std::string& text);

}
