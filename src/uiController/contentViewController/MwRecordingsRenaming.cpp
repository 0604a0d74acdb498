#include "MwRecordingsRenaming.h"

#include <algorithm>
#include <utility>

#include "MwFileName.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwRenamePopupController.h"
#include "MwText.h"

MwRecordingsRenaming::MwRecordingsRenaming(MwModel* model, MwRecordingsFileJob* job, std::function<void()> renamed)
    : _model(model)
    , _job(job)
    , _renamed(std::move(renamed))
{
}

MwRecordingsRenaming::~MwRecordingsRenaming() { _closeRenamePopup(); }

void MwRecordingsRenaming::_openRenamePopup(Evas_Object* window, const std::string& path)
{
    const MwFileInfo* info = _model->getRecordedFileInfoByPath(path);
    if (!info) {
        MW_LOGE("get file info failed!!!");
        return;
    }
    if (_renamePopup) {
        MW_LOGW("rename popup already show");
        _closeRenamePopup();
    }
    _renameTarget = path;
    _renamePopup
        = std::make_unique<MwRenamePopupController>(info->displayName.substr(0, info->displayName.rfind('.')).c_str());
    _renamePopup->setResponseCb(
        [this](void*, const char* text, int response) { _renameResponseCb(text, response); }, this);
    if (!_renamePopup->create(window, nullptr))
        _renamePopup.reset();
}

// Gone after the callback that is still running in it.
void MwRecordingsRenaming::_closeRenamePopup()
{
    const auto popup = std::exchange(_renamePopup, nullptr);
    if (popup)
        popup->destory();
}

void MwRecordingsRenaming::_renameResponseCb(const char* text, int response)
{
    if (response != MwRenamePopupController::RESPONSE_RENAME || !text || _renameRecording(text))
        _closeRenamePopup();
}

// True closes the popup now.
bool MwRecordingsRenaming::_renameRecording(const std::string& name)
{
    const std::string path = _renameTarget;
    const std::string ending = path.substr(std::min(path.rfind('.'), path.size()));
    if (!mwIsFileName(name, ending)) {
        mwPost("IDS_MW_POP_INVALID_FILE_NAME");
        return false;
    }
    const MwFileInfo* info = _model->getRecordedFileInfoByPath(path);
    if (!info)
        return true;
    const size_t nameStart = path.rfind('/') + 1;
    const size_t dot = path.find('.', nameStart) != std::string::npos ? path.rfind('.') : path.size();
    const std::string newPath = path.substr(0, nameStart) + name + path.substr(dot);
    _job->rename({path, info->mediaId, newPath},
        [this](MwRecordingsFileJob::Outcome outcome, const std::string& from, const std::string& to) {
            _onRenamed(outcome, from, to);
        });
    return false;
}

void MwRecordingsRenaming::_onRenamed(
    MwRecordingsFileJob::Outcome outcome, const std::string& path, const std::string& newPath)
{
    if (outcome != MwRecordingsFileJob::Outcome::DONE) {
        const bool isTaken = outcome == MwRecordingsFileJob::Outcome::TAKEN;
        return mwPost(isTaken ? "IDS_MW_POP_RENAMEALREADYUSED" : "IDS_MW_POP_INVALID_FILE_NAME");
    }
    _model->renameRecordedFile(path, newPath, newPath.substr(newPath.rfind('/') + 1));
    _renamed();
    _closeRenamePopup();
}
