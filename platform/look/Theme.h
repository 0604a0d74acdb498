#pragma once

#include <string>

namespace look {

// Draws everything of one colour class anew in what the table, the theme and the focus mark ask for. Main loop.
void applyColorClass(const std::string& code);

}
