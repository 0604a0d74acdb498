// What a desktop offers to do with some files. Any thread.
#pragma once

#include <app_control.h>

#include <string>
#include <vector>

namespace share {

struct Way {
    const char* textId;
    std::vector<std::string> command; // program and arguments; empty for the clipboard
};

// The existing files of a share request, in its order.
std::vector<std::string> pathsOf(app_control_h request);
// The ways whose programs are installed; the clipboard is always one, and the last.
std::vector<Way> waysFor(const std::vector<std::string>& paths);
// The files as a list of URIs, one a line.
std::string uriListOf(const std::vector<std::string>& paths);
// False when the program does not start.
bool start(const std::vector<std::string>& command);

}
