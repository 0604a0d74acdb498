#include "MwTrim.h"

#include <video_edit.h>

#include <initializer_list>
#include <utility>

#include "MwLog.h"
#include "MwMediaRow.h"
#include "MwSavedBookmarks.h"
#include "MwText.h"

namespace {

constexpr int MS_PER_SECOND = 1000;

MwTrim::Failure failureOf(int error)
{
    switch (error) {
    case VIDEO_EDIT_ERROR_NOT_SUPPORTED:
        return MwTrim::Failure::NOT_SUPPORTED;
    case VIDEO_EDIT_ERROR_DAMAGED:
        return MwTrim::Failure::DAMAGED;
    case VIDEO_EDIT_ERROR_OUT_OF_STORAGE:
        return MwTrim::Failure::OUT_OF_STORAGE;
    default:
        return MwTrim::Failure::OTHER;
    }
}

void logBookmarkFailure(const char* call, int code) { MW_LOGE("%s failed : [%d]!!!", call, code); }

}

std::atomic<MwTrim*> MwTrim::_pInstance = nullptr;

MwTrim::MwTrim() { _pInstance = this; }

MwTrim::~MwTrim()
{
    if (_worker.joinable()) {
        cancel();
        _worker.join();
    }
    _pInstance = nullptr;
}

bool MwTrim::start(const char* inFile, bool overwrite, int startMs, int endMs, int durationMs, const char* name)
{
    if (inFile == nullptr) {
        MW_LOGE("inFile is nullptr");
        return false;
    }
    _inputPath = inFile;
    _overwrite = overwrite;
    _start = startMs;
    _finish = endMs;
    _duration = durationMs;
    _store = std::make_unique<MwTrimStore>(_inputPath, overwrite, name != nullptr ? name : "");
    _runThread();
    _queue({CMD_INIT, CMD_PREPARE, CMD_EXPORT});
    return true;
}

bool MwTrim::cancel()
{
    _queue({CMD_CANCEL});
    return true;
}

int MwTrim::getProgress()
{
    int percent = 0;
    video_edit_get_progress(&percent);
    return percent;
}

void MwTrim::_queue(std::initializer_list<Command> commands)
{
    const platform::Lock lock(_queueLock);
    _commands.insert(_commands.end(), commands.begin(), commands.end());
    _queueSignal.notify_one();
}

void MwTrim::_runThread()
{
    _worker = std::thread([this] { _work(); });
}

void MwTrim::_work()
{
    platform::Lock lock(_queueLock);
    for (;;) {
        _queueSignal.wait(lock, [this]() REQUIRES(_queueLock) { return !_commands.empty(); });
        while (!_commands.empty()) {
            const int command = _commands.front();
            _commands.pop_front();
            lock.unlock();
            const bool goesOn = _execute(command);
            lock.lock();
            if (!goesOn)
                return;
        }
        if (_isFinished) {
            MW_LOGI("end trim");
            return;
        }
    }
}

bool MwTrim::_execute(int command)
{
    switch (command) {
    case CMD_INIT:
        return _initEngine() || _fail("_initEngine failed!!!");
    case CMD_DEINIT:
        _deinitEngine();
        _isFinished = true;
        return true;
    case CMD_PREPARE:
        if (_prepareEngine())
            return true;
        _deinitEngine();
        return _fail("_prepareEngine failed!!!");
    case CMD_UNPREPARE:
        _unprepareEngine();
        return true;
    case CMD_EXPORT:
        if (_exportEngine())
            return true;
        _unprepareEngine();
        _deinitEngine();
        return _fail("_exportEngine failed!!!");
    case CMD_CANCEL:
        _cancelEngine();
        _deinitEngine();
        _end(TRIM_EVENT_FAILED, Failure::CANCELLED);
        _isFinished = true;
        return true;
    }
    MW_LOGE("Unknown command : [%d]!!!", command);
    return true;
}

bool MwTrim::_fail(const char* what)
{
    MW_LOGE("%s", what);
    _end(TRIM_EVENT_FAILED, _failure == Failure::NONE ? Failure::OTHER : _failure.load());
    return false;
}

bool MwTrim::_initEngine()
{
    if (_inputPath.empty()) {
        MW_LOGE("_inputPath is empty");
        return false;
    }
    return MW_CALL(video_edit_init) && MW_CALL(video_edit_set_error_received_cb, _errorCb)
        && MW_CALL(video_edit_set_state_changed_cb, _stateChangedCb);
}

