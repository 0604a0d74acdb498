// Files in the desktop's clipboard: pasted as files into a file manager or a mail, as paths into a text.
#pragma once

#include <string>
#include <vector>

namespace share {

constexpr auto HOLD_OPTION = "--hold-clipboard"; // of this program; the paths follow

// Owns the clipboard until somebody else takes it or the session ends: an X11 clipboard lives in its owner. Runs in a
// process of its own, without a window on the screen; answers an exit status.
int holdClipboard(const std::vector<std::string>& paths);

}
