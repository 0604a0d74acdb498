// What sets the modes of the recordings list apart: one line for each view type, in their order.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "MwRecordingsContentViewController.h"
#include "MwRecordingsRows.h"

struct MwRecordingsMode {
    enum class Buttons : uint8_t { BACK, CANCEL_AND_DONE };

    const char* titleId = nullptr; // null: the number of checked rows
    Buttons buttons = Buttons::CANCEL_AND_DONE;
    const char* doneTextId = nullptr; // null without Done
    MwRecordingsListItem::ListType listType = MwRecordingsListItem::MULTIPLE_CHOICE;
    MwRecordingsRows::Files files = MwRecordingsRows::ALL;
    bool plays = false; // a tap plays, and a controller is docked below
};

inline const MwRecordingsMode& mwRecordingsMode(MwRecordingsContentViewController::ViewType type)
{
    using Item = MwRecordingsListItem;
    using Rows = MwRecordingsRows;
    using Buttons = MwRecordingsMode::Buttons;
    constexpr auto DONE = "IDS_TPLATFORM_ACBUTTON_DONE_ABB";
    static constexpr std::array<MwRecordingsMode, 7> MODES = {{
        {.titleId = "IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB",
            .buttons = Buttons::BACK,
            .listType = Item::NO_CHOICE,
            .plays = true},
        {.titleId = "IDS_GALLERY_HEADER_SELECT",
            .doneTextId = DONE,
            .listType = Item::SINGLE_CHOICE,
            .files = Rows::FOR_REQUEST,
            .plays = true},
        {.doneTextId = "IDS_TPLATFORM_ACBUTTON_DELETE_ABB"},
        {.doneTextId = DONE},
        {.titleId = "IDS_FM_HEADER_SELECT_RECORDING", .buttons = Buttons::BACK, .listType = Item::SINGLE_CHOICE},
        {.doneTextId = DONE, .files = Rows::OUTSIDE_PRIVATE},
        {.doneTextId = DONE, .files = Rows::IN_PRIVATE},
    }};
    return MODES.at(static_cast<size_t>(type));
}
