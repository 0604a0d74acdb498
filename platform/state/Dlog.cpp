#include "dlog.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include <sys/stat.h>
#include <sys/syslog.h>
#include <unistd.h>

#define SD_JOURNAL_SUPPRESS_LOCATION
#include <systemd/sd-journal.h>

namespace {

constexpr int PRIORITY_NONE = DLOG_ERROR + 1;

int leastPriority()
{
    static const int least = [] {
        const char* level = std::getenv("MEWLO_LOG");
        const std::string_view name = level != nullptr ? level : "error";
        constexpr std::string_view NAMES[] = {"debug", "info", "warn", "error", "none"};
        for (int i = DLOG_DEBUG; i <= PRIORITY_NONE; ++i)
            if (name == NAMES[i])
                return i;
        return static_cast<int>(DLOG_ERROR);
    }();
    return least;
}

// JOURNAL_STREAM names the device and inode of the journal's stream; it is inherited also by programs whose
// standard error was redirected afterwards.
bool errorOutputIsJournal()
{
    static const bool answer = [] {
        const char* stream = std::getenv("JOURNAL_STREAM");
        unsigned long device = 0;
        unsigned long inode = 0;
        struct stat info = {};
        return stream != nullptr && std::sscanf(stream, "%lu:%lu", &device, &inode) == 2
            && ::fstat(STDERR_FILENO, &info) == 0 && info.st_dev == device && info.st_ino == inode;
    }();
    return answer;
}

// The messages carry ANSI colours; only a terminal wants them.
std::string withoutEscapes(const std::string& text)
{
    std::string plain;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\033') {
            plain += text[i];
            continue;
        }
        while (i < text.size() && text[i] != 'm')
            ++i;
    }
    return plain;
}

std::string formatted(const char* format, va_list arguments)
{
    va_list again;
    va_copy(again, arguments);
    const int length = std::vsnprintf(nullptr, 0, format, again);
    va_end(again);
    if (length < 0)
        return format;
    std::string text(static_cast<size_t>(length), '\0');
    std::vsnprintf(text.data(), text.size() + 1, format, arguments);
    return text;
}

void write(int priority, const char* tag, const std::string& text)
{
    constexpr int SYSLOG[] = {LOG_DEBUG, LOG_INFO, LOG_WARNING, LOG_ERR};
    constexpr char LETTERS[] = {'D', 'I', 'W', 'E'};
    if (errorOutputIsJournal()) {
        sd_journal_send("PRIORITY=%i", SYSLOG[priority], "SYSLOG_IDENTIFIER=%s", tag, "MESSAGE=%s",
            withoutEscapes(text).c_str(), nullptr);
        return;
    }
    static const bool coloured = ::isatty(STDERR_FILENO) == 1;
    std::fprintf(stderr, "%c/%s: %s\n", LETTERS[priority], tag, (coloured ? text : withoutEscapes(text)).c_str());
}

}

int __dlog_print(log_id_t, int priority, const char* tag, const char* format, ...)
{
    if (format == nullptr || priority < DLOG_DEBUG || priority > DLOG_ERROR || priority < leastPriority())
        return 0;
    const int error = errno; // callers look at it after they have said what failed
    va_list arguments;
    va_start(arguments, format);
    const std::string text = formatted(format, arguments);
    va_end(arguments);
    write(priority, tag != nullptr ? tag : "", text);
    errno = error;
    return static_cast<int>(text.size());
}
