// The one way from another thread onto the main loop; work that belongs to an object goes by its MainLoopMailbox.
#pragma once

#include <functional>

namespace platform {

// True between ecore_init and ecore_shutdown.
bool isMainLoopUp();
bool isOnMainLoop();
// At once on the main loop, else in order from its next pass; false when there is no loop. Never waits.
bool onMainLoop(std::function<void()> task);
// On the main loop: in its next pass.
void later(std::function<void()> task);

}
