#include "MwAppController.h"

#include <Ecore_File.h>
#include <app.h>
#include <media_content.h>
#include <notification.h>
#include <recorder_leftover.h>
#include <vconf.h>

#include <cerrno>
#include <cstdio>
#include <memory>
#include <unistd.h>

#include "MwAvrcp.h"
#include "MwFilePlaces.h"
#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwMediaKeys.h"
#include "MwModel.h"
#include "MwRecordingNotes.h"
#include "MwSoundSession.h"
#include "MwText.h"

namespace {

constexpr int AUDIO = 0; // kind of recording asked about

bool isInBackground(const MwModel& model)
{
    return model.getAppState() == MwModel::APP_STATE_PAUSED || model.getAppState() == MwModel::APP_STATE_TERMINATED;
}

bool isComplete(const MwRecorder* recorder, const MwModel* model, const MwSoundSession* soundSession)
{
    if (recorder == nullptr)
        MW_LOGE("recorder is nullptr");
    else if (model == nullptr)
        MW_LOGE("model is nullptr");
    else if (soundSession == nullptr)
        MW_LOGE("soundMgr is nullptr");
    return recorder != nullptr && model != nullptr && soundSession != nullptr;
}

}

bool MwAppController::_startRecording()
{
    if (!isComplete(_recorder.get(), _model, _soundSession.get()))
        return false;
    if (_model->getRecorderState() != REC_STATE_READY) {
        MW_LOGE("current state is [%d]!! can't start recording", mwNumber(_model->getRecorderState()));
        return false;
    }
    if (_recorder->isInRecording(AUDIO)) {
        MW_LOGE("Other app is recording");
        mwPost("IDS_MW_TPOP_UNABLE_TO_START_NEW_RECORDING_OTHER_APP_ALREADY_RECORDING");
        return false;
    }
    const std::string chosen = _model->getRenameString();
    _model->holdStorage();
    _chooseName();
    if (!_setUpRecording()) {
        _model->windBackRecordingFileName();
        _model->setRenameString(chosen);
        _model->releaseStorage();
        return false;
    }
    MwLoggingMgr::getInstance()->insert("RECO", "Normal Mode");
    _model->setRecorderState(REC_STATE_RECORDING);
    _model->saveRecordingNotes();
    _requestLock();
    return true;
}

void MwAppController::_chooseName()
{
    const std::string name = _model->getRenameString();
    if (name.empty()) {
        _model->updateNextRecordingFileName();
        return;
    }
    MW_LOGI("Has been renamed, used rename string");
    _model->chooseCurrentRecordingFileName(name);
    _model->setRenameString("");
}

bool MwAppController::_setUpRecording()
{
    if (const int reason = _soundSession->setRecordSoundSession(); reason != MwSoundSession::SESSION_RESULT_NONE) {
        MW_LOGE("set sound session failed : [%d]!!!", reason);
        mwPost(reason == MwSoundSession::SESSION_RESULT_BLOCKED_BY_CALL ? "IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS"
                                                                        : "IDS_MUSIC_TPOP_CANT_RECORD_VOICE");
        return false;
    }
    return _setUpRecorder();
}

bool MwAppController::_setUpRecorder()
{
    _lastSavedPath.clear();
    _model->setAnswerPath({});
    _wasDiscarded = false;
    _model->clearBookMark();
    _model->setElapsedTime(0);
    _model->setLevel(MwModel::SILENCE);
    if (!_recorder->createHandle(_model)) {
        MW_LOGE("recorder create failed");
        _soundSession->unsetRecordSoundSession();
        return false;
    }
    MwRecorder::ErrorType error = MwRecorder::ERROR_UNKNOWN;
    if (_recorder->start(error))
        return true;
    MW_LOGE("recorder start failed[%d]", error);
    _postStartFailure(error);
    _soundSession->unsetRecordSoundSession();
    _recorder->destroyHandle();
    return false;
}

void MwAppController::_postStartFailure(MwRecorder::ErrorType error)
{
    if (error == MwRecorder::ERROR_OUT_OF_STORAGE)
        mwPost("IDS_MW_POP_NOT_ENOUGH_MEMORY_DELETE_SOME_ITEMS");
    else if (error == MwRecorder::ERROR_BLOCKED_BY_CALL)
        mwPost("IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS");
    else
        mwPost("IDS_MUSIC_TPOP_CANT_RECORD_VOICE");
}

