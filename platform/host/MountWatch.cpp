#include "MountWatch.h"

#include <StateKeys.h>

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <pwd.h>
#include <unistd.h>

namespace host {

namespace {

    constexpr auto TABLE = "/proc/self/mountinfo";

    std::vector<std::string> usualPlaces()
    {
        const passwd* entry = ::getpwuid(::getuid());
        const std::string user = entry != nullptr ? entry->pw_name : "";
        return user.empty() ? std::vector<std::string>()
                            : std::vector<std::string>{"/run/media/" + user, "/media/" + user};
    }

    // Blanks and the like are written as \040.
    std::string unescaped(const std::string& text)
    {
        std::string plain;
        for (size_t i = 0; i < text.size(); ++i) {
            if (text[i] == '\\' && i + 3 < text.size()) {
                plain += static_cast<char>(std::strtol(text.substr(i + 1, 3).c_str(), nullptr, 8));
                i += 3;
            } else {
                plain += text[i];
            }
        }
        return plain;
    }

    bool isReadOnly(const std::string& options) { return (options + ",").starts_with("ro,"); }

}

MountWatch::MountWatch(KeySink sink, std::vector<std::string> places)
    : _sink(std::move(sink))
    , _places(places.empty() ? usualPlaces() : std::move(places))
{
}

std::optional<std::string> MountWatch::findCard(const std::string& table, const std::vector<std::string>& places)
{
    std::istringstream lines(table);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream fields(line);
        std::string skipped;
        std::string point;
        std::string options;
        if (!(fields >> skipped >> skipped >> skipped >> skipped >> point >> options) || isReadOnly(options))
            continue;
        point = unescaped(point);
        for (const std::string& place : places)
            if (point.starts_with(place + "/"))
                return point;
    }
    return std::nullopt;
}

// The change is seen by the first poll of the open table and by nobody after it, so the toolkit, which polls twice,
// would miss it; hence a thread of its own.
void MountWatch::start()
{
    const int table = ::open(TABLE, O_RDONLY | O_CLOEXEC);
    if (table < 0 || ::pipe2(_end, O_CLOEXEC) != 0) {
        if (table >= 0)
            ::close(table);
        return;
    }
    _mailbox = std::make_unique<platform::MainLoopMailbox>();
    _report();
    _thread = std::thread([this, table, end = _end[0]] { _poll(table, end, *_mailbox); });
}

void MountWatch::stop()
{
    if (!_thread.joinable())
        return;
    ::close(std::exchange(_end[1], -1));
    _thread.join();
    ::close(std::exchange(_end[0], -1));
    _mailbox.reset();
}

void MountWatch::_poll(int table, int end, platform::MainLoopMailbox& mailbox)
{
    pollfd waits[] = {{table, POLLPRI, 0}, {end, POLLIN, 0}};
    while (waits[1].revents == 0) {
        const int ready = ::poll(waits, 2, -1);
        if (ready < 0 && errno != EINTR)
            break;
        if (ready < 0 || waits[1].revents != 0)
            continue;
        mailbox.post([this] { _report(); });
    }
    ::close(table);
}

void MountWatch::_report()
{
    std::ostringstream table;
    table << std::ifstream(TABLE).rdbuf();
    const auto card = findCard(table.str(), _places);
    if (card)
        _sink(platform::KEY_CARD_PATH, *card);
    _sink(VCONFKEY_SYSMAN_MMC_STATUS, card ? "1" : "0");
}

}
