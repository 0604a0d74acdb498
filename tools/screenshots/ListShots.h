#pragma once

#include <string>

namespace ui {

// Writes a picture of every state of the recordings list; name: only that one, empty for all.
void takeListShots(
    const std::string& directory, const std::string& suffix, const std::string& name, int width, int height);

}
