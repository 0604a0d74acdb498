#pragma once

#include <string>

namespace ui {

// Writes a picture of every state of both control surfaces; name: only that one, empty for all.
void takeMiniShots(const std::string& directory, const std::string& suffix, const std::string& name);

}
