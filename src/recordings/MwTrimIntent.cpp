#include "MwTrimIntent.h"

#include <cerrno>
#include <fcntl.h>
#include <filesystem>
#include <sstream>
#include <sys/file.h>
#include <sys/random.h>
#include <unistd.h>
#include <utility>

#include "MwFiles.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr std::string_view PREFIX = ".mw_trim.";
constexpr std::string_view ENDING = ".intent";
constexpr std::string_view HEAD = "mewlo trim 1";
constexpr std::string_view FOOT = "end"; // a record without it was not written to its end
constexpr size_t LARGEST = 1 << 22; // bytes
constexpr int ATTEMPTS = 16;

std::string randomName()
{
    uint64_t number = 0;
    if (::getrandom(&number, sizeof number, 0) != static_cast<ssize_t>(sizeof number))
        return {};
    return mwFormat("%s%016llx%s", PREFIX.data(), static_cast<unsigned long long>(number), ENDING.data());
}

bool isOurs(int file, const std::string& path)
{
    struct stat open { };
    struct stat named { };
    return ::fstat(file, &open) == 0 && ::lstat(path.c_str(), &named) == 0 && open.st_ino == named.st_ino
        && open.st_uid == ::geteuid() && S_ISREG(open.st_mode);
}

// A name is one line, and nothing in it leads to another directory.
std::string oneLine(std::string text)
{
    for (char& each : text) {
        if (each == '\n')
            each = ' ';
    }
    return text;
}

std::string write(const MwTrimIntent::Content& content)
{
    std::ostringstream out;
    out << HEAD << "\nreplaces " << content.replaces << "\nname " << oneLine(content.name) << "\nformer "
        << content.formerId << "\nresult " << content.result.inode << ' ' << content.result.size << "\noriginal "
        << content.original.inode << ' ' << content.original.size << '\n';
    for (const MwBookmark& bookmark : content.bookmarks)
        out << "mark " << bookmark.markedTime << ' ' << oneLine(bookmark.name) << '\n';
    out << FOOT << '\n';
    return out.str();
}

std::optional<MwTrimIntent::Content> parse(const std::string& text)
{
    MwTrimIntent::Content content;
    std::istringstream in(text);
    std::string line;
    if (!std::getline(in, line) || line != HEAD)
        return {};
    while (std::getline(in, line)) {
        if (line == FOOT)
            return content.name.empty() || content.name.find('/') != std::string::npos
                ? std::nullopt
                : std::optional(std::move(content));
        const size_t space = line.find(' ');
        const std::string key = line.substr(0, space);
        const std::string value = space != std::string::npos ? line.substr(space + 1) : std::string();
        std::istringstream numbers(value);
        if (key == "replaces") {
            content.replaces = value == "1";
        } else if (key == "name") {
            content.name = value;
        } else if (key == "former") {
            content.formerId = value;
        } else if (key == "result") {
            numbers >> content.result.inode >> content.result.size;
        } else if (key == "original") {
            numbers >> content.original.inode >> content.original.size;
        } else if (key == "mark") {
            MwBookmark bookmark;
            numbers >> bookmark.markedTime;
            const size_t name = value.find(' ');
            bookmark.name = name != std::string::npos ? value.substr(name + 1) : std::string();
            content.bookmarks.push_back(std::move(bookmark));
        }
    }
    return {};
}

}

MwTrimIntent::MwTrimIntent(std::string path, int file)
    : _path(std::move(path))
    , _file(file)
{
}

MwTrimIntent::MwTrimIntent(MwTrimIntent&& other) noexcept
    : _path(std::move(other._path))
    , _file(std::exchange(other._file, -1))
{
}

MwTrimIntent& MwTrimIntent::operator=(MwTrimIntent&& other) noexcept
{
    std::swap(_path, other._path);
    std::swap(_file, other._file);
    return *this;
}

MwTrimIntent::~MwTrimIntent()
{
    if (_file >= 0)
        ::close(_file);
}

MwTrimIntent MwTrimIntent::create(const std::string& directory)
{
    for (int i = 0; i < ATTEMPTS; ++i) {
        const std::string path = directory + "/" + randomName();
        const int file = ::open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, 0600);
        if (file < 0 && errno != EEXIST) {
            MW_LOGE("no record of the trim : [%d]", errno);
            return {};
        }
        MwTrimIntent intent(path, file);
        // Somebody who cleans up may have been faster than the lock; then the name leads nowhere by now.
        if (file < 0 || ::flock(file, LOCK_EX | LOCK_NB) != 0 || !isOurs(file, path))
            continue;
        const int staged
            = ::open(intent.stagedPath().c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, 0600);
        if (staged < 0) {
            MW_LOGE("no file for the trim : [%d]", errno);
            intent.remove();
            return {};
        }
        ::close(staged);
        return intent;
    }
    return {};
}

MwTrimIntent MwTrimIntent::adopt(const std::string& path)
{
    MwTrimIntent intent(path, ::open(path.c_str(), O_RDWR | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK));
    const bool isFree = intent._file >= 0 && ::flock(intent._file, LOCK_EX | LOCK_NB) == 0;
    return isFree && isOurs(intent._file, path) ? std::move(intent) : MwTrimIntent();
}

std::vector<std::string> MwTrimIntent::find(const std::string& directory)
{
    std::vector<std::string> found;
    std::error_code error;
    for (std::filesystem::directory_iterator entry(directory, error), end; !error && entry != end;
         entry.increment(error)) {
        const std::string name = entry->path().filename().string();
        if (name.starts_with(PREFIX) && name.ends_with(ENDING))
            found.push_back(entry->path().string());
    }
    return found;
}

std::string MwTrimIntent::stagedPath() const { return _path.substr(0, _path.size() - ENDING.size()); }

bool MwTrimIntent::save(const Content& content) const
{
    const std::string text = write(content);
    const bool saved = ::ftruncate(_file, 0) == 0
        && ::pwrite(_file, text.data(), text.size(), 0) == static_cast<ssize_t>(text.size()) && ::fsync(_file) == 0;
    if (!saved)
        MW_LOGE("the record of the trim cannot be written : [%d]", errno);
    else
        MwFiles::flushDirectoryOf(_path);
    return saved;
}

std::optional<MwTrimIntent::Content> MwTrimIntent::load() const
{
    struct stat status { };
    if (::fstat(_file, &status) != 0 || status.st_size > static_cast<off_t>(LARGEST))
        return {};
    std::string text(static_cast<size_t>(status.st_size), '\0');
    if (::pread(_file, text.data(), text.size(), 0) != static_cast<ssize_t>(text.size()))
        return {};
    return parse(text);
}

void MwTrimIntent::remove()
{
    if (_file < 0)
        return;
    ::unlink(_path.c_str());
    MwFiles::flushDirectoryOf(_path);
    ::close(std::exchange(_file, -1));
}
