#pragma once

#include <string>

namespace ui {

// Writes a picture of every state of the player panel, the bookmarks and the details screen; name: only that one, empty
// for all.
void takePanelShots(
    const std::string& directory, const std::string& suffix, const std::string& name, int width, int height);

}
