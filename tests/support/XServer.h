#pragma once

#include "support/PrivateBus.h"
#include "support/RunUntil.h"

#include <cstdlib>
#include <string>

namespace support {

// A virtual X server of its own; while it lives, DISPLAY names it.
class XServer {
public:
    XServer()
    {
        const std::string number = _directory.file("number");
        // Else the server starts anew when its last client goes, and a client that is just coming is thrown out.
        _server = Program({"Xvfb", "-displayfd", "1", "-noreset", "-screen", "0", "640x480x24"}, number);
        runUntil([&] { return readFile(number).ends_with('\n') || !_server.isRunning(); }, 30);
        _name = ":" + readFile(number);
        _name.pop_back();
        if (isUp())
            ::setenv("DISPLAY", _name.c_str(), 1);
    }
    ~XServer() { ::unsetenv("DISPLAY"); }
    XServer(const XServer&) = delete;
    XServer& operator=(const XServer&) = delete;

    // False where Xvfb is missing.
    [[nodiscard]] bool isUp() const { return _server.isRunning() && _name.size() > 1; }
    [[nodiscard]] const std::string& name() const { return _name; }

private:
    TempDir _directory;
    Program _server;
    std::string _name;
};

}
