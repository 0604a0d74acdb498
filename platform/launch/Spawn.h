// Starts programs. Their standard output goes to standard error: ours may be read by a script.
#pragma once

#include <string>
#include <vector>

#include <sys/types.h>

namespace platform {

constexpr int INHERITED_DESCRIPTOR = 3;

// A process group of its own; the descriptor (or -1) arrives as INHERITED_DESCRIPTOR. Answers the process id, or -1.
pid_t spawn(const std::vector<std::string>& command, int descriptor);

}
