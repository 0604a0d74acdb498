// The recordings list: deleting and moving recordings.
#include "MwRecordingsContentViewController.h"

#include <string_view>
#include <unordered_map>
#include <utility>

#include <Elementary.h>

#include <notification.h>

#include "MwFileDeleter.h"
#include "MwFileOperationPopup.h"
#include "MwFileOperator.h"
#include "MwLog.h"
#include "MwStorageRoots.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

std::string fileName(const std::string& path) { return path.substr(path.rfind('/') + 1); }

void replacePlaceholder(std::string& text, const std::string& placeholder, const std::string& value)
{
    if (const size_t place = text.find(placeholder); place != std::string::npos)
        text.replace(place, placeholder.size(), value);
}

// What comes from a translation is never used as a format.
std::string movedText(MwFileOperator::Type type, size_t count)
{
    if (type == MwFileOperator::MOVE_TO_PRIVATE)
        return count == 1 ? mwTranslate("IDS_GALLERY_TPOP_1_ITEM_MOVED_TO_PRIVATE")
                          : mwTranslateNumber("IDS_GALLERY_TPOP_PD_ITEMS_MOVED_TO_PRIVATE", count);
    const std::string folder
        = mwFormat("%s/%s", mwTranslate("IDS_VIDEO_SBODY_DEVICE_STORAGE").c_str(), RECORDINGS_DIRECTORY);
    std::string text = mwTranslate(count == 1 ? "IDS_GALLERY_TPOP_1_ITEM_REMOVED_FROM_PRIVATE_AND_MOVED_TO_PS"
                                              : "IDS_GALLERY_TPOP_PD_ITEMS_REMOVED_FROM_PRIVATE_AND_MOVED_TO_PS");
    replacePlaceholder(text, "%1$d", std::to_string(count));
    replacePlaceholder(text, "%d", std::to_string(count));
    replacePlaceholder(text, "%2$s", folder);
    replacePlaceholder(text, "%s", folder);
    return text;
}

std::string notMovedText(const MwFileOperator& fileOperator)
{
    const auto id = [&] {
        switch (fileOperator.trouble()) {
        case MwFileMover::Trouble::MISSING:
            return "IDS_MW_TPOP_PD_NOT_MOVED_A_FILE_IS_MISSING";
        case MwFileMover::Trouble::NO_ROOM:
            return "IDS_MW_TPOP_PD_NOT_MOVED_NO_ROOM";
        case MwFileMover::Trouble::NOT_REMOVABLE:
            return "IDS_MW_TPOP_PD_NOT_MOVED_CANNOT_BE_REMOVED";
        default:
            return "IDS_MW_TPOP_PD_NOT_MOVED";
        }
    }();
    return mwTranslateNumber(id, fileOperator.allFiles() - fileOperator.donePaths().size());
}

}

std::unique_ptr<MwFileOperator> MwRecordingsContentViewController::_createFileOperator(
    int type, const std::vector<std::string>& pathList)
{
    std::unordered_map<std::string_view, const MwFileInfo*> known;
    for (const MwFileInfo& info : getModel()->getRecordedFileList())
        known.emplace(info.path, &info);
    std::vector<MwFileOperator::Source> sources;
    for (const std::string& path : pathList) {
        const auto info = known.find(path);
        sources.push_back({path, info != known.end() ? info->second->mediaId : std::string()});
    }
    if (type == MwFileOperator::DELETE || type == MwFileOperator::DELETE_FOR_GOOD)
        return std::make_unique<MwFileOperator>(static_cast<MwFileOperator::Type>(type), std::move(sources),
            MwFileOperator::Callbacks{nullptr, nullptr, [this] { _onDeleteFiles(); }});
    return std::make_unique<MwFileOperator>(static_cast<MwFileOperator::Type>(type), std::move(sources),
        MwFileOperator::Callbacks{[this] { _updateMovePopup(); },
            [this](const std::string& path) { _createDuplicationPopupController(path); }, [this] { _moveFinished(); }});
}

void MwRecordingsContentViewController::_clickDeleteButton(const std::vector<std::string>& pathList)
{
    _startDeleting(MwFileOperator::DELETE, pathList);
}

