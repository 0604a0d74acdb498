#include <array>
#include <cstdio>
#include <cstdlib>

#include "Commands.h"

namespace {

struct Command {
    const char* name;
    const char* parameters;
    const char* help;
    int (*run)(const tool::Arguments& arguments);
};

constexpr std::array<Command, 10> COMMANDS = {{
    {.name = "record",
        .parameters = "SECONDS [--format m4a|amr]",
        .help = "record without a window and print the path",
        .run = tool::record},
    {.name = "request",
        .parameters = "[--mime TYPE] [--max-kb N]",
        .help = "let the user record once in a window of its own and print the path",
        .run = tool::request},
    {.name = "list",
        .parameters = "",
        .help = "print path, milliseconds and number of bookmarks of every recording",
        .run = tool::list},
    {.name = "trim",
        .parameters = "FILE BEGIN END [--over | --out NAME]",
        .help = "cut a recording without loss (times: seconds, MM:SS, HH:MM:SS) and print the new path",
        .run = tool::trim},
    {.name = "state",
        .parameters = "get KEY | set KEY VALUE | pin KEY VALUE | unpin KEY | watch [KEY...]",
        .help = "read, write and follow state keys",
        .run = tool::state},
    {.name = "pref",
        .parameters = "get KEY | set KEY VALUE",
        .help = "read and write preferences",
        .run = tool::preference},
    {.name = "private",
        .parameters = "setup | open | close | forget",
        .help = "offer the private storage in the recorder, or no longer; show its recordings, or hide them",
        .run = tool::privateStorage},
    {.name = "locks", .parameters = "", .help = "print the power locks that are held", .run = tool::locks},
    {.name = "usage", .parameters = "", .help = "print the usage log", .run = tool::usage},
    {.name = "doctor",
        .parameters = "",
        .help = "print which services were found and what stands in for the others",
        .run = tool::doctor},
}};

int printHelp(std::FILE* out)
{
    std::fputs("usage: mewlo-tool COMMAND [...]\n\n", out);
    for (const Command& command : COMMANDS)
        std::fprintf(out, "  %s %s\n      %s\n", command.name, command.parameters, command.help);
    return out == stdout ? tool::OK : tool::WRONG_USE;
}

}

namespace tool {

std::string option(const Arguments& arguments, const std::string& name)
{
    for (size_t i = 0; i + 1 < arguments.size(); ++i) {
        if (arguments[i] == name)
            return arguments[i + 1];
    }
    return {};
}

bool parseNumber(const std::string& text, long& number)
{
    char* end = nullptr;
    number = std::strtol(text.c_str(), &end, 10);
    return !text.empty() && *end == '\0';
}

}

int main(int argc, char** argv)
{
    ::setenv("ECORE_NO_SYSTEM_MODULES", "1", 0); // the toolkit's own watchers complain at length without a system bus
    const std::string name = argc > 1 ? argv[1] : "";
    if (name == "--help" || name == "-h" || name == "help")
        return printHelp(stdout);
    for (const Command& command : COMMANDS) {
        if (name == command.name)
            return command.run(tool::Arguments(argv + 2, argv + argc));
    }
    return printHelp(stderr);
}
