// The user's directories after the desktop's conventions, each with our own subdirectory. Any thread.
// Nothing is created here except the runtime directory; an empty answer means that there is none to trust.
#pragma once

#include <string>

namespace platform {

constexpr auto APP_ID = "com.tovanic.mewlo-lite";

std::string homeDirectory();
std::string configDirectory(); // $XDG_CONFIG_HOME/com.tovanic.mewlo-lite
std::string dataDirectory(); // $XDG_DATA_HOME/mewlo-lite
std::string stateDirectory(); // $XDG_STATE_HOME/mewlo-lite
// $XDG_RUNTIME_DIR/com.tovanic.mewlo-lite, else /tmp/com.tovanic.mewlo-lite-<uid>; mode 0700, owned by the user.
std::string runtimeDirectory();

// Makes the directory and its parents; true when it exists afterwards.
bool makeDirectories(const std::string& path, unsigned mode);

}
