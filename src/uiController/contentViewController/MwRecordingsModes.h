// What sets the modes of the recordings list apart: one line for each view type, in their order.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "MwRecordingsContentViewController.h"
#include "MwRecordingsRows.h"

struct MwRecordingsMode {
    enum class Buttons : uint8_t { BACK, CANCEL_AND_DONE };

    const char* titleId; // null: the number of checked rows
    Buttons buttons;
    const char* doneTextId; // null without Done
    MwRecordingsListItem::ListType listType;
    MwRecordingsRows::Files files;
    bool plays; // a tap plays, and a controller is docked below
};

inline const MwRecordingsMode& mwRecordingsMode(MwRecordingsContentViewController::ViewType type)
{
    using Item = MwRecordingsListItem;
    using Rows = MwRecordingsRows;
    using Buttons = MwRecordingsMode::Buttons;
    constexpr auto DONE = "IDS_TPLATFORM_ACBUTTON_DONE_ABB";
    static constexpr std::array<MwRecordingsMode, 7> MODES = {{
        {"IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB", Buttons::BACK, nullptr, Item::NO_CHOICE, Rows::ALL, true},
        {"IDS_GALLERY_HEADER_SELECT", Buttons::CANCEL_AND_DONE, DONE, Item::SINGLE_CHOICE, Rows::FOR_REQUEST, true},
        {nullptr, Buttons::CANCEL_AND_DONE, "IDS_TPLATFORM_ACBUTTON_DELETE_ABB", Item::MULTIPLE_CHOICE, Rows::ALL,
            false},
        {nullptr, Buttons::CANCEL_AND_DONE, DONE, Item::MULTIPLE_CHOICE, Rows::ALL, false},
        {"IDS_FM_HEADER_SELECT_RECORDING", Buttons::BACK, nullptr, Item::SINGLE_CHOICE, Rows::ALL, false},
        {nullptr, Buttons::CANCEL_AND_DONE, DONE, Item::MULTIPLE_CHOICE, Rows::OUTSIDE_PRIVATE, false},
        {nullptr, Buttons::CANCEL_AND_DONE, DONE, Item::MULTIPLE_CHOICE, Rows::IN_PRIVATE, false},
    }};
    return MODES.at(static_cast<size_t>(type));
}
