#pragma once

#include <cstdint>

#include "MwRecordingsRows.h"

// What sets a mode of the recordings list apart from the others.
struct MwRecordingsMode {
    enum class Buttons : uint8_t { BACK, CANCEL_AND_DONE };

    const char* titleId = nullptr; // null: the number of checked rows
    Buttons buttons = Buttons::CANCEL_AND_DONE;
    const char* doneTextId = nullptr; // null without Done
    MwRecordingsListItem::ListType listType = MwRecordingsListItem::MULTIPLE_CHOICE;
    MwRecordingsRows::Files files = MwRecordingsRows::ALL;
    bool plays = false; // a tap plays, and a controller is docked below
    bool picks = false; // one recording for another program
    bool hasMenu = false;
};
