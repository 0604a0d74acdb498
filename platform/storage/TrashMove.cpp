#include "storage.h"

#include <glib.h>

#include <cerrno>
#include <cstdio>
#include <ctime>
#include <fcntl.h>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr int INVALID_PARAMETER = -22;
constexpr int MOST_NAMES = 10000;

// One trash of the desktop: what lies in it, and the notes where it came from. The layout is the desktop's standard.
struct Trash {
    std::string directory;
    std::string top; // paths are told relative to it; empty in the home's trash, which tells whole ones
};

bool makeFolders(const Trash& trash)
{
    return g_mkdir_with_parents((trash.directory + "/files").c_str(), 0700) == 0
        && g_mkdir_with_parents((trash.directory + "/info").c_str(), 0700) == 0;
}

bool isOn(const std::string& directory, dev_t device)
{
    struct stat status { };
    return ::stat(directory.c_str(), &status) == 0 && status.st_dev == device;
}

// The uppermost folder of the file system that the path is on.
std::string topOf(std::string path, dev_t device)
{
    for (;;) {
        const size_t slash = path.rfind('/');
        const std::string parent = slash == 0 ? "/" : path.substr(0, slash);
        if (!isOn(parent, device))
            return path;
        if (parent == "/")
            return parent;
        path = parent;
    }
}

// The trash for files of a device; an empty directory when there is none.
Trash trashFor(const std::string& path, dev_t device)
{
    const Trash home{std::string(g_get_user_data_dir()) + "/Trash", {}};
    if (makeFolders(home) && isOn(home.directory, device))
        return home;
    const std::string top = topOf(path, device);
    const Trash own{(top == "/" ? "" : top) + "/.Trash-" + std::to_string(::getuid()), top};
    struct stat status { };
    const bool isForeign
        = ::lstat(own.directory.c_str(), &status) == 0 && (!S_ISDIR(status.st_mode) || status.st_uid != ::getuid());
    return top != "/" && !isForeign && makeFolders(own) ? own : Trash();
}

std::string noteOf(const Trash& trash, const std::string& original)
{
    const std::string told = trash.top.empty() ? original : original.substr(trash.top.size() + 1);
    gchar* escaped = g_uri_escape_string(told.c_str(), "/", FALSE);
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    char date[32];
    std::strftime(date, sizeof date, "%Y-%m-%dT%H:%M:%S", localtime_r(&now, &local));
    const std::string note = std::string("[Trash Info]\nPath=") + escaped + "\nDeletionDate=" + date + "\n";
    g_free(escaped);
    return note;
}

// Takes a name in the trash by writing its note; the number answered is a descriptor, negative when that is impossible.
int takeName(const Trash& trash, const std::string& name, std::string& taken)
{
    for (int i = 1; i < MOST_NAMES; ++i) {
        taken = i == 1 ? name : name + "." + std::to_string(i);
        const std::string note = trash.directory + "/info/" + taken + ".trashinfo";
        const int file = ::open(note.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
        if (file >= 0 || errno != EEXIST)
            return file;
    }
    return -1;
}

}

extern "C" int storage_move_to_trash(const char* path, const char* original)
{
    if (path == nullptr || original == nullptr || *original != '/')
        return INVALID_PARAMETER;
    struct stat status { };
    if (::lstat(path, &status) != 0)
        return -errno;
    const Trash trash = trashFor(path, status.st_dev);
    if (trash.directory.empty())
        return -ENOTSUP;
    const std::string shown(original);
    std::string name;
    const int note = takeName(trash, shown.substr(shown.rfind('/') + 1), name);
    if (note < 0)
        return -ENOTSUP;
    const std::string text = noteOf(trash, shown);
    const bool written = ::write(note, text.data(), text.size()) == static_cast<ssize_t>(text.size());
    ::close(note);
    const std::string destination = trash.directory + "/files/" + name;
    if (written && ::renameat2(AT_FDCWD, path, AT_FDCWD, destination.c_str(), RENAME_NOREPLACE) == 0)
        return 0;
    const int error = errno;
    ::unlink((trash.directory + "/info/" + name + ".trashinfo").c_str());
    return !written ? -ENOSPC : error == EXDEV ? -ENOTSUP : -error;
}
