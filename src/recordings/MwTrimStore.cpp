#include "MwTrimStore.h"

#include <media_content.h>
#include <storage.h>

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

#include "MwFilePlaces.h"
#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwSavedBookmarks.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

using Media = MwHandle<media_info_h, media_info_destroy>;
using FilesLock = MwHandle<files_lock_h, media_content_unlock_files>;
using Content = MwTrimIntent::Content;

std::string directoryOf(const std::string& path) { return path.substr(0, path.rfind('/')); }

bool isThere(const std::string& path, struct stat& status) { return ::lstat(path.c_str(), &status) == 0; }

// Not every file system keeps its inodes, but a cut is nearly always shorter.
bool isResult(const struct stat& status, const Content& content)
{
    if (content.result.size != content.original.size)
        return static_cast<uint64_t>(status.st_size) == content.result.size;
    return status.st_ino == content.result.inode;
}

// Elsewhere files have rows only when somebody gave them one.
bool isCatalogued(const std::string& directory)
{
    for (const std::string& root : {mwDeviceRoot(), mwCardRoot(), mwPrivateRoot()}) {
        if (directory == MwFilePlaces::directoryBelow(root))
            return true;
    }
    return false;
}

bool hasRow(const std::string& mediaId)
{
    Media media;
    return !mediaId.empty() && media_info_get_media_from_db(mediaId.c_str(), media.out()) == 0;
}

bool replaceRow(const Content& content, const std::string& path)
{
    if (content.formerId.empty() && !isCatalogued(directoryOf(path)))
        return true;
    std::vector<media_bookmark_entry_s> entries;
    for (const MwBookmark& bookmark : content.bookmarks)
        entries.push_back({bookmark.markedTime, bookmark.name.c_str()});
    const char* formerId = content.replaces && !content.formerId.empty() ? content.formerId.c_str() : nullptr;
    return MW_CALL(
        media_info_replace_in_db, formerId, path.c_str(), entries.data(), static_cast<int>(entries.size()), nullptr);
}

// For a row that somebody may have written meanwhile, without the bookmarks.
bool completeRow(const Content& content, const std::string& path)
{
    if (!isCatalogued(directoryOf(path)))
        return true;
    Media media;
    char* id = nullptr;
    if (!MW_CALL(media_info_insert_to_db, path.c_str(), media.out())
        || !MW_CALL(media_info_get_media_id, media.get(), &id))
        return false;
    return MW_CALL(mwInsertBookmarks, mwAdopt(id), content.bookmarks);
}

// "Voice 001 (original).m4a": beside the recording itself, a restored one would take its name.
std::string nameInTrash(const std::string& path)
{
    const std::string mark = " (original)";
    const size_t dot = path.rfind('.');
    return dot != std::string::npos && dot > path.rfind('/') ? path.substr(0, dot) + mark + path.substr(dot)
                                                             : path + mark;
}

// A slip of the finger can be undone, but for what nobody is to see.
bool dropOriginal(const std::string& hidden, const std::string& path)
{
    const bool isPrivate = path.starts_with(std::string(mwPrivateRoot()) + "/");
    if (!isPrivate && storage_move_to_trash(hidden.c_str(), nameInTrash(path).c_str()) == 0)
        return true;
    if (::unlink(hidden.c_str()) == 0 || errno == ENOENT)
        return true;
    MW_LOGE("the replaced recording cannot be removed : [%d]", errno);
    return false;
}

// Answers whether nothing is left to do.
bool finish(const Content& content, const std::string& staged, const std::string& directory)
{
    const std::string path = directory + "/" + content.name;
    struct stat hidden { };
    struct stat named { };
    const bool isHiddenThere = isThere(staged, hidden);
    const bool isPublished = isThere(path, named) && isResult(named, content);
    if (!content.replaces) {
        if (isHiddenThere)
            return ::unlink(staged.c_str()) == 0;
        return !isPublished || completeRow(content, path);
    }
    const bool isHiddenOriginal = isHiddenThere && !isResult(hidden, content);
    if (isPublished && hasRow(content.formerId) && !replaceRow(content, path))
        return false;
    if (isPublished && content.formerId.empty() && !completeRow(content, path))
        return false;
    if (isHiddenOriginal)
        return dropOriginal(staged, path);
    return !isHiddenThere || ::unlink(staged.c_str()) == 0;
}

}

MwTrimStore::MwTrimStore(std::string source, bool overwrite, std::string name)
    : _source(std::move(source))
    , _overwrite(overwrite)
    , _name(std::move(name))
{
}

MwTrimStore::~MwTrimStore()
{
    if (!_intent.isOpen())
        return;
    ::unlink(_stagedPath.c_str());
    _intent.remove();
}

