#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <string_view>

#include "Commands.h"
#include "MwText.h"

namespace {

struct Command {
    const char* name;
    const char* parameters;
    const char* help;
    int (*run)(const tool::Arguments& arguments);
    size_t leastWords = 0; // besides options
    size_t mostWords = 0;
    std::array<std::string_view, 2> valueOptions{}; // each followed by its value
    std::string_view flag{};
};

constexpr size_t ANY_WORDS = std::numeric_limits<size_t>::max(); // the command looks at its words itself

constexpr std::array<Command, 10> COMMANDS = {{
    {.name = "record",
        .parameters = "SECONDS [--format m4a|amr]",
        .help = "record without a window and print the path",
        .run = tool::record,
        .leastWords = 1,
        .mostWords = 1,
        .valueOptions = {"--format"}},
    {.name = "request",
        .parameters = "[--mime TYPE] [--max-kb N]",
        .help = "let the user record once in a window of its own and print the path",
        .run = tool::request,
        .valueOptions = {"--mime", "--max-kb"}},
    {.name = "list",
        .parameters = "",
        .help = "print path, milliseconds and number of bookmarks of every recording",
        .run = tool::list},
    {.name = "trim",
        .parameters = "FILE BEGIN END [--over | --out NAME]",
        .help = "cut a recording without loss (times: seconds, MM:SS, HH:MM:SS) and print the new path",
        .run = tool::trim,
        .leastWords = 3,
        .mostWords = 3,
        .valueOptions = {"--out"},
        .flag = "--over"},
    {.name = "state",
        .parameters = "[get KEY | set KEY VALUE | pin KEY VALUE | unpin KEY | watch [KEY...]]",
        .help = "read, write and follow state keys",
        .run = tool::state,
        .leastWords = 0,
        .mostWords = ANY_WORDS},
    {.name = "pref",
        .parameters = "[get KEY | set KEY VALUE]",
        .help = "read and write preferences",
        .run = tool::preference,
        .leastWords = 0,
        .mostWords = ANY_WORDS},
    {.name = "private",
        .parameters = "setup | open | close | forget",
        .help = "offer the private storage in the recorder, or no longer; show its recordings, or hide them",
        .run = tool::privateStorage,
        .leastWords = 1,
        .mostWords = 1},
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
    std::fputs("\n  --help, --version\n\nExit status: 0 done, 1 failed, 2 wrong use. MEWLO_LOG=debug|info|warn|error "
               "shows the "
               "log.\nControl characters and backslashes in lists are written as in C: \\n, \\t, \\\\, \\ooo.\n",
        out);
    return out == stdout ? tool::OK : tool::WRONG_USE;
}

// Unknown options, options without their value, and too few or too many words are refused before anything happens.
bool isRightUse(const Command& command, const tool::Arguments& arguments)
{
    if (command.mostWords == ANY_WORDS)
        return true;
    size_t words = 0;
    for (size_t i = 0; i < arguments.size(); ++i) {
        const std::string& word = arguments[i];
        if (!word.starts_with('-') || word == "-") {
            ++words;
            continue;
        }
        if (word == command.flag)
            continue;
        const auto& known = command.valueOptions;
        if (std::find(known.begin(), known.end(), word) == known.end() || ++i >= arguments.size())
            return false;
    }
    return words >= command.leastWords && words <= command.mostWords;
}

int run(const Command& command, const tool::Arguments& arguments)
{
    if (isRightUse(command, arguments))
        return command.run(arguments);
    std::fprintf(stderr, "usage: mewlo-tool %s %s\n", command.name, command.parameters);
    return tool::WRONG_USE;
}

int runNamed(const std::string& name, const tool::Arguments& arguments)
{
    if (name == "--help" || name == "-h" || name == "help")
        return printHelp(stdout);
    if (name == "--version") {
        std::puts("mewlo-tool " MEWLO_VERSION);
        return tool::OK;
    }
    for (const Command& command : COMMANDS) {
        if (name == command.name)
            return run(command, arguments);
    }
    return printHelp(stderr);
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

std::string escaped(const std::string& text)
{
    std::string result;
    for (const char each : text) {
        const auto code = static_cast<unsigned char>(each);
        if (each == '\\')
            result += "\\\\";
        else if (each == '\n')
            result += "\\n";
        else if (each == '\t')
            result += "\\t";
        else if (code < ' ' || code == 0x7f)
            result += mwFormat("\\%03o", static_cast<unsigned>(code));
        else
            result += each;
    }
    return result;
}

}

int main(int argc, char** argv)
{
    ::setenv("ECORE_NO_SYSTEM_MODULES", "1", 0); // the toolkit's own watchers complain at length without a system bus
    ::setenv("MEWLO_LOG", "none", 0); // standard error is for messages to people
    const int first = std::min(argc, 2);
    const int status = runNamed(argc > 1 ? argv[1] : "", tool::Arguments(argv + first, argv + argc));
    const bool failedBefore = std::ferror(stdout) != 0;
    if (std::fflush(stdout) == 0 && !failedBefore)
        return status;
    std::fprintf(stderr, "mewlo-tool: standard output cannot be written: %s\n", std::strerror(errno));
    return tool::FAILED;
}
