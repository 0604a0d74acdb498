#include "MwMoveRecord.h"

#include <media_content.h>

#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <sstream>
#include <sys/file.h>
#include <sys/random.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>
#include <vector>

#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwMediaRow.h"
#include "MwText.h"

namespace {

using FilesLock = MwHandle<files_lock_h, media_content_unlock_files>;

constexpr std::string_view PREFIX = ".mw_move.";
constexpr size_t LARGEST = 16384; // bytes

// Size and last change, which a copy and a second name have in common, as exactly as file systems keep them.
struct State {
    long long size = -1;
    long long seconds = 0;

    [[nodiscard]] bool matches(const State& other) const
    {
        return size >= 0 && size == other.size && std::abs(seconds - other.seconds) <= COARSEST;
    }

private:
    static constexpr long long COARSEST = 2; // seconds
};

State stateOf(const std::string& path)
{
    struct stat status { };
    if (::lstat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode))
        return {};
    return {status.st_size, status.st_mtim.tv_sec};
}

struct Content {
    std::string source;
    std::string name; // in the record's directory
    State state;
};

std::string write(const Content& content)
{
    std::ostringstream out;
    out << content.state.size << ' ' << content.state.seconds << '\n'
        << content.source.size() << ' ' << content.name.size() << '\n'
        << content.source << content.name << "\nend\n";
    return out.str();
}

bool parse(const std::string& text, Content& content)
{
    std::istringstream in(text);
    size_t source = 0;
    size_t name = 0;
    in >> content.state.size >> content.state.seconds >> source >> name;
    if (!in || in.get() != '\n' || source > LARGEST || name > LARGEST)
        return false;
    content.source.resize(source);
    content.name.resize(name);
    in.read(content.source.data(), static_cast<std::streamsize>(source));
    in.read(content.name.data(), static_cast<std::streamsize>(name));
    std::string end;
    in >> end;
    return in && end == "end" && content.source.starts_with('/') && !content.name.empty()
        && content.name.find('/') == std::string::npos;
}

bool isOurs(int file, const std::string& path)
{
    struct stat open { };
    struct stat named { };
    return ::fstat(file, &open) == 0 && ::lstat(path.c_str(), &named) == 0 && open.st_ino == named.st_ino
        && open.st_uid == ::geteuid() && S_ISREG(open.st_mode) && open.st_size <= static_cast<off_t>(LARGEST);
}

// The row with the bookmarks may have followed before the end; then a look at the folders has found the source anew.
bool finishRow(const std::string& source, const std::string& destination)
{
    const std::string former = MwMediaRow::idAt(source);
    const std::string latter = MwMediaRow::idAt(destination);
    int bookmarks = 0;
    if (!former.empty())
        MW_CALL(media_info_get_bookmark_count_from_db, former.c_str(), nullptr, &bookmarks);
    if (latter.empty() || bookmarks > 0)
        return MwMediaRow::move(source, destination) != MwMediaRow::Move::FAILED;
    return former.empty() || MwMediaRow::remove({former});
}

// Answers whether nothing is left to do.
bool finish(const Content& content, const std::string& directory)
{
    const std::string destination = directory + "/" + content.name;
    // A file that was not published, or that somebody has changed since, is no double.
    if (!content.state.matches(stateOf(destination)) || !content.state.matches(stateOf(content.source)))
        return true;
    MW_LOGW("finishing the move of [%s]", content.source.c_str());
    if (!finishRow(content.source, destination))
        return false;
    if (::unlink(content.source.c_str()) != 0 && errno != ENOENT)
        return MwMoveRecord::undo(content.source, destination);
    MwFiles::flushDirectoryOf(content.source);
    return true;
}

}

bool MwMoveRecord::undo(const std::string& source, const std::string& destination)
{
    if (MwMediaRow::move(destination, source) == MwMediaRow::Move::FAILED || ::unlink(destination.c_str()) != 0)
        return false;
    MwFiles::flushDirectoryOf(destination);
    return true;
}

MwMoveRecord::MwMoveRecord(const std::string& source, const std::string& staged, const std::string& destination)
{
    const size_t slash = destination.rfind('/');
    unsigned long long number = 0;
    if (::getrandom(&number, sizeof number, 0) != static_cast<ssize_t>(sizeof number))
        return;
    _path = mwFormat("%s/%s%016llx", destination.substr(0, slash).c_str(), PREFIX.data(), number);
    _file = ::open(_path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, 0600);
    if (_file < 0 || ::flock(_file, LOCK_EX | LOCK_NB) != 0) {
        MW_LOGW("no record of the move : [%d]", errno);
        return;
    }
    const std::string text = write({source, destination.substr(slash + 1), stateOf(staged)});
    if (::write(_file, text.data(), text.size()) != static_cast<ssize_t>(text.size()))
        MW_LOGW("no record of the move : [%d]", errno);
}

MwMoveRecord::~MwMoveRecord()
{
    if (_file < 0)
        return;
    ::unlink(_path.c_str());
    ::close(_file);
}

void MwMoveRecord::recover(const std::string& directory)
{
    std::vector<std::string> found;
    std::error_code error;
    for (std::filesystem::directory_iterator entry(directory, error), end; !error && entry != end;
         entry.increment(error)) {
        if (entry->path().filename().string().starts_with(PREFIX))
            found.push_back(entry->path().string());
    }
    for (const std::string& path : found) {
        const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK);
        if (file < 0)
            continue;
        if (::flock(file, LOCK_EX | LOCK_NB) == 0 && isOurs(file, path)) {
            FilesLock lock;
            if (!MW_CALL(media_content_lock_files, lock.out())) {
                ::close(file);
                return; // the next start tries again
            }
            std::string text(LARGEST, '\0');
            const ssize_t size = ::pread(file, text.data(), text.size(), 0);
            text.resize(size > 0 ? static_cast<size_t>(size) : 0);
            Content content;
            if (!parse(text, content) || finish(content, directory))
                ::unlink(path.c_str());
        }
        ::close(file);
    }
}
