// The watchers that write what they see of the desktop into state keys. Main loop only.
#pragma once

namespace platform {

// MEWLO_HOST=none|all|<name>,... chooses; all by default. Names: lock, battery, mounts, portal, time, calls, locale,
// display, earjack, private.
void startHostWatchers();
void stopHostWatchers();

}
