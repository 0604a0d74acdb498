#include "Commands.h"

#include <Ecore.h>
#include <media_content.h>
#include <metadata_extractor.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <limits>
#include <optional>

#include "MwFileName.h"
#include "MwHandle.h"
#include "MwText.h"
#include "MwTrim.h"

namespace {

constexpr auto USAGE = "usage: mewlo-tool trim FILE BEGIN END [--over | --out NAME]\n";

int complain(const std::string& message)
{
    std::fprintf(stderr, "mewlo-tool: %s\n", message.c_str());
    return tool::FAILED;
}

// Milliseconds of SECONDS, MM:SS or HH:MM:SS, the seconds with a fraction or without.
std::optional<int> parseTime(const std::string& text)
{
    double value = 0;
    int fields = 0;
    for (size_t from = 0; from <= text.size(); ++fields) {
        const size_t colon = std::min(text.find(':', from), text.size());
        const std::string field = text.substr(from, colon - from);
        const bool isLast = colon == text.size();
        const char* allowed = isLast ? "0123456789." : "0123456789";
        if (field.empty() || field == "." || field.find_first_not_of(allowed) != std::string::npos
            || field.find('.') != field.rfind('.'))
            return {};
        const double number = std::strtod(field.c_str(), nullptr);
        if ((fields > 0 && number >= 60) || fields > 2)
            return {};
        value = value * 60 + number;
        from = colon + 1;
    }
    const double milliseconds = std::round(value * 1000);
    return milliseconds <= std::numeric_limits<int>::max() ? std::optional<int>(static_cast<int>(milliseconds))
                                                           : std::nullopt;
}

// Milliseconds; none for what does not tell.
std::optional<int> lengthOf(const std::string& path)
{
    MwHandle<metadata_extractor_h, metadata_extractor_destroy> extractor;
    char* text = nullptr;
    if (metadata_extractor_create(extractor.out()) != 0
        || metadata_extractor_set_path(extractor.get(), path.c_str()) != 0
        || metadata_extractor_get_metadata(extractor.get(), METADATA_DURATION, &text) != 0)
        return {};
    const int length = std::atoi(mwAdopt(text).c_str());
    return length > 0 ? std::optional<int>(length) : std::nullopt;
}

std::string reasonOf(MwTrim::Failure failure, const std::string& path)
{
    switch (failure) {
    case MwTrim::Failure::NOT_SUPPORTED:
        return path + " is of a kind that cannot be trimmed";
    case MwTrim::Failure::DAMAGED:
        return path + " is no recording, is damaged, or is shorter than that";
    case MwTrim::Failure::OUT_OF_STORAGE:
        return "no room for the result; nothing was changed";
    case MwTrim::Failure::CHANGED:
        return "another program has changed " + path + " meanwhile; nothing was changed";
    case MwTrim::Failure::CANCELLED:
        return "cancelled; nothing was changed";
    case MwTrim::Failure::NONE:
    case MwTrim::Failure::OTHER:
        break;
    }
    return "trimming failed; nothing was changed";
}

Eina_Bool cancelCb(void* trim, int, void*)
{
    static_cast<MwTrim*>(trim)->cancel();
    return ECORE_CALLBACK_DONE;
}

int run(const std::string& path, bool overwrite, int begin, int end, const std::string& name)
{
    MwTrim trim;
    std::optional<MwTrim::eventType> outcome;
    trim.trimSignal.addListener([&outcome](MwTrim::eventType event) {
        outcome = event;
        ecore_main_loop_quit();
    });
    Ecore_Event_Handler* signal = ecore_event_handler_add(ECORE_EVENT_SIGNAL_EXIT, cancelCb, &trim);
    trim.start(path.c_str(), overwrite, begin, end, lengthOf(path).value_or(0), name.c_str());
    while (!outcome)
        ecore_main_loop_begin();
    ecore_event_handler_del(signal);
    if (*outcome != MwTrim::TRIM_EVENT_DONE)
        return complain(reasonOf(trim.getFailure(), path));
    std::puts(trim.getOutputPath().c_str());
    return tool::OK;
}

}

int tool::trim(const Arguments& arguments)
{
    const std::string given = option(arguments, "--out");
    const bool overwrite = arguments.size() == 4 && arguments[3] == "--over";
    const bool isRightUse
        = arguments.size() == 3 || overwrite || (arguments.size() == 5 && arguments[3] == "--out" && !given.empty());
    if (!isRightUse) {
        std::fputs(USAGE, stderr);
        return WRONG_USE;
    }
    std::error_code error;
    const std::filesystem::path file = std::filesystem::canonical(arguments[0], error);
    if (error || !std::filesystem::is_regular_file(file, error))
        return complain("there is no file " + arguments[0]);
    const auto begin = parseTime(arguments[1]);
    const auto end = parseTime(arguments[2]);
    if (!begin || !end)
        return complain((begin ? arguments[2] : arguments[1]) + " is no time: seconds, MM:SS or HH:MM:SS");
    if (*begin >= *end)
        return complain("the end must lie behind the beginning");
    if (const auto length = lengthOf(file); length && *end > *length)
        return complain(mwFormat("the recording ends after %d.%03d s", *length / 1000, *length % 1000));
    if (!given.empty() && !mwIsFileName(given, file.extension()))
        return complain(given + " is no name of a file: the result lies beside the recording");
    std::string name = given;
    if (!name.empty() && std::filesystem::path(name).extension() != file.extension())
        name += file.extension();
    if (!name.empty() && std::filesystem::exists(file.parent_path() / name, error))
        return complain(name + " exists already");
    if (ecore_init() == 0 || media_content_connect() != 0)
        return complain("the media database cannot be opened");
    const int status = run(file, overwrite, *begin, *end, name);
    media_content_disconnect();
    ecore_shutdown();
    return status;
}