bool MwAppController::_pauseRecording()
{
    if (!isComplete(_recorder.get(), _model, _soundSession.get()))
        return false;
    if (_model->getRecorderState() != REC_STATE_RECORDING) {
        MW_LOGE("current state is [%d]!! can't pause recording", mwNumber(_model->getRecorderState()));
        return false;
    }
    const bool paused = _recorder->pause();
    if (paused)
        _model->setRecorderState(REC_STATE_PAUSED);
    else
        MW_LOGE("recorder pause failed");
    _releaseLock();
    return paused;
}

bool MwAppController::_resumeRecording()
{
    if (!isComplete(_recorder.get(), _model, _soundSession.get()))
        return false;
    if (_model->getRecorderState() != REC_STATE_PAUSED) {
        MW_LOGE("current state is [%d]!! can't resume recording", mwNumber(_model->getRecorderState()));
        return false;
    }
    MwRecorder::ErrorType error = MwRecorder::ERROR_UNKNOWN;
    if (!_recorder->resume(error)) {
        MW_LOGE("recorder resume failed");
        _postStartFailure(error);
        return false;
    }
    _model->setRecorderState(REC_STATE_RECORDING);
    _requestLock();
    return true;
}

bool MwAppController::_cancelRecording(bool interrupted)
{
    if (!isComplete(_recorder.get(), _model, _soundSession.get()))
        return false;
    if (!mwIsRecordingOrPaused(_model->getRecorderState())) {
        MW_LOGE("current state is [%d]!! can't cancel recording", mwNumber(_model->getRecorderState()));
        return false;
    }
    bool cancelled = true;
    const bool hasEnded = interrupted || _recorder->hasEnded();
    if (hasEnded) {
        ecore_file_unlink(_model->getTemporaryFilePath().c_str());
    } else if (!_recorder->cancel()) {
        MW_LOGE("recorder cancel failed");
        cancelled = false;
    }
    _destroyRecorderHandle();
    if (hasEnded)
        _releaseTemporaryFile(); // the recorder's own cancel has done it already
    _soundSession->unsetRecordSoundSession();
    _model->setRecorderState(REC_STATE_READY);
    _model->clearBookMark();
    _model->windBackRecordingFileName();
    _wasDiscarded = cancelled;
    _releaseLock();
    _model->releaseStorage();
    return cancelled;
}

// The recording has ended by itself, with the result that a stop asks for.
bool MwAppController::_isOver() const
{
    return _model->getRecorderState() == REC_STATE_READY && (_wasDiscarded || !_lastSavedPath.empty());
}

// Ends the claim on the temporary path once nothing of this recording is left there.
void MwAppController::_releaseTemporaryFile()
{
    const std::string path = _model->getTemporaryFilePath();
    MwRecordingNotes::remove(MwRecordingNotes::pathFor(path));
    MW_CALL(recorder_release_temporary, path.c_str());
}

void MwAppController::_destroyRecorderHandle()
{
    _callSafetyMainThread([this] {
        if (_recorder && !_recorder->destroyHandle())
            MW_LOGE("recorder destroy handle failed");
    });
}

bool MwAppController::_stopRecording(bool interrupted)
{
    if (!isComplete(_recorder.get(), _model, _soundSession.get()))
        return false;
    if (!mwIsRecordingOrPaused(_model->getRecorderState())) {
        MW_LOGE("current state is [%d]!! can't stop recording", mwNumber(_model->getRecorderState()));
        return false;
    }
    bool stopped = _commitRecording(interrupted);
    _destroyRecorderHandle();
    _soundSession->unsetRecordSoundSession();
    _model->setRecorderState(REC_STATE_READY);
    if (stopped && !_saveRecordingFile()) {
        MW_LOGE("_saveRecordingFile failed!!!");
        stopped = false;
    }
    if (stopped && isInBackground(*_model)) {
        MW_LOGI("display saved popup");
        notification_status_message_post(
            mwFormat("%s %s", _model->getCurrentRecordingFileName().c_str(), mwTranslate("IDS_MW_POP_SAVED").c_str())
                .c_str());
    }
    if (_lastSavedPath.empty())
        mwPost("IDS_MW_TPOP_RECORDING_NOT_COMPLETED_KEPT_FOR_THE_NEXT_START");
    _releaseLock();
    _model->releaseStorage();
    return stopped;
}

