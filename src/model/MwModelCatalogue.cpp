#include "MwModel.h"

#include <metadata_extractor.h>
#include <vconf.h>

#include <algorithm>
#include <string_view>
#include <unordered_set>

#include "MwLog.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr auto RECORDED_FILES_CONDITION = "MEDIA_MIME_TYPE=\"audio/AMR\" OR MEDIA_MIME_TYPE=\"audio/3gpp\" OR "
                                          "(MEDIA_MIME_TYPE=\"audio/mp4\" AND MEDIA_MODE=10)";

constexpr auto UNKNOWN_LENGTH = "--:--";

bool isPrivateStorageOpen()
{
    int open = 0;
    return vconf_get_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, &open) == 0 && open != 0;
}

bool isPrivate(const std::string& path) { return path.starts_with(mwPrivateRoot() + "/"); }

using Filter = MwHandle<filter_h, media_filter_destroy>;
using AudioMeta = MwHandle<audio_meta_h, audio_meta_destroy>;
using Extractor = MwHandle<metadata_extractor_h, metadata_extractor_destroy>;

Filter createRecordedFilesFilter()
{
    Filter filter;
    if (const int result = media_filter_create(filter.out()); result != 0) {
        MW_LOGE("media_filter_create() failed! [%d]", result);
        return {};
    }
    int result = media_filter_set_condition(filter.get(), RECORDED_FILES_CONDITION, MEDIA_CONTENT_COLLATE_NOCASE);
    if (result != 0) {
        MW_LOGE("media_filter_set_condition() failed! [%d]", result);
        return {};
    }
    result = media_filter_set_order(
        filter.get(), MEDIA_CONTENT_ORDER_DESC, "MEDIA_TIMELINE", MEDIA_CONTENT_COLLATE_DEFAULT);
    if (result != 0) {
        MW_LOGE("media_filter_set_order() failed! [%d]", result);
        return {};
    }
    return filter;
}

// For a file the database knows no audio metadata of: ask the file. False drops the record.
bool extractDuration(const char* path, int& duration)
{
    Extractor extractor;
    if (!MW_CALL(metadata_extractor_create, extractor.out())
        || !MW_CALL(metadata_extractor_set_path, extractor.get(), path))
        return false;
    char* text = nullptr;
    if (!MW_CALL(metadata_extractor_get_metadata, extractor.get(), METADATA_DURATION, &text))
        return true;
    duration = static_cast<int>(std::strtol(mwAdopt(text).c_str(), nullptr, 10));
    return true;
}

bool readDuration(media_info_h media, const std::string& path, int& duration)
{
    duration = 0;
    AudioMeta meta;
    if (const int result = media_info_get_audio(media, meta.out()); result != 0) {
        MW_LOGW("media_info_get_audio failed : [%d]!!!", result);
        return extractDuration(path.c_str(), duration);
    }
    if (const int result = audio_meta_get_duration(meta.get(), &duration); result != 0) {
        MW_LOGE("audio_meta_get_duration failed : [%d]!!!", result);
        return false;
    }
    return true;
}

bool readText(int (*get)(media_info_h, char**), const char* name, media_info_h media, std::string& text)
{
    char* value = nullptr;
    if (const int result = get(media, &value); result != 0) {
        MW_LOGE("%s failed : [%d]!!!", name, result);
        return false;
    }
    text = mwAdopt(value);
    return true;
}

bool readFileInfo(media_info_h media, MwFileInfo& info)
{
    if (!readText(media_info_get_file_path, "media_info_get_file_path", media, info.path)
        || !readText(media_info_get_display_name, "media_info_get_display_name", media, info.displayName)
        || !readText(media_info_get_media_id, "media_info_get_media_id", media, info.mediaId)
        || !MW_CALL(media_info_get_modified_time, media, &info.modifiedTime))
        return false;
    return readDuration(media, info.path, info.duration);
}

struct Iteration {
    MwModel::RecordedFileCallback callback;
    void* userData;
};

bool recordedFileCb(media_info_h media, void* userData)
{
    const auto* iteration = static_cast<Iteration*>(userData);
    if (media == nullptr)
        MW_LOGE("media is nullptr");
    return iteration->callback(media, iteration->userData);
}

}

bool MwModel::foreachRecordedFiles(RecordedFileCallback callback, void* userData)
{
    if (callback == nullptr) {
        MW_LOGE("foreachRecordedFileCb is nullptr");
        return false;
    }
    const Filter filter = createRecordedFilesFilter();
    if (!filter) {
        MW_LOGE("filter is nullptr");
        return false;
    }
    Iteration iteration{callback, userData};
    const int result = media_info_foreach_media_from_db_with_media_mode(filter.get(), recordedFileCb, &iteration);
    if (result != 0)
        MW_LOGE("media_info_foreach_media_from_db_with_media_mode() failed! [%d]", result);
    return result == 0;
}

bool MwModel::_collectFileCb(media_info_h media, void* userData)
{
    auto* files = static_cast<std::vector<MwFileInfo>*>(userData);
    MwFileInfo info;
    if (media == nullptr || !readFileInfo(media, info))
        return false;
    files->push_back(std::move(info));
    return true;
}

bool MwModel::createRecordedFileList()
{
    setRecordedFiles(readRecordedFiles());
    return true;
}

