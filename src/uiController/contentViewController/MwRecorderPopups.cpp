// The recorder screen: its popups.
#include "MwRecorderContentViewController.h"

#include <utility>

#include <Elementary.h>

#include <app.h>
#include <app_control.h>
#include <panekit/WPopupController.h>

#include "MwFileName.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwMemoryFullPopup.h"
#include "MwModel.h"
#include "MwRenamePopupController.h"
#include "MwSaveToPopup.h"
#include "MwText.h"

using panekit::WPopupController;

namespace {

void closePopup(WPopupController* popup) { popup->destroy(); }

}

void MwRecorderContentViewController::_renameRecordingFileName()
{
    std::string text = getModel()->getRenameString();
    if (text.empty())
        text = getModel()->getDefaultRecordingFileName();
    if (text.empty()) {
        MW_LOGE("editString is nullptr!!!");
        return;
    }
    _renamePopup = std::make_unique<MwRenamePopupController>(text.c_str());
    _renamePopup->setResponseCb(
        [this](void*, const char* name, int response) { _renameResponseCb(name, response); }, this);
    if (!_renamePopup->create(getWindow(), nullptr))
        _renamePopup.reset();
}

void MwRecorderContentViewController::_renameResponseCb(const char* text, int response)
{
    if (response == MwRenamePopupController::RESPONSE_RENAME && text) {
        const std::string name = text;
        if (!mwIsFileName(name, getModel()->getFileExtension())) {
            mwPost("IDS_MW_POP_INVALID_FILE_NAME");
            return;
        }
        if (getModel()->checkRecordFileNameExist(name)) {
            mwPost("IDS_MW_POP_RENAMEALREADYUSED");
            return;
        }
        getModel()->setRenameString(name);
        _updateFileName(name);
    }
    _destroyRenamePopup();
}

// Gone after the callback that is still running in it.
void MwRecorderContentViewController::_destroyRenamePopup()
{
    const auto popup = std::exchange(_renamePopup, nullptr);
    if (popup)
        popup->destory();
}

void MwRecorderContentViewController::_createSaveToPopup()
{
    if (_saveToPopup)
        return;
    _saveToPopup = mwCreateSaveToPopup(getWindow(), getModel());
    _saveToPopup->setOnDestroyed([this] { _saveToPopup = nullptr; });
}

void MwRecorderContentViewController::_destroySaveToPopup()
{
    if (auto* popup = std::exchange(_saveToPopup, nullptr); popup)
        popup->destroy();
}

void MwRecorderContentViewController::_createDiscardPopup()
{
    if (_discardPopup)
        return;
    _discardPopup = new WPopupController();
    _discardPopup->setTitle("IDS_MW_HEADER_DISCARD_RECORDING_ABB3");
    _discardPopup->setContent("IDS_MW_POP_RECORDING_WILL_BE_STOPPED_AND_THE_FILE_WILL_BE_DISCARDED");
    _discardPopup->addButton("IDS_MW_BUTTON_CANCEL", closePopup);
    _discardPopup->addButton("IDS_MW_BUTTON_DISCARD_ABB3", [this](WPopupController*) { _discardRecording(); });
    _discardPopup->setOnDestroyed([this] { _discardPopup = nullptr; });
    _discardPopup->create(getWindow());
}

void MwRecorderContentViewController::_discardRecording()
{
    if (!_isComplete())
        return;
    const bool discarded = getAppController()->dispatchCommand(MwAppController::CANCEL_RECORDING);
    if (!discarded)
        MW_LOGE("Record cancel failed!");
    getModel()->clearBookMark();
    // Closes the popup when the recorder is ready again.
    _updateContentView();
    if (discarded)
        mwPost("IDS_MW_TPOP_RECORDING_DISCARDED_M_SOUND");
}

void MwRecorderContentViewController::_createStorageFullPopup()
{
    mwCreateMemoryFullPopup(getWindow(), getModel()->getStorageType());
}

void MwRecorderContentViewController::_createRecordingFailedPopup()
{
    auto* popup = new WPopupController();
    popup->setContent("IDS_MW_POP_RECORDING_FAILED_M_VOICE");
    popup->addButton("IDS_MW_BUTTON_OK", [](WPopupController*) {
        MW_LOGW("terminate app...");
        ui_app_exit();
    });
    popup->create(getWindow());
}