bool MwTrimStore::stage()
{
    if (::stat(_source.c_str(), &_sourceState) != 0 || !S_ISREG(_sourceState.st_mode)) {
        MW_LOGE("no recording to trim : [%d]", errno);
        return false;
    }
    _intent = MwTrimIntent::create(directoryOf(_source));
    if (!_intent.isOpen())
        return false;
    _stagedPath = _intent.stagedPath();
    if (::chmod(_stagedPath.c_str(), _sourceState.st_mode & 0777) != 0)
        MW_LOGW("the mode of the recording cannot be kept : [%d]", errno);
    return true;
}

bool MwTrimStore::_isSourceUnchanged() const
{
    struct stat now { };
    return ::stat(_source.c_str(), &now) == 0 && now.st_ino == _sourceState.st_ino && now.st_dev == _sourceState.st_dev
        && now.st_size == _sourceState.st_size && now.st_mtim.tv_sec == _sourceState.st_mtim.tv_sec
        && now.st_mtim.tv_nsec == _sourceState.st_mtim.tv_nsec;
}

MwTrimStore::Outcome MwTrimStore::store(const std::string& formerId, const std::vector<MwBookmark>& bookmarks)
{
    FilesLock lock;
    if (!MW_CALL(media_content_lock_files, lock.out()))
        return Outcome::FAILED;
    if (_overwrite && !_isSourceUnchanged()) {
        MW_LOGE("the recording was changed meanwhile");
        return Outcome::CHANGED;
    }
    struct stat staged { };
    if (!isThere(_stagedPath, staged))
        return Outcome::FAILED;
    Content content{_overwrite, {}, formerId, MwTrimIntent::Identity::of(staged),
        MwTrimIntent::Identity::of(_sourceState), bookmarks};
    if (!_publish(content))
        return Outcome::FAILED;
    if (!replaceRow(content, _output)) {
        // The file without its row is half the work: back to where it began, or finished by the next start.
        if (!_undo(content))
            _intent = MwTrimIntent();
        return Outcome::FAILED;
    }
    if (!_overwrite || dropOriginal(_stagedPath, _output))
        _intent.remove();
    else
        _intent = MwTrimIntent();
    return Outcome::DONE;
}

bool MwTrimStore::_publish(Content& content)
{
    const bool published = _overwrite ? _replaceFile(content) : _addFile(content);
    if (published)
        MwFiles::flushDirectoryOf(_output);
    return published;
}

bool MwTrimStore::_addFile(Content& content)
{
    const std::string directory = directoryOf(_source);
    if (_source.rfind('.') == std::string::npos)
        MW_LOGE("can not find extension");
    for (;;) {
        _output = _name.empty() ? MwFilePlaces::freePath(_source, directory) : directory + "/" + _name;
        content.name = _output.substr(directory.size() + 1);
        if (!_intent.save(content))
            return false;
        switch (MwFiles::moveWithoutOverwriting(_stagedPath, _output)) {
        case MwFiles::Move::DONE:
            return true;
        case MwFiles::Move::FAILED:
            return false;
        case MwFiles::Move::EXISTS:
            if (!_name.empty())
                return false;
        }
    }
}

bool MwTrimStore::_replaceFile(const Content& content)
{
    _output = _source;
    Content named = content;
    named.name = _source.substr(_source.rfind('/') + 1);
    if (!_intent.save(named))
        return false;
    _canExchange = ::renameat2(AT_FDCWD, _stagedPath.c_str(), AT_FDCWD, _output.c_str(), RENAME_EXCHANGE) == 0;
    if (_canExchange)
        return true;
    if (errno != EINVAL && errno != ENOSYS) {
        MW_LOGE("rename failed : [%d]!!!", errno);
        return false;
    }
    // Where two files cannot change places (memory cards), the original goes for good.
    return MW_CALL(std::rename, _stagedPath.c_str(), _output.c_str());
}

bool MwTrimStore::_undo(const Content& content)
{
    const bool undone = !content.replaces
        ? ::renameat2(AT_FDCWD, _output.c_str(), AT_FDCWD, _stagedPath.c_str(), RENAME_NOREPLACE) == 0
        : _canExchange && ::renameat2(AT_FDCWD, _stagedPath.c_str(), AT_FDCWD, _output.c_str(), RENAME_EXCHANGE) == 0;
    if (undone)
        MwFiles::flushDirectoryOf(_output);
    return undone;
}

void MwTrimStore::recover(const std::string& directory)
{
    for (const std::string& path : MwTrimIntent::find(directory)) {
        MwTrimIntent intent = MwTrimIntent::adopt(path);
        if (!intent.isOpen())
            continue;
        FilesLock lock;
        if (!MW_CALL(media_content_lock_files, lock.out()))
            return; // the next start tries again
        const auto content = intent.load();
        const std::string staged = intent.stagedPath();
        MW_LOGW("a trim was cut off : [%s]", staged.c_str());
        if (content ? finish(*content, staged, directory) : (::unlink(staged.c_str()) == 0 || errno == ENOENT))
            intent.remove();
    }
}
