#include "MwRecordingsSharing.h"

#include <utility>

#include "MwAppReplies.h"
#include "MwLog.h"
#include "MwText.h"

MwRecordingsSharing::MwRecordingsSharing(std::function<void()> started)
    : _started(std::move(started))
{
}

MwRecordingsSharing::~MwRecordingsSharing() { cancel(); }

void MwRecordingsSharing::cancel() { _destroyShareRequest(true); }

bool MwRecordingsSharing::_fill(app_control_h request, const std::vector<std::string>& pathList)
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

bool MwRecordingsSharing::share(const std::vector<std::string>& pathList)
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
        = MwAppReplies::expect(_token, [this](app_control_h, app_control_result_e result) { _shareReply(result); });
    if (!MW_CALL(app_control_create, request.out()) || !_fill(request.get(), pathList)
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

void MwRecordingsSharing::_shareReply(int result)
{
    if (result != APP_CONTROL_RESULT_APP_STARTED)
        return;
    _started();
    _destroyShareRequest(false);
}

void MwRecordingsSharing::_destroyShareRequest(bool terminate)
{
    if (!_shareRequest)
        return;
    if (terminate)
        MW_CALL(app_control_send_terminate_request, _shareRequest.get());
    if (const int result = _shareRequest.close(); result != 0)
        MW_LOGE("app_control_destroy failed : [%d]!!!", result);
}
