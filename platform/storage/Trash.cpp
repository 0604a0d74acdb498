#include "storage.h"

#include "state/Log.h"

#include <gio/gio.h>

#include <cerrno>
#include <memory>

#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr int INVALID_PARAMETER = -22;

bool moveToTrash(const char* path)
{
    const std::unique_ptr<GFile, void (*)(void*)> file(g_file_new_for_path(path), g_object_unref);
    GError* error = nullptr;
    if (g_file_trash(file.get(), nullptr, &error))
        return true;
    PLATFORM_LOGW("no trash for %s: %s", path, error->message);
    g_error_free(error);
    return false;
}

}

int storage_trash_file(const char* path)
{
    struct stat status { };
    if (path == nullptr)
        return INVALID_PARAMETER;
    if (::lstat(path, &status) != 0)
        return -errno;
    if (S_ISDIR(status.st_mode))
        return -EISDIR;
    if (moveToTrash(path) || ::unlink(path) == 0)
        return 0;
    return -errno;
}
