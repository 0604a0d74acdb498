#include "MwFileDeleter.h"

#include <Ecore_File.h>
#include <storage.h>

#include <cerrno>
#include <iterator>
#include <utility>

#include "MwFilePlaces.h"
#include "MwLog.h"
#include "MwMediaRow.h"
#include "MwStorageRoots.h"

namespace {

constexpr size_t GROUP = 256; // rows to a commit

bool isPrivate(const std::string& path) { return path.starts_with(mwPrivateRoot() + "/"); }

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
    return _removeFile(path);
}

bool MwFileDeleter::_removeFile(const std::string& path)
{
    const int result = isPrivate(path) ? -ENOTSUP : storage_trash_file(path.c_str());
    if (result != -ENOTSUP)
        return result == 0;
    if (!_forGood) {
        _withoutTrash.push_back(path);
        return false;
    }
    if (ecore_file_unlink(path.c_str()) != EINA_FALSE)
        return true;
    MW_LOGE("ecore_file_unlink failed!!!");
    return false;
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