// A file that was not completed stays where it is: with journal and notes it is what the rescue needs.
bool MwAppController::_commitRecording(bool interrupted)
{
    bool committed = true;
    if (!interrupted) {
        committed = _recorder->stop();
        if (!committed)
            MW_LOGE("recorder stop failed");
        MwLoggingMgr::getInstance()->insert("SAVE");
    }
    return committed && MW_CALL(recorder_check_temporary, _model->getTemporaryFilePath().c_str());
}

bool MwAppController::_saveRecordingFile()
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    if (!_checkRecordedFileDir())
        return false;
    const std::string wanted = _model->getRecordingPath(_model->getCurrentRecordingFileName());
    std::string path = wanted;
    while (!_moveTempRecordingFile(path.c_str())) {
        // Only a name that is taken (perhaps since a moment ago, by another instance) is worth another try.
        if (ecore_file_exists(path.c_str()) == EINA_FALSE) {
            MW_LOGE("move temp recording file failed!");
            return false;
        }
        path = MwFilePlaces::freePath(wanted, _model->getRecordingsDirectory());
    }
    _lastSavedPath = path;
    if (_model->isRequestMode())
        _model->setAnswerPath(path);
    std::string mediaId;
    _insertRecordedFileToDB(path.c_str(), mediaId);
    if (mediaId.empty()) {
        // The notes wait beside the file: the next start catalogues it and gives it its bookmarks.
        MW_LOGE("insert recorded file to DB failed!");
        return false;
    }
    if (_insertBookmarkList(mediaId))
        MwRecordingNotes::remove(MwRecordingNotes::pathForSaved(path));
    return true;
}

bool MwAppController::_checkRecordedFileDir()
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    const std::string directory = _model->getRecordingsDirectory();
    if (ecore_file_is_dir(directory.c_str()) != EINA_FALSE) {
        MW_LOGI("recorded file directory exists!");
        return true;
    }
    return MwFiles::makeDirectories(directory);
}

bool MwAppController::_moveTempRecordingFile(const char* destFilePath)
{
    if (destFilePath == nullptr) {
        MW_LOGE("destFilePath is nullptr");
        return false;
    }
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    const std::string temporary = _model->getTemporaryFilePath();
    if (ecore_file_exists(destFilePath) != EINA_FALSE)
        return false;
    // The notes go first, under a second name: at no moment is there a recording without them.
    if (!_model->getBookmarkList().empty())
        MwRecordingNotes::keepFor(MwRecordingNotes::pathFor(temporary), destFilePath);
    if (MwFiles::moveWithoutOverwriting(temporary, destFilePath) != MwFiles::Move::DONE) {
        MwRecordingNotes::remove(MwRecordingNotes::pathForSaved(destFilePath));
        return false;
    }
    _releaseTemporaryFile();
    const std::unique_ptr<FILE, int (*)(FILE*)> file(std::fopen(destFilePath, "r"), &std::fclose);
    if (!file) {
        MW_LOGE("fopen failed : [%d]!!!", errno);
        return false;
    }
    MW_LOGI("fsync start");
    ::fsync(::fileno(file.get()));
    MwFiles::flushDirectoryOf(destFilePath);
    MwFiles::flushDirectoryOf(temporary);
    MW_LOGI("fsync end");
    return true;
}

void MwAppController::_insertRecordedFileToDB(const char* filePath, std::string& mediaId)
{
    if (filePath == nullptr) {
        MW_LOGE("filePath is nullptr");
        return;
    }
    MwHandle<media_info_h, media_info_destroy> media;
    if (const int result = media_info_insert_to_db(filePath, media.out()); result != 0) {
        MW_LOGE("media_info_insert_to_db failed! [%d]", result);
        return;
    }
    char* id = nullptr;
    if (const int result = media_info_get_media_id(media.get(), &id); result != 0)
        MW_LOGE("media_info_get_media_id failed! [%d]", result);
    mediaId = mwAdopt(id);
}