void MwRecordingsContentViewController::_startDeleting(int type, const std::vector<std::string>& pathList)
{
    if (pathList.empty()) {
        MW_LOGE("pathList size is 0");
        return;
    }
    if (_fileOperator) {
        MW_LOGE("file operator is working");
        return;
    }
    _fileOperator = _createFileOperator(type, pathList);
    _fileOperationPopup = std::make_unique<MwFileOperationPopup>(getWindow());
    _fileOperationPopup->showDeleting([this] { _cancelDeleting(); });
    _fileOperator->start();
}

void MwRecordingsContentViewController::_cancelDeleting()
{
    if (!_fileOperator->hasBegun()) {
        _deleteFileOperator();
        if (_catchUp())
            _update();
        return;
    }
    _fileOperator->cancelAndWait();
    _onDeleteFiles();
}

void MwRecordingsContentViewController::_onDeleteFiles()
{
    getModel()->removeRecordedFiles(_fileOperator->donePaths());
    if (_fileOperator->hasFailed())
        mwPost("IDS_MW_TPOP_SOME_RECORDINGS_NOT_DELETED");
    _catchUp();
    _catalogueShrank();
    const std::vector<std::string> rest
        = _fileOperator->isCancelRequested() ? std::vector<std::string>() : _fileOperator->withoutTrash();
    _deleteFileOperator();
    _viewType = NORMAL;
    _update();
    if (rest.empty())
        return;
    // After the former popup, and the list behind it, are gone for good.
    panekit::WTimer::addJob([this, alive = std::weak_ptr<void>(token()), rest](void*) {
        if (!alive.expired())
            _askToDeleteForGood(rest);
    });
}

void MwRecordingsContentViewController::_askToDeleteForGood(const std::vector<std::string>& pathList)
{
    const std::string question = pathList.size() == 1
        ? mwTranslate("IDS_MW_POP_RECORDING_CANNOT_GO_TO_THE_TRASH_DELETE_FOR_GOOD_Q")
        : mwTranslateNumber("IDS_MW_POP_PD_RECORDINGS_CANNOT_GO_TO_THE_TRASH_DELETE_FOR_GOOD_Q", pathList.size());
    _createDeletePopup(
        [this, pathList] { _startDeleting(MwFileOperator::DELETE_FOR_GOOD, pathList); }, question.c_str());
}

// With what the database was told of while an operation ran. False when that was nothing.
bool MwRecordingsContentViewController::_catchUp()
{
    if (!std::exchange(_databaseChanged, false))
        return false;
    getModel()->createRecordedFileList();
    return _reloadNeeded = true;
}

void MwRecordingsContentViewController::_catalogueShrank()
{
    if (getModel()->getRecordedFileList().empty())
        _reloadNeeded = true;
    if (!getModel()->updateLastRecordedFileNumber())
        MW_LOGE("updateLastRecordedFileNumber failed!");
}

void MwRecordingsContentViewController::_deletePlayingFile()
{
    const std::string path = getModel()->getCurrentPlayPath();
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(path);
    MwFileDeleter deleter(true); // asked already
    deleter.remove(path, info ? info->mediaId : std::string());
    if (deleter.finish().empty()) {
        mwPost("IDS_MW_TPOP_SOME_RECORDINGS_NOT_DELETED");
        return;
    }
    getModel()->removeRecordedFiles({path});
    getModel()->setCurrentPlayPath("");
    _catalogueShrank();
    if (getModel()->getPlayerState() == PLAY_STATE_NONE)
        _update();
    else if (!getAppController()->dispatchCommand(MwAppController::STOP_PLAYING))
        MW_LOGE("play stop failed!");
}

void MwRecordingsContentViewController::_clickMoveDoneButton(const std::vector<std::string>& pathList)
{
    if (pathList.empty()) {
        MW_LOGE("pathList is empty");
        return;
    }
    if (_fileOperator) {
        MW_LOGE("file operator is working");
        return;
    }
    // Nothing else is held up while the service makes up its mind.
    if (_privateStorage->isOpening())
        return;
    _privateStorage->open([this, pathList](bool open) {
        if (open)
            _moveStart(pathList);
        else
            mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
    });
}

