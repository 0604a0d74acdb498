#include "DisplayServer.h"

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

namespace host {

namespace {

    std::string environment(const char* name)
    {
        const char* value = std::getenv(name);
        return value != nullptr ? value : "";
    }

    // A compositor that died leaves its socket behind.
    bool answers(const std::string& path)
    {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        if (path.size() >= sizeof address.sun_path)
            return false;
        std::memcpy(address.sun_path, path.c_str(), path.size());
        const int connection = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
        if (connection < 0)
            return false;
        const bool isThere = ::connect(connection, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
        ::close(connection);
        return isThere;
    }

    bool hasCompositor()
    {
        if (!environment("WAYLAND_SOCKET").empty()) // one that is already open
            return true;
        const std::string name = environment("WAYLAND_DISPLAY");
        if (name.empty())
            return false;
        return answers(name.front() == '/' ? name : environment("XDG_RUNTIME_DIR") + "/" + name);
    }

}

std::string displayServer()
{
    if (const std::string chosen = environment("ELM_DISPLAY"); !chosen.empty())
        return chosen;
    if (hasCompositor())
        return "wl";
    return environment("DISPLAY").empty() ? "" : "x11";
}

}
