// Message buses of one test, ended with it.
#pragma once

#include "support/Program.h"
#include "support/TempDir.h"

#include <string>

namespace support {

enum class BusKind { SESSION, SYSTEM };

// A bus daemon; while it lives, the environment points to it as the session or system bus.
class PrivateBus {
public:
    explicit PrivateBus(BusKind kind = BusKind::SESSION);
    ~PrivateBus();

    [[nodiscard]] const std::string& address() const { return _address; }
    // True when the name has an owner within the limit (seconds).
    [[nodiscard]] bool waitForName(const std::string& name, double limit = 20.0) const;
    void stop();

private:
    TempDir _directory;
    const char* _variable;
    std::string _before;
    std::string _address;
    Program _daemon;
};

}
