#include "MwFiles.h"

#include <Ecore_File.h>

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "MwLog.h"

namespace {

constexpr mode_t OPEN_TO_ALL = 0777;

// A place of everybody's, such as a shared root; what lies in a home follows the umask.
bool isShared(const std::string& directory)
{
    struct stat status { };
    return ::stat(directory.c_str(), &status) == 0 && (status.st_mode & S_IWOTH) != 0;
}

bool makeDirectory(const std::string& path)
{
    if (ecore_file_is_dir(path.c_str()) != EINA_FALSE)
        return true;
    if (ecore_file_mkdir(path.c_str()) == EINA_FALSE) {
        MW_LOGE("ecore_file_mkdir failed!");
        return false;
    }
    if (isShared(path.substr(0, path.rfind('/') + 1)) && ::chmod(path.c_str(), OPEN_TO_ALL) != 0)
        MW_LOGE("chmod failed!");
    return true;
}

}

namespace MwFiles {

Move moveWithoutOverwriting(const std::string& from, const std::string& to)
{
    if (::renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0)
        return Move::DONE;
    if (errno == EEXIST)
        return Move::EXISTS;
    if (errno != EXDEV && errno != EINVAL && errno != ENOSYS) {
        MW_LOGE("rename failed : [%d]!!!", errno);
        return Move::FAILED;
    }
    // Another file system, or one that cannot refuse an existing name.
    if (ecore_file_exists(to.c_str()) != EINA_FALSE)
        return Move::EXISTS;
    return ecore_file_mv(from.c_str(), to.c_str()) != EINA_FALSE ? Move::DONE : Move::FAILED;
}

void flushDirectoryOf(const std::string& path)
{
    const std::string directory = path.substr(0, path.rfind('/') + 1);
    const int handle = ::open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (handle < 0)
        return;
    ::fsync(handle);
    ::close(handle);
}

bool makeDirectories(const std::string& path)
{
    for (size_t slash = path.find('/', 1); slash != std::string::npos; slash = path.find('/', slash + 1)) {
        const std::string prefix = path.substr(0, slash);
        const std::string last = prefix.substr(prefix.rfind('/') + 1);
        if (last.empty() || last == "." || last == "..")
            continue;
        if (!makeDirectory(prefix))
            return false;
    }
    return makeDirectory(path);
}

}
