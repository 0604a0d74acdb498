#pragma once

#include <string>

class MwModel;

// Hands the recording that the user has picked to the program that asked for one, and ends this one. False when it
// cannot be handed over (any more): then nothing happens. Main loop only.
bool mwReplyWithRecording(MwModel& model, const std::string& path);
