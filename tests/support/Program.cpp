#include "support/Program.h"

#include <chrono>
#include <csignal>
#include <cstdio>
#include <thread>
#include <utility>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace support {

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

Program::Program(const std::vector<std::string>& command, const std::string& outputFile)
{
    std::vector<char*> words;
    for (const std::string& word : command)
        words.push_back(const_cast<char*>(word.c_str()));
    words.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawnattr_t attributes;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, outputFile.c_str(), O_WRONLY | O_CREAT | O_APPEND, 0600);
    posix_spawnattr_init(&attributes);
    posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);
    if (posix_spawnp(&_process, words[0], &actions, &attributes, words.data(), environ) != 0)
        _process = -1;
    posix_spawnattr_destroy(&attributes);
    posix_spawn_file_actions_destroy(&actions);
}

Program& Program::operator=(Program&& other) noexcept
{
    std::swap(_process, other._process);
    std::swap(_status, other._status);
    other.end();
    return *this;
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

void Program::end()
{
    if (_process <= 0)
        return;
    ::kill(-_process, SIGKILL);
    if (_status < 0)
        ::waitpid(_process, nullptr, 0);
    _process = -1;
}

std::string outputOf(const std::string& shellCommand)
{
    std::string output;
    FILE* pipe = popen((shellCommand + " 2>/dev/null </dev/null").c_str(), "re");
    if (pipe == nullptr)
        return output;
    char block[65536];
    for (size_t count = 0; (count = fread(block, 1, sizeof block, pipe)) > 0;)
        output.append(block, count);
    pclose(pipe);
    return output;
}

}
