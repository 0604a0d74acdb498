#pragma once

#include <functional>

class MwContentViewController;

// The menu of the recordings screen at rest: what can be done with the recordings that are there, and with the one that
// is loaded. Main loop only.
namespace MwRecordingsMenu {

enum Item {
    DELETE,
    SHARE,
    RENAME,
    BOOKMARKS,
    DETAILS,
    MOVE_TO_PRIVATE,
    REMOVE_FROM_PRIVATE,
    HIDE_PRIVATE,
    SHOW_PRIVATE,
    SAVE_TO
};

// Attached to the screen.
void open(MwContentViewController& screen, const std::function<void(Item)>& chosen);

}
