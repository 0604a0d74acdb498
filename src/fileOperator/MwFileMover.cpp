#include "MwFileMover.h"

#include <media_content.h>

#include <cerrno>
#include <cstdio>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "MwFilePlaces.h"
#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwMediaRow.h"
#include "MwMoveRecord.h"
#include "MwStagedFile.h"

namespace {

using FilesLock = MwHandle<files_lock_h, media_content_unlock_files>;

// Links are not followed, but for directories with a slash at the end.
bool isSameFile(const std::string& path, const std::string& other)
{
    struct stat own { };
    struct stat others { };
    return ::lstat(path.c_str(), &own) == 0 && ::lstat(other.c_str(), &others) == 0 && own.st_dev == others.st_dev
        && own.st_ino == others.st_ino;
}

// As far as can be told beforehand: not where the folder may not be changed, nor another's file in a shared folder.
bool isRemovable(const std::string& path)
{
    const std::string directory = path.substr(0, path.rfind('/') + 1);
    struct stat folder { };
    struct stat file { };
    if (::access(directory.c_str(), W_OK | X_OK) != 0 || ::stat(directory.c_str(), &folder) != 0
        || ::lstat(path.c_str(), &file) != 0)
        return false;
    const uid_t self = ::geteuid();
    return (folder.st_mode & S_ISVTX) == 0 || self == 0 || self == folder.st_uid || self == file.st_uid;
}

}

MwFileMover::MwFileMover(
    std::string directory, uint64_t totalBytes, const std::atomic<bool>& cancelled, Ask ask, Report report)
    : _directory(std::move(directory))
    , _chunksPerReport(MwFilePlaces::chunksPerReport(totalBytes))
    , _cancelled(cancelled)
    , _ask(std::move(ask))
    , _report(std::move(report))
{
}

MwFileMover::Outcome MwFileMover::move(const std::string& source, std::string& destination)
{
    _trouble = Trouble::NONE;
    if (source.empty()) {
        MW_LOGE("path is empty");
        return _fail(Trouble::MISSING);
    }
    if (!MwFilePlaces::isTaken(source)) {
        MW_LOGE("file is not existed!!!");
        return _fail(Trouble::MISSING);
    }
    // A file that is where it should go is no clash with itself.
    const bool isThere = isSameFile(source.substr(0, source.rfind('/') + 1), _directory + "/");
    if (!isThere && isSameFile(source, MwFilePlaces::destinationOf(source, _directory)))
        return _endInterrupted(source, destination);
    const auto place = isThere ? std::nullopt : _choosePlace(source, false);
    if (!place) {
        _report(MwFilePlaces::_get_file_size(source));
        return Outcome::SKIPPED;
    }
    // Before a long copy is made in vain; what this does not foresee is undone.
    if (!isRemovable(source))
        return _fail(Trouble::NOT_REMOVABLE);
    if (!MwFiles::makeDirectories(_directory))
        return _fail(Trouble::OTHER);
    return _stageAndPublish(source, *place, destination);
}

MwFileMover::Outcome MwFileMover::_fail(Trouble trouble)
{
    _trouble = trouble;
    return Outcome::FAILED;
}

// A move was killed when the file had both names. The look at the folders gives the row to the one that stays.
MwFileMover::Outcome MwFileMover::_endInterrupted(const std::string& source, std::string& destination)
{
    destination = MwFilePlaces::destinationOf(source, _directory);
    _report(MwFilePlaces::_get_file_size(source));
    if (::unlink(source.c_str()) != 0) {
        MW_LOGE("remove failed.");
        return _fail(Trouble::NOT_REMOVABLE);
    }
    MW_CALL(media_content_scan_all);
    return Outcome::MOVED;
}

// The path to use, after asking if it is taken; nothing when the file is to stay. A clash found late is one, too.
std::optional<MwFileMover::Place> MwFileMover::_choosePlace(const std::string& source, bool late)
{
    const std::string plain = MwFilePlaces::destinationOf(source, _directory);
    if (!late && !MwFilePlaces::isTaken(plain))
        return Place{plain, false};
    const MwClashAction action = _ask(source);
    if (!MwFilePlaces::isTaken(plain))
        return Place{plain, false};
    MW_LOGW("action : [%d]", static_cast<int>(action));
    if (action == MwClashAction::REPLACE)
        return Place{plain, true};
    if (action == MwClashAction::RENAME)
        return Place{MwFilePlaces::freePath(source, _directory), false};
    return std::nullopt;
}

MwFileMover::Outcome MwFileMover::_stageAndPublish(const std::string& source, Place place, std::string& destination)
{
    MwStagedFile staged(source, _directory);
    if (!staged.stage(_chunksPerReport, _report, _cancelled))
        return _fail(staged.error() == ENOSPC || staged.error() == EDQUOT ? Trouble::NO_ROOM : Trouble::OTHER);
    for (;;) {
        FilesLock lock;
        if (!MW_CALL(media_content_lock_files, lock.out()))
            return _fail(Trouble::OTHER);
        // From here to the end of the source the recording is there twice.
        std::optional<MwMoveRecord> record;
        if (staged.leavesSource())
            record.emplace(source, staged.getPath(), place.path);
        const auto published = staged.publish(place.path, place.replace);
        if (published == MwStagedFile::Outcome::FAILED)
            return _fail(Trouble::OTHER);
        if (published == MwStagedFile::Outcome::DONE) {
            destination = place.path;
            return _moveRow(source, place, staged.leavesSource());
        }
        record.reset();
        lock.close(); // somebody took the name meanwhile, and the user may think about it for long
        auto other = _choosePlace(source, true);
        if (!other)
            return Outcome::SKIPPED;
        place = std::move(*other);
    }
}

MwFileMover::Outcome MwFileMover::_moveRow(const std::string& source, const Place& place, bool sourceLeft)
{
    const auto row = MwMediaRow::move(source, place.path);
    if (row == MwMediaRow::Move::FAILED) {
        // A replaced file does not come back: better twice there than not at all.
        if (!sourceLeft)
            (void)MwFiles::moveWithoutOverwriting(place.path, source);
        else if (!place.replace)
            ::unlink(place.path.c_str());
        return _fail(Trouble::OTHER);
    }
    if (sourceLeft && _removeSource(source, place) == Outcome::FAILED)
        return Outcome::FAILED;
    // A known recording has brought its row along; only an unknown one is to be catalogued.
    if (row == MwMediaRow::Move::UNKNOWN) {
        if (const int result = media_content_scan_file(place.path.c_str()); result != 0)
            MW_LOGE("media_content_scan_file().. [0x%X]", static_cast<unsigned>(result));
    }
    return Outcome::MOVED;
}

MwFileMover::Outcome MwFileMover::_removeSource(const std::string& source, const Place& place)
{
    MW_LOGI("remove source file");
    if (::unlink(source.c_str()) == 0 || errno == ENOENT)
        return Outcome::MOVED;
    MW_LOGE("remove failed.");
    // What was replaced does not come back: then the copy stays, as a recording of its own.
    if (place.replace) {
        (void)MwMediaRow::move(place.path, source);
        MW_CALL(media_content_scan_file, place.path.c_str());
    } else if (!MwMoveRecord::undo(source, place.path)) {
        MW_LOGE("the move cannot be undone");
    }
    return _fail(Trouble::NOT_REMOVABLE);
}
