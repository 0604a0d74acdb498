#include "support/PrivateBus.h"

#include "host/BusInLoop.h"

#include <chrono>
#include <csignal>
#include <functional>
#include <memory>
#include <thread>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <systemd/sd-bus.h>
#include <unistd.h>

namespace support {

namespace {

    bool waitFor(const std::function<bool()>& condition, double limit)
    {
        const auto end = std::chrono::steady_clock::now() + std::chrono::duration<double>(limit);
        while (!condition()) {
            if (std::chrono::steady_clock::now() > end)
                return false;
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        return true;
    }

    bool isOwned(const std::string& address, const std::string& name)
    {
        sd_bus* bus = nullptr;
        sd_bus_new(&bus);
        sd_bus_set_address(bus, address.c_str());
        sd_bus_set_bus_client(bus, 1);
        const bool owned = sd_bus_start(bus) >= 0 && host::hasOwner(bus, name.c_str());
        sd_bus_close(bus);
        sd_bus_unref(bus);
        return owned;
    }

    std::string configuration(const std::string& socket)
    {
        return "<!DOCTYPE busconfig PUBLIC \"-//freedesktop//DTD D-Bus Bus Configuration 1.0//EN\" "
               "\"http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd\"><busconfig><type>session</type>"
               "<listen>unix:path="
            + socket
            + "</listen><policy context=\"default\"><allow send_destination=\"*\" eavesdrop=\"true\"/>"
              "<allow eavesdrop=\"true\"/><allow own=\"*\"/></policy></busconfig>";
    }

}

Program::Program(const std::vector<std::string>& command, const std::string& outputFile)
{
    std::vector<char*> words;
    for (const std::string& word : command)
        words.push_back(const_cast<char*>(word.c_str()));
    words.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawnattr_t attributes;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, outputFile.c_str(), O_WRONLY | O_CREAT | O_APPEND, 0600);
    posix_spawnattr_init(&attributes);
    posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);
    if (posix_spawnp(&_process, words[0], &actions, &attributes, words.data(), environ) != 0)
        _process = -1;
    posix_spawnattr_destroy(&attributes);
    posix_spawn_file_actions_destroy(&actions);
}

Program::~Program()
{
    if (_process <= 0)
        return;
    ::kill(-_process, SIGKILL);
    if (_status < 0)
        ::waitpid(_process, nullptr, 0);
}

bool Program::isRunning() const
{
    int status = 0;
    if (_process <= 0 || _status >= 0)
        return false;
    // The loop of the test may have reaped the child before us; then it has ended, too.
    const pid_t ended = ::waitpid(_process, &status, WNOHANG);
    if (ended == 0)
        return true;
    _status = ended < 0 ? 255 : WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return false;
}

int Program::wait(double limit)
{
    waitFor([this] { return !isRunning(); }, limit);
    return _status;
}

void Program::signal(int number) const
{
    if (isRunning())
        ::kill(_process, number);
}

PrivateBus::PrivateBus(BusKind kind)
    : _variable(kind == BusKind::SESSION ? "DBUS_SESSION_BUS_ADDRESS" : "DBUS_SYSTEM_BUS_ADDRESS")
{
    const std::string socket = _directory.file("bus");
    writeFile(_directory.file("bus.conf"), configuration(socket));
    _daemon = std::make_unique<Program>(
        std::vector<std::string>{"dbus-daemon", "--nofork", "--config-file=" + _directory.file("bus.conf")});
    _address = "unix:path=" + socket;
    // The socket appears before anybody listens on it.
    waitFor([&] { return isOwned(_address, "org.freedesktop.DBus"); }, 20.0);
    const char* before = ::getenv(_variable);
    _before = before != nullptr ? before : "";
    ::setenv(_variable, _address.c_str(), 1);
}

PrivateBus::~PrivateBus() { ::setenv(_variable, _before.c_str(), 1); }

bool PrivateBus::waitForName(const std::string& name, double limit) const
{
    return waitFor([&] { return isOwned(_address, name); }, limit);
}

void PrivateBus::stop() { _daemon.reset(); }

}
