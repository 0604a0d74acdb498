#include "MwModel.h"

#include <notification.h>
#include <preference.h>
#include <vconf.h>

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <utility>

#include "MwLog.h"
#include "MwRecordingNotes.h"
#include "MwSavedBookmarks.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr auto STORAGE_PREFERENCE_KEY = "preference/com.tovanic.mewlo-lite/storage";
constexpr auto RECORDING_STATE_KEY = "MainRecordingState";
constexpr auto RECORDING_PROCESS_KEY = "MainRecordingProcess";
constexpr auto RECORDING_PROCESS_START_KEY = "MainRecordingProcessStart";
constexpr int CARD_MOUNTED = 1;
constexpr size_t MAX_MESSAGE_BYTES = 1024;

// A number alone may be another process's by now: with the moment of its start it names one. Zero start: none such.
std::pair<int, int> identityOf(int process)
{
    constexpr int FIELDS_TO_START = 20; // behind the name, which ends with the last parenthesis
    std::ifstream file("/proc/" + std::to_string(process) + "/stat");
    std::string line;
    std::getline(file, line);
    const size_t name = line.rfind(')');
    if (name == std::string::npos)
        return {process, 0};
    std::istringstream fields(line.substr(name + 1));
    std::string field;
    for (int i = 0; i < FIELDS_TO_START; ++i)
        fields >> field;
    return {process, static_cast<int>(std::strtoul(field.c_str(), nullptr, 10) & 0x7FFFFFFF)};
}

void postTooManyBookmarks()
{
    std::string message = mwTranslateNumber("IDS_MW_TPOP_CANT_ADD_MORE_THAN_PD_BOOKMARKS", MwModel::MAX_BOOKMARKS);
    message.resize(std::min(message.size(), MAX_MESSAGE_BYTES - 1));
    notification_status_message_post(message.c_str());
}

}

void MwModel::setRecorderState(MwRecorderState state)
{
    const MwRecorderState before = _recorderState.exchange(state);
    // For the desktop: what its remote controls show, and whether a shutdown waits for the recording to be saved. An
    // instance that only comes and goes beside a recording one must not speak for it.
    const bool isRecordings = state >= REC_STATE_RECORDING || before >= REC_STATE_RECORDING;
    if (!_requestMode || isRecordings) {
        vconf_set_int(VCONFKEY_MEWLO_RECORDER_STATE, mwNumber(state));
        vconf_set_str(VCONFKEY_MEWLO_TITLE, getCurrentRecordingFileName().c_str());
    }
    if (_requestMode)
        return;
    const auto [process, start] = identityOf(::getpid());
    MW_CALL(preference_set_int, RECORDING_PROCESS_KEY, process);
    MW_CALL(preference_set_int, RECORDING_PROCESS_START_KEY, start);
    MW_CALL(preference_set_int, RECORDING_STATE_KEY, mwNumber(state));
}

bool MwModel::isMainInstanceRecording()
{
    int state = mwNumber(REC_STATE_NONE);
    int process = 0;
    int start = 0;
    if (preference_get_int(RECORDING_STATE_KEY, &state) != 0
        || (state != mwNumber(REC_STATE_RECORDING) && state != mwNumber(REC_STATE_PAUSED)))
        return false;
    return preference_get_int(RECORDING_PROCESS_KEY, &process) == 0
        && preference_get_int(RECORDING_PROCESS_START_KEY, &start) == 0 && process > 0
        && identityOf(process) == std::pair{process, start};
}

void MwModel::holdStorage()
{
    releaseStorage();
    const MwStorageType type = getStorageType();
    const platform::Lock lock(_storageMutex);
    _storage = Storage{type, type == MW_STORAGE_DEVICE ? mwDeviceRoot() : mwCardRoot()};
}

void MwModel::releaseStorage()
{
    const platform::Lock lock(_storageMutex);
    _storage.reset();
}

MwStorageType MwModel::getStorageType() const
{
    if (const auto held = _heldStorage(); held)
        return held->type;
    int card = 0;
    if (vconf_get_int(VCONFKEY_SYSMAN_MMC_STATUS, &card) != 0) {
        MW_LOGE("vconf_get_int fail");
        return MW_STORAGE_DEVICE;
    }
    return card == CARD_MOUNTED ? getStorageChoice() : MW_STORAGE_DEVICE;
}

