#include "fakes/Fakes.h"

#include <dlog.h>

#include <cstdarg>
#include <cstdio>
#include <cstring>

namespace fakes {

Calls calls;
Recorder recorder;
Player player;
Sound sound;
Desktop desktop;
Reply reply;
Log log;

namespace {

    std::mutex logMutex;
    std::vector<std::string> logLines;

}

int Calls::record(const std::string& name, const std::string& arguments)
{
    const std::lock_guard lock(_mutex);
    _calls.push_back(arguments.empty() ? name : name + " " + arguments);
    const auto failure = _failures.find(name);
    return failure != _failures.end() ? failure->second : 0;
}

std::vector<std::string> Calls::all() const
{
    const std::lock_guard lock(_mutex);
    return _calls;
}

std::vector<std::string> Calls::matching(const std::string& prefix) const
{
    std::vector<std::string> found;
    for (const std::string& call : all()) {
        if (call.rfind(prefix, 0) == 0)
            found.push_back(call);
    }
    return found;
}

void Calls::failWith(const std::string& name, int code)
{
    const std::lock_guard lock(_mutex);
    _failures[name] = code;
}

void Calls::clear()
{
    const std::lock_guard lock(_mutex);
    _calls.clear();
    _failures.clear();
}

size_t Log::count(const std::string& text) const
{
    const std::lock_guard lock(logMutex);
    return static_cast<size_t>(std::count_if(logLines.begin(), logLines.end(),
        [&](const std::string& line) { return line.find(text) != std::string::npos; }));
}

bool Log::has(const std::string& text) const { return count(text) > 0; }

void Log::clear()
{
    const std::lock_guard lock(logMutex);
    logLines.clear();
}

void reset()
{
    calls.clear();
    log.clear();
    recorder = {};
    player = {};
    sound = {};
    desktop = {};
    reply = {};
}

}

int __dlog_print(log_id_t, int, const char* tag, const char* format, ...)
{
    char line[4096];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(line, sizeof line, format, arguments);
    va_end(arguments);
    std::string text = std::string(tag) + " " + line;
    for (size_t start = text.find('\033'); start != std::string::npos; start = text.find('\033'))
        text.erase(start, text.find('m', start) - start + 1);
    const std::lock_guard lock(fakes::logMutex);
    fakes::logLines.push_back(text);
    return 0;
}
