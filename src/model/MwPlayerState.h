#pragma once

// What the player does. The numbers go into logs.
enum class MwPlayerState : int { PLAY_STATE_NONE, PLAY_STATE_PLAYING, PLAY_STATE_PAUSED };
using enum MwPlayerState;

constexpr int mwNumber(MwPlayerState state) { return static_cast<int>(state); }
