#include "MwNextRecordingName.h"

#include <utility>

#include "MwFileName.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwRenamePopupController.h"
#include "MwText.h"

using panekit::WTimer;

MwNextRecordingName::MwNextRecordingName(MwModel* model, Changed changed)
    : _model(model)
    , _changed(std::move(changed))
{
}

MwNextRecordingName::~MwNextRecordingName() { cancelUpdate(); }

void MwNextRecordingName::cancelUpdate() { WTimer::destroy(_nextNameIdler); }

void MwNextRecordingName::_renameRecordingFileName(Evas_Object* window)
{
    std::string text = _model->getRenameString();
    if (text.empty())
        text = _model->getDefaultRecordingFileName();
    if (text.empty()) {
        MW_LOGE("editString is nullptr!!!");
        return;
    }
    _renamePopup = std::make_unique<MwRenamePopupController>(text.c_str());
    _renamePopup->setResponseCb(
        [this](void*, const char* name, int response) { _renameResponseCb(name, response); }, this);
    if (!_renamePopup->create(window, nullptr))
        _renamePopup.reset();
}

void MwNextRecordingName::_renameResponseCb(const char* text, int response)
{
    if (response == MwRenamePopupController::RESPONSE_RENAME && text) {
        const std::string name = text;
        if (!mwIsFileName(name, _model->getFileExtension())) {
            mwPost("IDS_MW_POP_INVALID_FILE_NAME");
            return;
        }
        if (_model->checkRecordFileNameExist(name)) {
            mwPost("IDS_MW_POP_RENAMEALREADYUSED");
            return;
        }
        _model->setRenameString(name);
        _changed(name);
    }
    _destroyRenamePopup();
}

// Gone after the callback that is still running in it.
void MwNextRecordingName::_destroyRenamePopup()
{
    const auto popup = std::exchange(_renamePopup, nullptr);
    if (popup)
        popup->destory();
}

void MwNextRecordingName::_createUpdateNextRecordingFileNameTimer()
{
    if (!_nextNameIdler.expired()) {
        MW_LOGW("update next recording file name ider is already running!");
        return;
    }
    MW_LOGW("create idler to update next recording file name");
    _nextNameIdler = WTimer::addIdler([this](void*) {
        _updateNextRecordingFileName();
        return false;
    });
}

void MwNextRecordingName::_updateNextRecordingFileName()
{
    _model->updateLastRecordedFileNumber();
    if (!mwIsRecordingOrPaused(_model->getRecorderState()))
        return;
    _model->updateNextRecordingFileName();
    _changed(_model->getCurrentRecordingFileName());
}
