#include "launch/CommandLine.h"

#include <charconv>
#include <cstdio>
#include <string_view>

#include <fcntl.h>
#include <sys/socket.h>
#include <sys/stat.h>

namespace platform {

namespace {

    constexpr int WRONG_USAGE = 2;
    constexpr std::string_view SOCKET_OPTION = "--app-control-fd=";
    constexpr std::string_view MIME_OPTION = "--mime=";

    void printUsage(std::FILE* to, const char* program)
    {
        std::fprintf(to,
            "Usage: %s [--mime TYPE]\n\n  --mime TYPE  format of recordings, such as audio/AMR or audio/mp4\n",
            program);
    }

    std::optional<int> parseSocket(std::string_view text)
    {
        int descriptor = -1;
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), descriptor);
        struct stat info = {};
        if (error != std::errc() || end != text.data() + text.size() || descriptor < 0
            || ::fstat(descriptor, &info) != 0 || !S_ISSOCK(info.st_mode))
            return std::nullopt;
        ::fcntl(descriptor, F_SETFD, FD_CLOEXEC);
        return descriptor;
    }

}

std::optional<CommandLine> parseCommandLine(int argc, char** argv, int& exitStatus)
{
    CommandLine line;
    for (int i = 1; i < argc; ++i) {
        const std::string_view word = argv[i];
        const bool last = i + 1 >= argc;
        if (word == "--help" || word == "-h") {
            printUsage(stdout, argv[0]);
            exitStatus = 0;
            return std::nullopt;
        }
        if (word == "--bus-activated") {
            line.activated = true;
        } else if (word == "--mime" && !last) {
            line.mime = argv[++i];
        } else if (word.starts_with(MIME_OPTION)) {
            line.mime = word.substr(MIME_OPTION.size());
        } else if (const auto socket
            = word.starts_with(SOCKET_OPTION) ? parseSocket(word.substr(SOCKET_OPTION.size())) : std::nullopt) {
            line.socket = *socket;
        } else {
            std::fprintf(stderr, "%s: %s is not understood\n", argv[0], argv[i]);
            printUsage(stderr, argv[0]);
            exitStatus = WRONG_USAGE;
            return std::nullopt;
        }
    }
    return line;
}

}