void MwTrim::_deinitEngine() { video_edit_deinit(); }

bool MwTrim::_prepareEngine()
{
    if (_inputPath.empty())
        return false;
    const video_edit_clip_s clip{_inputPath.c_str(), _duration, _start, _finish};
    const video_edit_project_s project{&clip};
    const int error = video_edit_prepare(VIDEO_EDIT_PROJECT_SOUND, &project);
    if (error != 0) {
        MW_LOGE("video_edit_prepare failed : [%d]!!!", error);
        _failure = failureOf(error);
    }
    return error == 0;
}

void MwTrim::_unprepareEngine() { video_edit_unprepare(); }

bool MwTrim::_exportEngine()
{
    if (!_store->stage()) {
        MW_LOGE("_getTempFilePath failed!!!");
        return false;
    }
    return MW_CALL(video_edit_export, _store->getStagedPath().c_str());
}

bool MwTrim::_cancelEngine() { return MW_CALL(video_edit_export_cancel); }

void MwTrim::_errorCb(int error)
{
    MW_LOGE("BEGIN - error received [%d]", error);
    if (MwTrim* self = _pInstance)
        self->_failEngine(error);
}

// An engine that has reported an error reaches no end.
void MwTrim::_failEngine(int error)
{
    _end(TRIM_EVENT_FAILED, failureOf(error));
    _queue({CMD_UNPREPARE, CMD_DEINIT});
}

void MwTrim::_stateChangedCb(int state)
{
    MW_LOGI("BEGIN - state changed [%d]", state);
    MwTrim* self = _pInstance;
    if (self == nullptr) {
        MW_LOGE("_pInstance is nullptr");
        return;
    }
    if (state == VIDEO_EDIT_STATE_END_OF_STREAM)
        self->_stateEOSCb();
}

void MwTrim::_stateEOSCb()
{
    std::vector<MwBookmark> bookmarks;
    std::string mediaId;
    // A recording that is not catalogued has none.
    if (!_getMediaInfo(_inputPath, &bookmarks, &mediaId))
        MW_LOGE("_getMediaInfo failed!!!");
    switch (_store->store(mediaId, _shifted(bookmarks))) {
    case MwTrimStore::Outcome::DONE:
        _outputPath = _store->getOutputPath();
        _end(TRIM_EVENT_DONE, Failure::NONE);
        break;
    case MwTrimStore::Outcome::CHANGED:
        _end(TRIM_EVENT_FAILED, Failure::CHANGED);
        break;
    case MwTrimStore::Outcome::FAILED:
        _end(TRIM_EVENT_FAILED, Failure::OTHER);
        break;
    }
    _queue({CMD_UNPREPARE, CMD_DEINIT});
}

std::vector<MwBookmark> MwTrim::_shifted(const std::vector<MwBookmark>& bookmarks) const
{
    const auto first = static_cast<unsigned int>(_start / MS_PER_SECOND);
    const auto last = static_cast<unsigned int>(_finish / MS_PER_SECOND);
    std::vector<MwBookmark> shifted;
    for (MwBookmark bookmark : bookmarks) {
        if (bookmark.markedTime < first || bookmark.markedTime > last)
            continue;
        bookmark.markedTime -= first;
        shifted.push_back(std::move(bookmark));
    }
    return shifted;
}

bool MwTrim::_getMediaInfo(const std::string& path, std::vector<MwBookmark>* bookmarks, std::string* mediaId)
{
    if (path.empty() || bookmarks == nullptr || mediaId == nullptr) {
        MW_LOGE("%s",
            path.empty()               ? "path is empty!!!"
                : bookmarks == nullptr ? "bookMarkList is nullptr!!!"
                                       : "mediaId is nullptr!!!");
        return false;
    }
    *mediaId = MwMediaRow::idAt(path);
    if (mediaId->empty())
        return false;
    for (MwSavedBookmark& bookmark : mwReadBookmarks(*mediaId, logBookmarkFailure)) {
        MwBookmark copy;
        copy.markedTime = bookmark.markedTime;
        copy.name = std::move(bookmark.name);
        bookmarks->push_back(std::move(copy));
    }
    return true;
}

// The first outcome counts: an end that met a cancel has happened all the same.
void MwTrim::_end(eventType event, Failure failure)
{
    if (_isTold.exchange(true))
        return;
    _failure = failure;
    if (event == TRIM_EVENT_FAILED)
        _store.reset();
    _mailbox.post([this, event] { trimSignal.emit(event); });
}
