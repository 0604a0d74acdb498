// The recordings list: sharing and renaming.
#include "MwRecordingsContentViewController.h"

#include <algorithm>
#include <utility>

#include "MwAppReplies.h"
#include "MwFileName.h"
#include "MwFileOperator.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwRenamePopupController.h"
#include "MwText.h"

namespace {

void destroyRequest(MwHandle<app_control_h, app_control_destroy>& request, bool terminate)
{
    if (!request)
        return;
    if (terminate)
        MW_CALL(app_control_send_terminate_request, request.get());
    if (const int result = request.close(); result != 0)
        MW_LOGE("app_control_destroy failed : [%d]!!!", result);
}

bool fillShareRequest(app_control_h request, const std::vector<std::string>& pathList)
{
    if (!MW_CALL(app_control_set_uri, request, pathList.front().c_str()))
        return false;
    if (pathList.size() == 1)
        return MW_CALL(app_control_set_operation, request, APP_CONTROL_OPERATION_SHARE);
    std::vector<const char*> paths;
    paths.reserve(pathList.size());
    for (const std::string& path : pathList)
        paths.push_back(path.c_str());
    return MW_CALL(app_control_add_extra_data_array, request, APP_CONTROL_DATA_PATH, paths.data(),
               static_cast<int>(paths.size()))
        && MW_CALL(app_control_add_extra_data, request, "launch-type", "mewlo")
        && MW_CALL(app_control_set_operation, request, APP_CONTROL_OPERATION_MULTI_SHARE);
}

}

bool MwRecordingsContentViewController::_clickShareDoneButton(const std::vector<std::string>& pathList)
{
    if (pathList.empty()) {
        MW_LOGE("pathList is empty");
        return false;
    }
    if (_shareRequest) {
        MW_LOGW("destroy share app control : [%p]", static_cast<void*>(_shareRequest.get()));
        _destroyShareRequest(false);
    }
    Request request;
    void* answer
        = MwAppReplies::expect(token(), [this](app_control_h, app_control_result_e result) { _shareReply(result); });
    if (!MW_CALL(app_control_create, request.out()) || !fillShareRequest(request.get(), pathList)
        || !MW_CALL(app_control_set_launch_mode, request.get(), APP_CONTROL_LAUNCH_MODE_GROUP)
        || !MW_CALL(app_control_enable_app_started_result_event, request.get())
        || !MW_CALL(app_control_send_launch_request, request.get(), MwAppReplies::replyCb, answer)) {
        mwPost("IDS_MW_TPOP_NOTHING_TO_SHARE_WITH");
        return false;
    }
    _shareRequest = std::move(request);
    MW_LOGI("share app control data : [%p]", static_cast<void*>(_shareRequest.get()));
    return true;
}

void MwRecordingsContentViewController::_shareReply(int result)
{
    if (result != APP_CONTROL_RESULT_APP_STARTED)
        return;
    _viewType = NORMAL;
    _update();
    _destroyShareRequest(false);
}

void MwRecordingsContentViewController::_destroyShareRequest(bool terminate)
{
    destroyRequest(_shareRequest, terminate);
}

void MwRecordingsContentViewController::_openRenamePopup(const std::string& path)
{
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(path);
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
    if (!_renamePopup->create(getWindow(), nullptr))
        _renamePopup.reset();
}

// Gone after the callback that is still running in it.
void MwRecordingsContentViewController::_closeRenamePopup()
{
    const auto popup = std::exchange(_renamePopup, nullptr);
    if (popup)
        popup->destory();
}

void MwRecordingsContentViewController::_renameResponseCb(const char* text, int response)
{
    if (response != MwRenamePopupController::RESPONSE_RENAME || !text || _renameRecording(text))
        _closeRenamePopup();
}

// True closes the popup now.
bool MwRecordingsContentViewController::_renameRecording(const std::string& name)
{
    const std::string path = _renameTarget;
    const std::string ending = path.substr(std::min(path.rfind('.'), path.size()));
    if (!mwIsFileName(name, ending)) {
        mwPost("IDS_MW_POP_INVALID_FILE_NAME");
        return false;
    }
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(path);
    if (!info)
        return true;
    if (_fileOperator) {
        MW_LOGE("file operator is working");
        return false;
    }
    const size_t nameStart = path.rfind('/') + 1;
    const size_t dot = path.find('.', nameStart) != std::string::npos ? path.rfind('.') : path.size();
    const std::string newPath = path.substr(0, nameStart) + name + path.substr(dot);
    _fileOperator = std::make_unique<MwFileOperator>(MwFileOperator::RENAME,
        std::vector<MwFileOperator::Source>{{path, info->mediaId, newPath}},
        MwFileOperator::Callbacks{nullptr, nullptr, [this] { _onRenamed(); }});
    _fileOperator->start();
    return false;
}

void MwRecordingsContentViewController::_onRenamed()
{
    const auto outcome = _fileOperator->renameOutcome();
    const auto moved = _fileOperator->moved();
    _deleteFileOperator();
    if (outcome != MwFileRenamer::Outcome::DONE) {
        mwPost(
            outcome == MwFileRenamer::Outcome::TAKEN ? "IDS_MW_POP_RENAMEALREADYUSED" : "IDS_MW_POP_INVALID_FILE_NAME");
        return;
    }
    const auto& [path, newPath] = moved.front();
    getModel()->renameRecordedFile(path, newPath, newPath.substr(newPath.rfind('/') + 1));
    _viewType = NORMAL;
    _update();
    _closeRenamePopup();
}
