#include "Commands.h"

#include <preference.h>
#include <storage.h>
#include <vconf.h>

#include <cstdio>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr mode_t OWNER_ONLY = 0700;

// Remembered for later sessions; the key, which the recorder reads, tells this one.
int remember(int method)
{
    if (preference_set_int(PREFERENCE_PRIVATE_METHOD, method) == 0
        && vconf_set_int(platform::KEY_PRIVATE_METHOD, method) == 0)
        return tool::OK;
    std::fputs("mewlo-tool: the choice cannot be stored\n", stderr);
    return tool::FAILED;
}

int setUp()
{
    const char* root = storage_private_root();
    if (::access(root, W_OK | X_OK) != 0 || ::chmod(root, OWNER_ONLY) != 0) {
        std::fprintf(stderr, "mewlo-tool: %s cannot be used\n", root);
        return tool::FAILED;
    }
    std::puts(root);
    return remember(1);
}

int setOpen(bool open)
{
    if (vconf_set_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, open ? 1 : 0) == 0)
        return tool::OK;
    std::fputs("mewlo-tool: the state cannot be stored\n", stderr);
    return tool::FAILED;
}

}

int tool::privateStorage(const Arguments& arguments)
{
    const std::string action = arguments.size() == 1 ? arguments[0] : "";
    if (action == "setup")
        return setUp();
    if (action == "forget")
        return remember(0);
    if (action == "open" || action == "close")
        return setOpen(action == "open");
    std::fputs("usage: mewlo-tool private setup | open | close | forget\n", stderr);
    return WRONG_USE;
}