void MwRecordingsContentViewController::_moveStart(const std::vector<std::string>& pathList)
{
    // The user may have left the selection, or begun something else, while the storage was made available.
    if ((_viewType != MOVE_TO_PRIVATE && _viewType != REMOVE_FROM_PRIVATE) || _fileOperator) {
        _privateStorage->handBack();
        return;
    }
    _fileOperator = _createFileOperator(
        _viewType == MOVE_TO_PRIVATE ? MwFileOperator::MOVE_TO_PRIVATE : MwFileOperator::REMOVE_FROM_PRIVATE, pathList);
    _fileOperationPopup = std::make_unique<MwFileOperationPopup>(getWindow());
    _createMovingingPopupController();
    _fileOperator->start();
}

void MwRecordingsContentViewController::_createMovingingPopupController()
{
    _fileOperationPopup->showMoving(_fileOperator->progress(), [this] { _cancelMoving(); });
}

void MwRecordingsContentViewController::_cancelMoving()
{
    if (_fileOperator->isFinished())
        return; // it only shows the full bar
    if (_fileOperator->hasBegun())
        _fileOperator->requestCancel();
    else
        _onMoveFiles();
}

void MwRecordingsContentViewController::_updateMovePopup()
{
    if (_fileOperator && _fileOperationPopup)
        _fileOperationPopup->update(_fileOperator->progress());
}

void MwRecordingsContentViewController::_createDuplicationPopupController(const std::string& path)
{
    _fileOperationPopup->showClash(fileName(path),
        {[this](MwClashAction action) { _onSelectedDuplicationPopupButton(static_cast<int>(action)); },
            [this](bool on) { _fileOperator->setApplyToAll(on); }});
}

void MwRecordingsContentViewController::_onSelectedDuplicationPopupButton(int action)
{
    MW_LOGW("BEGIN - action : [%d]", action);
    _createMovingingPopupController();
    _fileOperator->answer(static_cast<MwClashAction>(action));
}

void MwRecordingsContentViewController::_updateDuplicationPopup()
{
    if (_fileOperator && _fileOperationPopup)
        _fileOperationPopup->setClashName(fileName(_fileOperator->currentPath()));
}

// The worker has ended. Only a full bar is looked at before the popup goes: a cancelled or stopped move never fills it.
void MwRecordingsContentViewController::_moveFinished()
{
    const bool isFull = !_fileOperator->isCancelRequested() && !_fileOperator->hasFailed();
    _updateMovePopup();
    if (isFull && _fileOperationPopup)
        _fileOperationPopup->complete([this] { _onMoveFiles(); });
    else
        _onMoveFiles();
}

void MwRecordingsContentViewController::_onMoveFiles()
{
    _deleteFileOperator();
    _viewType = NORMAL;
    if (!MwSystemMgr::getInstance()->isPrivateModeEnabledByApp()) {
        getModel()->createRecordedFileList();
        _reloadNeeded = true;
    }
    _update();
}

void MwRecordingsContentViewController::_deleteFileOperator()
{
    if (!_fileOperator) {
        MW_LOGE("_fileOperator is nullptr");
        return;
    }
    const auto popup = std::exchange(_fileOperationPopup, nullptr);
    if (popup)
        popup->close();
    const auto fileOperator = std::exchange(_fileOperator, nullptr);
    fileOperator->cancelAndWait();
    for (const auto& [from, to] : fileOperator->moved()) {
        if (from == getModel()->getCurrentPlayPath())
            getModel()->setCurrentPlayPath(to);
    }
    if (fileOperator->type() == MwFileOperator::MOVE_TO_PRIVATE
        || fileOperator->type() == MwFileOperator::REMOVE_FROM_PRIVATE)
        _moveEnded(*fileOperator);
}

// However a move ended: tells what was moved, and hands the private storage back.
void MwRecordingsContentViewController::_moveEnded(const MwFileOperator& fileOperator)
{
    if (MwSystemMgr::getInstance()->isPrivateModeEnabledByApp())
        return;
    if (fileOperator.moved().empty())
        MW_LOGW("moved file is 0");
    std::string text = fileOperator.moved().empty() ? "" : movedText(fileOperator.type(), fileOperator.moved().size());
    if (fileOperator.hasFailed())
        text += (text.empty() ? "" : " ") + notMovedText(fileOperator);
    if (!text.empty())
        notification_status_message_post(text.c_str());
    _privateStorage->handBack();
}
