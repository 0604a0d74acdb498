#include "media/MediaScan.h"

#include <dlog.h>
#include <storage.h>

#include <algorithm>
#include <chrono>
#include <fcntl.h>
#include <filesystem>
#include <map>
#include <sys/file.h>
#include <sys/stat.h>
#include <system_error>
#include <thread>
#include <unistd.h>
#include <utility>

#include "media/MediaFile.h"

namespace media {

namespace {

    constexpr auto LOCK_PATIENCE = std::chrono::seconds(10);
    constexpr auto LOCK_RETRY = std::chrono::milliseconds(10);

    using KnownRows = std::map<std::string, MediaRow>;

    KnownRows takeRowsOf(std::vector<MediaRow>& rows, const std::string& folder)
    {
        KnownRows known;
        for (auto& row : rows) {
            const size_t slash = row.path.rfind('/');
            if (slash == folder.size() && row.path.compare(0, slash, folder) == 0)
                known.emplace(row.path, std::move(row));
        }
        return known;
    }

    bool isUnchanged(const MediaRow& row, const std::string& path)
    {
        struct stat status { };
        return ::stat(path.c_str(), &status) == 0 && row.size == status.st_size
            && row.modifiedTime == status.st_mtim.tv_sec;
    }

    struct Former {
        MediaRow row;
        bool isOverwritten = false; // else its file is gone
    };

    struct Differences {
        std::vector<MediaRow> found; // no row yet
        std::vector<MediaRow> changed; // another file, or another state of it, than the row at its path is of
        std::vector<Former> former;
    };

    // Whether a folder that is not there was deleted: what cannot be reached with it says nothing about its files.
    bool isDeleted(const std::string& folder, const std::error_code& error)
    {
        const std::string root = storage_device_root();
        std::error_code ignored;
        return error == std::errc::no_such_file_or_directory && folder == root + "/" + RECORDINGS_DIRECTORY
            && std::filesystem::is_directory(root, ignored);
    }

    void compareFolder(const std::string& folder, KnownRows known, Lengths lengths, Differences& differences)
    {
        std::error_code error;
        for (auto entry = std::filesystem::directory_iterator(folder, error);
             !error && entry != std::filesystem::directory_iterator(); entry.increment(error)) {
            const std::string name = entry->path().filename().string();
            if (!isRecordingName(name))
                continue;
            const std::string path = folder + "/" + name;
            auto row = known.extract(path);
            const bool isSame = !row.empty() && isUnchanged(row.mapped(), path);
            if (isSame && (lengths == Lengths::KNOWN || row.mapped().duration >= 0))
                continue;
            auto described = describeFile(path);
            if (!described || (isSame && described->duration < 0))
                continue;
            (row.empty() ? differences.found : differences.changed).push_back(std::move(*described));
            if (!row.empty())
                differences.former.push_back({std::move(row.mapped()), true});
        }
        if (error && !isDeleted(folder, error))
            return;
        for (auto& [path, row] : known)
            differences.former.push_back({std::move(row), false});
    }

    // Renaming and moving keep size and time.
    bool isSameFile(const MediaRow& gone, const MediaRow& found)
    {
        return gone.size == found.size && gone.timeline == found.timeline && gone.mimeType == found.mimeType;
    }

    // Gives a file the row that it had under another path. False when it had none.
    bool follow(MediaRow& file, std::vector<Former>& former, FileChanges& changes)
    {
        const auto own = std::find_if(former.begin(), former.end(),
            [&](const Former& each) { return isSameFile(each.row, file) && each.row.path != file.path; });
        if (own == former.end())
            return false;
        file.id = own->row.id;
        changes.moved.emplace_back(own->row.path, std::move(file));
        former.erase(own);
        return true;
    }

    FileChanges reconcile(Differences differences)
    {
        FileChanges changes;
        std::vector<std::string> arrived; // at a path that had a row
        for (MediaRow& changed : differences.changed) {
            const std::string path = changed.path;
            if (follow(changed, differences.former, changes))
                arrived.push_back(path);
            else
                changes.put.push_back(std::move(changed));
        }
        for (MediaRow& found : differences.found) {
            if (!follow(found, differences.former, changes))
                changes.put.push_back(std::move(found));
        }
        for (Former& former : differences.former) {
            if (!former.isOverwritten)
                changes.removed.push_back(former.row.path);
            else if (std::find(arrived.begin(), arrived.end(), former.row.path) != arrived.end())
                changes.overwritten.push_back(std::move(former.row));
        }
        return changes;
    }

}

std::vector<std::string> recordingFolders()
{
    std::vector<std::string> folders;
    for (const char* root : {storage_device_root(), storage_card_root(), storage_private_root()})
        folders.push_back(std::string(root) + "/" + RECORDINGS_DIRECTORY);
    return folders;
}

int scanFolders(Database& database, const std::vector<std::string>& folders, Lengths lengths, ScanCount& count)
{
    std::vector<MediaRow> rows;
    if (const int result = database.select({}, rows); result != SQLITE_OK)
        return result;
    Differences differences;
    for (const std::string& folder : folders)
        compareFolder(folder, takeRowsOf(rows, folder), lengths, differences);
    count.added = static_cast<int>(differences.found.size());
    FileChanges changes = reconcile(std::move(differences));
    count.added -= static_cast<int>(changes.moved.size());
    count.removed = static_cast<int>(changes.removed.size());
    count.changed = static_cast<int>(changes.put.size()) + static_cast<int>(changes.moved.size()) + count.removed;
    if (count.changed == 0)
        return SQLITE_OK;
    // Rows that moved on in the meantime are under another path by now and not touched; files that came back stay.
    const FilesLock lock(database.path());
    if (!lock.isHeld())
        return SQLITE_BUSY;
    std::erase_if(changes.removed, [](const std::string& path) { return ::access(path.c_str(), F_OK) == 0; });
    return database.apply(changes);
}

FilesLock::FilesLock(const std::string& databasePath)
    : _file(::open((databasePath + ".lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600))
{
    const auto end = std::chrono::steady_clock::now() + LOCK_PATIENCE;
    while (_file && !_held) {
        _held = ::flock(_file.get(), LOCK_EX | LOCK_NB) == 0;
        if (_held || std::chrono::steady_clock::now() > end)
            break;
        std::this_thread::sleep_for(LOCK_RETRY);
    }
    if (!_held)
        __dlog_print(LOG_ID_MAIN, DLOG_WARN, "MEWLO", "another process holds the recordings");
}

}