bool MwAppController::_insertBookmarkList(const std::string& mediaId)
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    const bool saved = _model->saveBookMark(mediaId.c_str());
    if (!saved)
        MW_LOGE("_model->saveBookMark failed!");
    return saved;
}

void MwAppController::_recorderLimitReached(MwRecorder::LimitType type)
{
    if (type == MwRecorder::LIMIT_FREE_SPACE)
        _stopReason = "IDS_MW_POP_NOT_ENOUGH_MEMORY_DELETE_SOME_ITEMS";
    _emitSignalAfterStopRecording(false);
}

void MwAppController::_recorderInterrupted()
{
    int microphone = 1;
    vconf_get_int(VCONFKEY_MEWLO_MICROPHONE, &microphone);
    _missesMicrophone = microphone == 0;
    _stopReason = "IDS_MW_TPOP_RECORDING_INTERRUPTED_WHAT_WAS_RECORDED_IS_SAVED";
    _emitSignalAfterStopRecording(true);
}

void MwAppController::_systemInfoChanged(MwSignalMgr::SystemInfo info)
{
    if (info == MwSignalMgr::MICROPHONE_BACK && std::exchange(_missesMicrophone, false))
        mwPost("IDS_MW_TPOP_A_MICROPHONE_IS_CONNECTED_AGAIN");
}

void MwAppController::_emitSignalAfterStopRecording(bool interrupted)
{
    dispatchCommandAsync(
        interrupted ? STOP_RECORDING_INTERRUPTED : STOP_RECORDING,
        [](Command command, Result result, void* userData) {
            MW_LOGI("async Command[%d] result is [%d]", static_cast<int>(command), result);
            static_cast<MwAppController*>(userData)->_stoppedByItself(result);
        },
        this);
}

// The recording ended without the user: after whatever opens for a saved recording, the last word is why.
void MwAppController::_stoppedByItself(Result result)
{
    const std::string reason = std::exchange(_stopReason, {});
    if (result == FAIL) {
        MW_LOGE("STOP_RECORDING failed");
    } else if (_model->getAppState() == MwModel::APP_STATE_RESUMED) {
        openRecordings();
    } else if (_model->getAppState() == MwModel::APP_STATE_PAUSED) {
        MW_LOGI("recording stop success");
    } else {
        MW_LOGW("app state is [%d]. need to scenario check.", _model->getAppState());
    }
    const bool wasTooShort = _lastSavedPath.empty();
    if (!reason.empty() && !wasTooShort)
        mwPost(reason.c_str());
}

void MwAppController::_pauseInRequestMode()
{
    {
        const platform::Lock lock(_commandMutex);
        if (mwIsRecordingOrPaused(_model->getRecorderState())) {
            _mediaKeys->release();
            if (!_stopRecording(false))
                MW_LOGE("_stopRecording failed");
        }
    }
    replyAndExit();
}

void MwAppController::replyAndExit()
{
    if (_model->getRequestHandle() != nullptr && !_replyWithRecording())
        return;
    ui_app_exit();
}

bool MwAppController::_replyWithRecording()
{
    MwHandle<app_control_h, app_control_destroy> reply;
    if (const int result = app_control_create(reply.out()); result != 0) {
        MW_LOGE("app_control_create failed:[%d]", result);
        return false;
    }
    // What was really written counts, under the name that it got; a discarded or unsaved one is no answer.
    const std::string path = _model->getAnswerPath();
    if (path.empty() || !_model->fitsRequest(path)) {
        MW_CALL(
            app_control_reply_to_launch_request, reply.get(), _model->getRequestHandle(), APP_CONTROL_RESULT_FAILED);
    } else {
        MW_CALL(app_control_add_extra_data, reply.get(), APP_CONTROL_DATA_SELECTED, path.c_str());
        MW_CALL(
            app_control_reply_to_launch_request, reply.get(), _model->getRequestHandle(), APP_CONTROL_RESULT_SUCCEEDED);
    }
    _model->setRequestHandle(nullptr);
    return true;
}
