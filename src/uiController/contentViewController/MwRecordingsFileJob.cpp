#include "MwRecordingsFileJob.h"

#include <string_view>
#include <unordered_map>

#include <notification.h>

#include "MwFileOperationPopup.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwPrivateStorage.h"
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

MwRecordingsFileJob::MwRecordingsFileJob(Evas_Object* window, MwModel* model, MwPrivateStorage* privateStorage)
    : _window(window)
    , _model(model)
    , _privateStorage(privateStorage)
{
}

MwRecordingsFileJob::~MwRecordingsFileJob() { end(); }

bool MwRecordingsFileJob::_mayStart(const Paths& pathList) const
{
    if (pathList.empty())
        MW_LOGE("pathList is empty");
    else if (_fileOperator)
        MW_LOGE("file operator is working");
    else
        return true;
    return false;
}

std::vector<MwFileOperator::Source> MwRecordingsFileJob::_sourcesOf(const Paths& pathList) const
{
    std::unordered_map<std::string_view, const MwFileInfo*> known;
    for (const MwFileInfo& info : _model->getRecordedFileList())
        known.emplace(info.path, &info);
    std::vector<MwFileOperator::Source> sources;
    for (const std::string& path : pathList) {
        const auto info = known.find(path);
        sources.push_back({path, info != known.end() ? info->second->mediaId : std::string()});
    }
    return sources;
}

void MwRecordingsFileJob::remove(const Paths& pathList, bool forGood, std::function<void(const Deleted&)> finished)
{
    if (!_mayStart(pathList))
        return;
    _finished = [this, finished = std::move(finished)] {
        Deleted deleted;
        deleted.hasBegun = _fileOperator->hasBegun();
        deleted.donePaths = _fileOperator->donePaths();
        deleted.hasFailed = _fileOperator->hasFailed();
        if (!_fileOperator->isCancelRequested())
            deleted.withoutTrash = _fileOperator->withoutTrash();
        end();
        finished(deleted);
    };
    const auto type = forGood ? MwFileOperator::DELETE_FOR_GOOD : MwFileOperator::DELETE;
    _fileOperator = std::make_unique<MwFileOperator>(
        type, _sourcesOf(pathList), MwFileOperator::Callbacks{nullptr, nullptr, [this] { _finish(); }});
    _fileOperationPopup = std::make_unique<MwFileOperationPopup>(_window);
    _fileOperationPopup->showDeleting([this] { _cancelDeleting(); });
    _fileOperator->start();
}

void MwRecordingsFileJob::_cancelDeleting()
{
    if (_fileOperator->hasBegun())
        _fileOperator->cancelAndWait();
    _finish();
}

void MwRecordingsFileJob::move(MwFileOperator::Type type, const Paths& pathList, std::function<void()> finished)
{
    if (!_mayStart(pathList))
        return;
    _finished = [this, finished = std::move(finished)] {
        end();
        finished();
    };
    _fileOperator = std::make_unique<MwFileOperator>(type, _sourcesOf(pathList),
        MwFileOperator::Callbacks{[this] { _updateMovePopup(); },
            [this](const std::string& path) { _createDuplicationPopupController(path); }, [this] { _moveFinished(); }});
    _fileOperationPopup = std::make_unique<MwFileOperationPopup>(_window);
    _createMovingingPopupController();
    _fileOperator->start();
}

void MwRecordingsFileJob::rename(const MwFileOperator::Source& source,
    std::function<void(Outcome outcome, const std::string& path, const std::string& newPath)> finished)
{
    if (!_mayStart({source.path}))
        return;
    _finished = [this, finished = std::move(finished)] {
        const auto outcome = _fileOperator->renameOutcome();
        const auto moved = _fileOperator->moved();
        end();
        if (outcome == Outcome::DONE)
            finished(outcome, moved.front().from, moved.front().to);
        else
            finished(outcome, "", "");
    };
    _fileOperator
        = std::make_unique<MwFileOperator>(MwFileOperator::RENAME, std::vector<MwFileOperator::Source>{source},
            MwFileOperator::Callbacks{nullptr, nullptr, [this] { _finish(); }});
    _fileOperator->start();
}

// The callback ends the job, and may begin another one. A full bar may be seen after the end.
void MwRecordingsFileJob::_finish()
{
    if (const auto finished = std::exchange(_finished, nullptr); finished)
        finished();
}

void MwRecordingsFileJob::_createMovingingPopupController()
{
    _fileOperationPopup->showMoving(_fileOperator->progress(), [this] { _cancelMoving(); });
}

void MwRecordingsFileJob::_cancelMoving()
{
    if (_fileOperator->isFinished())
        return; // it only shows the full bar
    if (_fileOperator->hasBegun())
        _fileOperator->requestCancel();
    else
        _finish();
}

void MwRecordingsFileJob::_updateMovePopup()
{
    if (_fileOperator && _fileOperationPopup)
        _fileOperationPopup->update(_fileOperator->progress());
}

void MwRecordingsFileJob::_createDuplicationPopupController(const std::string& path)
{
    _fileOperationPopup->showClash(fileName(path),
        {[this](MwClashAction action) { _onSelectedDuplicationPopupButton(static_cast<int>(action)); },
            [this](bool on) { _fileOperator->setApplyToAll(on); }});
}

void MwRecordingsFileJob::_onSelectedDuplicationPopupButton(int action)
{
    MW_LOGW("BEGIN - action : [%d]", action);
    _createMovingingPopupController();
    _fileOperator->answer(static_cast<MwClashAction>(action));
}

void MwRecordingsFileJob::updateDuplicationPopup()
{
    if (_fileOperator && _fileOperationPopup)
        _fileOperationPopup->setClashName(fileName(_fileOperator->currentPath()));
}

// The worker has ended. Only a full bar is looked at before the popup goes: a cancelled or stopped move never fills it.
void MwRecordingsFileJob::_moveFinished()
{
    const bool isFull = !_fileOperator->isCancelRequested() && !_fileOperator->hasFailed();
    _updateMovePopup();
    if (isFull && _fileOperationPopup)
        _fileOperationPopup->complete([this] { _finish(); });
    else
        _finish();
}

void MwRecordingsFileJob::end()
{
    if (!_fileOperator)
        return;
    _finished = nullptr;
    const auto popup = std::exchange(_fileOperationPopup, nullptr);
    if (popup)
        popup->close();
    const auto fileOperator = std::exchange(_fileOperator, nullptr);
    fileOperator->cancelAndWait();
    for (const auto& [from, to] : fileOperator->moved()) {
        if (from == _model->getCurrentPlayPath())
            _model->setCurrentPlayPath(to);
    }
    if (fileOperator->type() == MwFileOperator::MOVE_TO_PRIVATE
        || fileOperator->type() == MwFileOperator::REMOVE_FROM_PRIVATE)
        _moveEnded(*fileOperator);
}

// However a move ended: tells what was moved, and hands the private storage back.
void MwRecordingsFileJob::_moveEnded(const MwFileOperator& fileOperator)
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
