#include "MwLoggingMgr.h"

#include "MwHandle.h"
#include "MwLog.h"

namespace {

constexpr auto APP_ID = "com.tovanic.mewlo-lite";
using Bundle = MwHandle<bundle*, bundle_free>;

}

MwLoggingMgr* MwLoggingMgr::getInstance()
{
    static MwLoggingMgr instance;
    static const bool initialized = instance.init();
    (void)initialized;
    return &instance;
}

MwLoggingMgr::~MwLoggingMgr()
{
    if (_logMgrHandle != nullptr)
        tovanic_log_manager_destroy(_logMgrHandle);
}

bool MwLoggingMgr::init()
{
    MW_LOGW("BEGIN");
    if (const int result = tovanic_log_manager_create(&_logMgrHandle); result != 0) {
        MW_LOGE("tovanic_log_manager_create failed! [%d]", result);
        return false;
    }
    MW_LOGW("END");
    return true;
}

bool MwLoggingMgr::insert(const std::string& feature) { return insert(feature, "", ""); }

bool MwLoggingMgr::insert(const std::string& feature, const std::string& extra) { return insert(feature, extra, ""); }

bool MwLoggingMgr::insert(const std::string& feature, const std::string& extra, const std::string& value)
{
    MW_LOGI("BEGIN - feature : [%s], extra : [%s], value : [%s]", feature.c_str(), extra.c_str(), value.c_str());
    if (_logMgrHandle == nullptr) {
        MW_LOGE("_logMgrHandle is nullptr");
        return false;
    }
    if (feature.empty()) {
        MW_LOGE("feature is empty");
        return false;
    }
    const Bundle logData(bundle_create());
    if (!logData) {
        MW_LOGE("logData is nullptr");
        return false;
    }
    bundle_add_str(logData.get(), "app_id", APP_ID);
    bundle_add_str(logData.get(), "feature", feature.c_str());
    if (!extra.empty())
        bundle_add_str(logData.get(), "extra", extra.c_str());
    if (!value.empty())
        bundle_add_str(logData.get(), "value", value.c_str());
    int request = 0;
    const int result
        = tovanic_log_manager_insert(_logMgrHandle, TOVANIC_LOG_MANAGER_URI, logData.get(), nullptr, nullptr, &request);
    if (result != 0)
        MW_LOGE("tovanic_log_manager_insert failed! [%d]", result);
    MW_LOGI("END");
    return result == 0;
}
