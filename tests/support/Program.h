#pragma once

#include <sys/types.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace support {

// Waits without a main loop; false when the condition does not hold within the limit (seconds).
bool waitFor(const std::function<bool()>& condition, double limit);

// A program in a process group of its own; killed with everything it started.
class Program {
public:
    Program() = default;
    explicit Program(const std::vector<std::string>& command, const std::string& outputFile = "/dev/null");
    Program(Program&& other) noexcept { *this = std::move(other); }
    Program& operator=(Program&& other) noexcept;
    ~Program() { end(); }

    [[nodiscard]] bool isRunning() const;
    // The exit status, waiting at most the limit (seconds); -1 when it still runs, 128 + number after a signal.
    int wait(double limit = 20.0);
    void signal(int number) const;
    // Kills it.
    void end();
    [[nodiscard]] pid_t id() const { return _process; }

private:
    pid_t _process = -1;
    mutable int _status = -1;
};

// Runs a command to its end; answers its standard output.
std::string outputOf(const std::string& shellCommand);

}
