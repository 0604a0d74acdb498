#pragma once

// What the recorder does. The numbers go into logs, and to other instances by a preference.
enum class MwRecorderState : int { REC_STATE_NONE, REC_STATE_READY, REC_STATE_RECORDING, REC_STATE_PAUSED };
using enum MwRecorderState;

constexpr int mwNumber(MwRecorderState state) { return static_cast<int>(state); }

constexpr bool mwIsRecordingOrPaused(MwRecorderState state)
{
    return state == REC_STATE_RECORDING || state == REC_STATE_PAUSED;
}
