#pragma once

#include <functional>
#include <memory>

#include "support/TempDir.h"

namespace ui {

// The toolkit without a display, a home of its own, the application's theme and texts. One for a program.
class Environment {
public:
    Environment(int argc, char** argv);
    ~Environment();

private:
    support::TempDir _home;
};

// Switches the theme as the desktop does, and waits until it has arrived.
void useTheme(bool dark);

}
