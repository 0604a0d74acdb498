#pragma once

#include <optional>
#include <string>

namespace platform {

struct CommandLine {
    int socket = -1; // --app-control-fd=N: started by another program, the request follows on this socket
    bool activated = false; // --bus-activated: the request follows on the session bus
    std::string mime; // --mime TYPE
};

// Nothing when it is not understood; the complaint or the help was printed, the status is then to be used.
std::optional<CommandLine> parseCommandLine(int argc, char** argv, int& exitStatus);

}