MwStorageType MwModel::getStorageChoice() const
{
    int type = MW_STORAGE_DEVICE;
    if (const int result = preference_get_int(STORAGE_PREFERENCE_KEY, &type); result != 0) {
        MW_LOGW("preference_get_int failed : [%d]!!!", result);
        return MW_STORAGE_DEVICE;
    }
    return type == MW_STORAGE_DEVICE ? MW_STORAGE_DEVICE : MW_STORAGE_CARD;
}

void MwModel::setStorageType(MwStorageType type)
{
    if (const int result = preference_set_int(STORAGE_PREFERENCE_KEY, type); result != 0)
        MW_LOGW("preference_set_int failed : [%d]!!!", result);
}

std::string MwModel::getStorageRoot() const
{
    if (const auto held = _heldStorage(); held)
        return held->root;
    return getStorageType() == MW_STORAGE_DEVICE ? mwDeviceRoot() : mwCardRoot();
}

std::string MwModel::getTemporaryFilePath() const
{
    return mwFormat("%s/%s", getStorageRoot().c_str(), TEMP_FILE_NAME);
}

std::string MwModel::getRecordingsDirectory() const
{
    return mwFormat("%s/%s", getStorageRoot().c_str(), RECORDINGS_DIRECTORY);
}

const char* MwModel::getFileExtension() const { return _fileFormat == FORMAT_MP4 ? ".m4a" : ".amr"; }

std::string MwModel::getRecordingPath(const std::string& name) const
{
    return mwFormat("%s/%s/%s%s", getStorageRoot().c_str(), RECORDINGS_DIRECTORY, name.c_str(), getFileExtension());
}

bool MwModel::addBookMark(unsigned int& markedTime)
{
    const auto second = static_cast<unsigned int>(_elapsedTime / 1000);
    {
        const platform::Lock lock(_mutex);
        if (_bookmarks.size() >= MAX_BOOKMARKS) {
            MW_LOGE("Max book mark count reached!!");
            postTooManyBookmarks();
            return false;
        }
        if (std::any_of(
                _bookmarks.begin(), _bookmarks.end(), [&](const MwBookmark& b) { return b.markedTime == second; })) {
            MW_LOGE("book mark position is already existing!!");
            mwPost("IDS_MW_TPOP_ALREADY_ADDED_TO_BOOKMARKS");
            return false;
        }
        const int index = static_cast<int>(_bookmarks.size());
        _bookmarks.push_back(
            {index, second, mwFormat("%s%03d", mwTranslate("IDS_MW_BODY_BOOKMARK").c_str(), index + 1)});
    }
    saveRecordingNotes();
    markedTime = second;
    return true;
}

void MwModel::clearBookMark()
{
    const platform::Lock lock(_mutex);
    _bookmarks.clear();
}

bool MwModel::saveBookMark(const char* mediaId)
{
    const std::vector<MwBookmark> bookmarks = getBookmarkList();
    if (bookmarks.empty()) {
        MW_LOGI("book mark list is empty!!");
        return true;
    }
    const int result = mwInsertBookmarks(mediaId, bookmarks);
    if (result != 0)
        MW_LOGE("media_bookmark_insert_to_db failed, [0x%X]", static_cast<unsigned int>(result));
    clearBookMark();
    return result == 0;
}

std::vector<MwBookmark> MwModel::getBookmarkList() const
{
    const platform::Lock lock(_mutex);
    return _bookmarks;
}

bool MwModel::saveRecordingNotes() const
{
    return MwRecordingNotes::save(
        MwRecordingNotes::pathFor(getTemporaryFilePath()), {getCurrentRecordingFileName(), getBookmarkList()});
}

void MwModel::setRequestHandle(app_control_h request)
{
    setAnswerPath({});
    _request.close();
    if (request == nullptr)
        return;
    if (const int result = app_control_clone(_request.out(), request); result != 0)
        MW_LOGE("app_control_clone failed:[%d]", result);
}

bool MwModel::fitsRequest(const std::string& path) const
{
    constexpr uintmax_t KILOBYTE = 1024;
    std::error_code error;
    const uintmax_t size = std::filesystem::file_size(path, error);
    return !error && size <= static_cast<uintmax_t>(std::max(0, getSizeLimit())) * KILOBYTE
        && (!_typeRequested || path.ends_with(getFileExtension()));
}

bool MwModel::hasRequestChoice()
{
    createRecordedFileList();
    return std::count_if(_recordedFiles.begin(), _recordedFiles.end(), [this](const MwFileInfo& info) {
        return fitsRequest(info.path);
    }) > 1;
}
