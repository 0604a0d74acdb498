#include "storage.h"

#include "state/Log.h"

#include <gio/gio.h>

#include <cerrno>
#include <memory>
#include <string>

#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr int INVALID_PARAMETER = -22;

std::string directoryOf(const std::string& path)
{
    const size_t slash = path.rfind('/');
    return slash == std::string::npos ? "." : path.substr(0, slash + 1);
}

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
    if (moveToTrash(path))
        return 0;
    return ::access(directoryOf(path).c_str(), W_OK | X_OK) == 0 ? -ENOTSUP : -errno;
}
