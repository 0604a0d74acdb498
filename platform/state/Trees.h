// The two trees of the process. They live until it ends; their directories are chosen at the first use.
#pragma once

#include "state/KeyTree.h"

#include <optional>
#include <string>

namespace platform {

KeyTree& stateTree(); // facts about the outside world; memory only, pins below the configuration directory
KeyTree& preferenceTree(); // durable

std::optional<int> parseInt(const std::optional<std::string>& text); // base 10, nothing else around it
std::optional<bool> parseBool(const std::optional<std::string>& text); // 0, 1, true, false

inline std::optional<int> stateInt(const std::string& key) { return parseInt(stateTree().read(key)); }

}
