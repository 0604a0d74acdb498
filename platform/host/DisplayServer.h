#pragma once

#include <string>

namespace host {

// What windows are shown by, in the toolkit's words: "wl" where a Wayland compositor answers, "x11" where there is an X
// server only, empty without either; the environment's ELM_DISPLAY decides otherwise. Any thread.
std::string displayServer();

}
