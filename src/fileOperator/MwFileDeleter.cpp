#include "MwFileDeleter.h"

#include <Ecore_File.h>
#include <storage.h>

#include <iterator>
#include <utility>

#include "MwFilePlaces.h"
#include "MwLog.h"
#include "MwMediaRow.h"
#include "MwStorageRoots.h"

namespace {

constexpr size_t GROUP = 256; // rows to a commit

bool isPrivate(const std::string& path) { return path.starts_with(mwPrivateRoot() + "/"); }

// What is private must not lie about in a trash that everybody looks through.
bool removeFile(const std::string& path)
{
    if (isPrivate(path)) {
        if (ecore_file_unlink(path.c_str()) != EINA_FALSE)
            return true;
        MW_LOGE("ecore_file_unlink failed!!!");
        return false;
    }
    return MW_CALL(storage_trash_file, path.c_str());
}

}

void MwFileDeleter::remove(const std::string& path, const std::string& mediaId)
{
    if (!_deleteFile(path)) {
        MW_LOGE("_deleteFile failed, file path: [%s]", path.c_str());
        return;
    }
    if (mediaId.empty()) {
        MW_LOGE("get file info failed!!!");
        return;
    }
    _pendingPaths.push_back(path);
    _pendingIds.push_back(mediaId);
    if (_pendingIds.size() >= GROUP)
        _commit();
}

bool MwFileDeleter::_deleteFile(const std::string& path)
{
    if (path.empty()) {
        MW_LOGE("path is empty");
        return false;
    }
    if (!MwFilePlaces::isTaken(path)) {
        MW_LOGE("file is not existed!!!");
        return false;
    }
    return removeFile(path);
}

void MwFileDeleter::_commit()
{
    if (_pendingIds.empty())
        return;
    if (MwMediaRow::remove(_pendingIds))
        std::move(_pendingPaths.begin(), _pendingPaths.end(), std::back_inserter(_done));
    _pendingPaths.clear();
    _pendingIds.clear();
}

std::vector<std::string> MwFileDeleter::finish()
{
    _commit();
    return std::exchange(_done, {});
}