std::vector<MwFileInfo> MwModel::readRecordedFiles()
{
    std::vector<MwFileInfo> files;
    foreachRecordedFiles(_collectFileCb, &files);
    return files;
}

void MwModel::setRecordedFiles(std::vector<MwFileInfo> files)
{
    _hasHidden = !isPrivateStorageOpen()
        && std::erase_if(files, [](const MwFileInfo& info) { return isPrivate(info.path); }) > 0;
    if (files == _recordedFiles)
        return;
    ++_catalogueRevision;
    _recordedFiles = std::move(files);
}

bool MwModel::isHiddenRecording(const std::string& path) { return isPrivate(path) && !isPrivateStorageOpen(); }

void MwModel::destroyRecordedFileList()
{
    _recordedFiles.clear();
    ++_catalogueRevision;
}

const MwFileInfo* MwModel::getRecordedFileInfoByPath(const std::string& path) const
{
    const auto found = std::find_if(
        _recordedFiles.begin(), _recordedFiles.end(), [&](const MwFileInfo& info) { return info.path == path; });
    return found != _recordedFiles.end() ? &*found : nullptr;
}

size_t MwModel::removeRecordedFiles(const std::vector<std::string>& paths)
{
    ++_catalogueRevision;
    const std::unordered_set<std::string_view> removed(paths.begin(), paths.end());
    return std::erase_if(_recordedFiles, [&](const MwFileInfo& info) { return removed.contains(info.path); });
}

bool MwModel::renameRecordedFile(const std::string& path, const std::string& newPath, const std::string& newDisplayName)
{
    const auto found = std::find_if(
        _recordedFiles.begin(), _recordedFiles.end(), [&](const MwFileInfo& info) { return info.path == path; });
    if (found == _recordedFiles.end())
        return false;
    ++_catalogueRevision;
    found->path = newPath;
    found->displayName = newDisplayName;
    return true;
}

std::optional<size_t> MwModel::_currentPlayIndex() const
{
    const MwFileInfo* info = getRecordedFileInfoByPath(getCurrentPlayPath());
    if (info == nullptr)
        return std::nullopt;
    return static_cast<size_t>(info - _recordedFiles.data());
}

std::optional<std::string> MwModel::getPreviousPlayPath() const
{
    const auto index = _currentPlayIndex();
    if (!index)
        return std::nullopt;
    return _recordedFiles[(*index + _recordedFiles.size() - 1) % _recordedFiles.size()].path;
}

std::optional<std::string> MwModel::getNextPlayPath() const
{
    const auto index = _currentPlayIndex();
    if (!index)
        return std::nullopt;
    return _recordedFiles[(*index + 1) % _recordedFiles.size()].path;
}

unsigned int MwModel::getCurrentPlayDuration() const
{
    const std::string path = getCurrentPlayPath();
    if (path.empty()) {
        MW_LOGE("current play path is empty!!!");
        return 0;
    }
    Filter filter;
    if (!MW_CALL(media_filter_create, filter.out()))
        return 0;
    const std::string condition = "MEDIA_PATH=\"" + mwAdopt(media_content_escape(path.c_str())) + "\" COLLATE BINARY";
    if (const int r = media_filter_set_condition(filter.get(), condition.c_str(), MEDIA_CONTENT_COLLATE_DEFAULT);
        r != 0) {
        MW_LOGE("media_filter_set_condition failed : [%d]!!!", r);
        return 0;
    }
    if (const int result = media_filter_set_offset(filter.get(), 0, 1); result != 0) {
        MW_LOGE("media_filter_set_offset failed : [%d]!!!", result);
        return 0;
    }
    int duration = 0;
    const auto callback = [](media_info_h media, void* userData) {
        char* text = nullptr;
        const bool hasPath = media_info_get_file_path(media, &text) == 0;
        const std::string found = mwAdopt(text);
        if (!hasPath || !readDuration(media, found, *static_cast<int*>(userData)))
            *static_cast<int*>(userData) = 0;
        return false;
    };
    if (const int result = media_info_foreach_media_from_db(filter.get(), callback, &duration); result != 0) {
        MW_LOGE("media_info_foreach_media_from_db failed : [%d]!!!", result);
        return 0;
    }
    return duration > 0 ? static_cast<unsigned int>(duration) : 0;
}

std::string MwModel::getDurationText(unsigned int milliseconds, bool withHours)
{
    const unsigned int minutes = milliseconds / 60000;
    const unsigned int seconds = milliseconds / 1000 - minutes * 60;
    if (minutes >= 60) {
        const unsigned int hours = milliseconds / 3600000;
        return mwFormat("%02d:%02d:%02d", static_cast<int>(hours), static_cast<int>(minutes - hours * 60),
            static_cast<int>(seconds));
    }
    if (withHours)
        return mwFormat("00:%02d:%02d", static_cast<int>(minutes), static_cast<int>(seconds));
    return mwFormat("%02d:%02d", static_cast<int>(minutes), static_cast<int>(seconds));
}

std::string MwModel::getLengthText(int milliseconds)
{
    constexpr int SHORTEST_SHOWN = 1000;
    return milliseconds > 0 ? getDurationText(static_cast<unsigned int>(std::max(milliseconds, SHORTEST_SHOWN)), false)
                            : UNKNOWN_LENGTH;
}
