// Message buses and programs of one test, ended with it.
#pragma once

#include "support/TempDir.h"

#include <memory>
#include <string>
#include <vector>

#include <sys/types.h>

namespace support {

// A program in a process group of its own; killed with everything it started.
class Program {
public:
    explicit Program(const std::vector<std::string>& command, const std::string& outputFile = "/dev/null");
    ~Program();
    Program(const Program&) = delete;
    Program& operator=(const Program&) = delete;

    [[nodiscard]] bool isRunning() const;
    // The exit status, waiting at most the limit (seconds); -1 when it still runs, 128 + number after a signal.
    int wait(double limit = 20.0);
    void signal(int number) const;
    [[nodiscard]] pid_t id() const { return _process; }

private:
    pid_t _process = -1;
    mutable int _status = -1;
};

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
    std::unique_ptr<Program> _daemon;
};

}
