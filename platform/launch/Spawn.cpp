#include "launch/Spawn.h"

#include "state/Log.h"

#include <cstring>

#include <csignal>
#include <spawn.h>
#include <unistd.h>

namespace platform {

namespace {

    // Both objects of posix_spawn, released together.
    class SpawnSetup {
    public:
        explicit SpawnSetup(int descriptor)
        {
            posix_spawn_file_actions_init(&actions);
            posix_spawn_file_actions_adddup2(&actions, STDERR_FILENO, STDOUT_FILENO);
            if (descriptor >= 0)
                posix_spawn_file_actions_adddup2(&actions, descriptor, INHERITED_DESCRIPTOR);
            sigset_t none;
            sigset_t all;
            sigemptyset(&none);
            sigfillset(&all);
            posix_spawnattr_init(&attributes);
            posix_spawnattr_setsigmask(&attributes, &none);
            posix_spawnattr_setsigdefault(&attributes, &all);
            posix_spawnattr_setflags(
                &attributes, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETPGROUP);
        }
        ~SpawnSetup()
        {
            posix_spawn_file_actions_destroy(&actions);
            posix_spawnattr_destroy(&attributes);
        }
        SpawnSetup(const SpawnSetup&) = delete;
        SpawnSetup& operator=(const SpawnSetup&) = delete;

        posix_spawn_file_actions_t actions;
        posix_spawnattr_t attributes;
    };

}

pid_t spawn(const std::vector<std::string>& command, int descriptor)
{
    if (command.empty())
        return -1;
    std::vector<char*> words;
    words.reserve(command.size() + 1);
    for (const std::string& word : command)
        words.push_back(const_cast<char*>(word.c_str())); // the interface of exec, which does not write
    words.push_back(nullptr);
    const SpawnSetup setup(descriptor);
    pid_t process = -1;
    const int error = posix_spawnp(&process, words[0], &setup.actions, &setup.attributes, words.data(), environ);
    if (error == 0)
        return process;
    PLATFORM_LOGE("%s cannot be started: %s", words[0], std::strerror(error));
    return -1;
}

}
