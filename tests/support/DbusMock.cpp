#include "support/DbusMock.h"

#include <filesystem>

namespace support {

namespace {

    // The distribution's interpreter has the distribution's modules; another one in PATH may not.
    std::string python() { return std::filesystem::exists("/usr/bin/python3") ? "/usr/bin/python3" : "python3"; }

    std::vector<std::string> command(BusKind kind, std::vector<std::string> arguments)
    {
        std::vector<std::string> words
            = {python(), "-m", "dbusmock", kind == BusKind::SYSTEM ? "--system" : "--session"};
        words.insert(words.end(), arguments.begin(), arguments.end());
        return words;
    }

}

bool DbusMock::isInstalled() { return Program({python(), "-c", "import dbusmock"}).wait() == 0; }

DbusMock::DbusMock(const PrivateBus& bus, BusKind kind, const std::string& name, std::vector<std::string> arguments)
    : _name(name)
    , _program(command(kind, std::move(arguments)))
{
    (void)bus.waitForName(name, 60.0); // the first call fails otherwise
    sd_bus_new(&_bus);
    sd_bus_set_address(_bus, bus.address().c_str());
    sd_bus_set_bus_client(_bus, 1);
    sd_bus_start(_bus);
}

DbusMock::~DbusMock()
{
    sd_bus_message_unref(_last);
    sd_bus_close(_bus);
    sd_bus_unref(_bus);
}

int DbusMock::callsOf(const std::string& path, const char* method)
{
    int count = 0;
    if (!control(path, "GetMethodCalls", "s", method) || sd_bus_message_enter_container(_last, 'a', "(tav)") < 0)
        return -1;
    while (sd_bus_message_skip(_last, "(tav)") > 0)
        ++count;
    return count;
}

}
