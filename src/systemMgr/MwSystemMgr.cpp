#include "MwSystemMgr.h"

#include <Mutex.h>
#include <storage.h>
#include <system_info.h>

#include <array>
#include <memory>

#include "MwLog.h"
#include "MwModel.h"
#include "MwText.h"

namespace {

constexpr double STORAGE_THRESHOLD = 107520.0; // bytes
constexpr int CARD_MOUNTED = 1;
constexpr int ULTRA_POWER_SAVING = 2;
constexpr auto KEY_MOVE_TO_PRIVATE = "memory/setting/move_to_private";

struct ModelType {
    const char* name;
    int code;
};
constexpr std::array<ModelType, 3> MODEL_TYPES = {{
    {.name = "QX-A110H", .code = 1},
    {.name = "QX-A210H", .code = 2},
    {.name = "QX-A210F", .code = 3},
}};

platform::Mutex instanceMutex;
std::unique_ptr<MwSystemMgr> instance GUARDED_BY(instanceMutex);

}

MwSystemMgr* MwSystemMgr::getInstance()
{
    const platform::Lock lock(instanceMutex);
    if (!instance)
        instance = std::make_unique<MwSystemMgr>();
    return instance.get();
}

void MwSystemMgr::destroyInstance()
{
    const platform::Lock lock(instanceMutex);
    instance.reset();
}

bool MwSystemMgr::initialize(MwModel* model)
{
    if (model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    _model = model;
    return true;
}

void MwSystemMgr::deinitialize()
{
    _mailbox.close();
    _model = nullptr;
}

bool MwSystemMgr::isCallConnected() const
{
    cm_client_h client = nullptr;
    if (const int result = cm_init(&client); result != 0) {
        MW_LOGE("cm_init failed! [%d]", result);
        return false;
    }
    cm_call_status_e status = CM_CALL_STATUS_IDLE;
    if (const int result = cm_get_call_status(client, &status); result != 0)
        MW_LOGE("cm_get_call_status failed! [%d]", result);
    cm_deinit(client);
    if (status == CM_CALL_STATUS_IDLE)
        return false;
    MW_LOGI("call[%d] is connected", status);
    return true;
}

bool MwSystemMgr::isMMCMounted() const
{
    int status = 0;
    if (vconf_get_int(VCONFKEY_SYSMAN_MMC_STATUS, &status) != 0) {
        MW_LOGE("vconf_get_int fail");
        return false;
    }
    MW_LOGI("mmc status = [%d]", status);
    return status == CARD_MOUNTED;
}

bool MwSystemMgr::getAvailStorageSize(int storageType, double* bytes) const
{
    struct statvfs size { };
    if (storageType == MW_STORAGE_DEVICE) {
        if (const int result = storage_get_internal_memory_size(&size); result != 0) {
            MW_LOGE("storage_get_internal_memory_size failed [%d]", result);
            return false;
        }
    } else if (const int result = storage_get_external_memory_size(&size); result != 0) {
        MW_LOGE("storage_get_external_memory_size failed [%d]", result);
        return false;
    }
    *bytes = static_cast<double>(size.f_bsize) * static_cast<double>(size.f_bavail);
    return true;
}

bool MwSystemMgr::isStorageFull()
{
    if (_model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    double internal = 0;
    double external = 0;
    getAvailStorageSize(MW_STORAGE_DEVICE, &internal);
    if (isMMCMounted())
        getAvailStorageSize(MW_STORAGE_CARD, &external);
    const bool onDevice = _model->getStorageType() == MW_STORAGE_DEVICE;
    if ((onDevice ? internal : external) > STORAGE_THRESHOLD)
        return false;
    if (onDevice && external > STORAGE_THRESHOLD)
        return _useOtherStorage(
            MW_STORAGE_CARD, "IDS_IDLE_TPOP_ITEMS_SAVED_TO_SD_CARD_INSTEAD_OF_DEFAULT_LOCATION_HDEVICE_STORAGE");
    if (!onDevice && internal > STORAGE_THRESHOLD)
        return _useOtherStorage(
            MW_STORAGE_DEVICE, "IDS_IDLE_TPOP_ITEMS_SAVED_IN_DEVICE_STORAGE_INSTEAD_OF_DEFAULT_LOCATION_HSD_CARD");
    MW_LOGE("internal & external memory is too low");
    return true;
}

// Answers what isStorageFull answers after the switch: false.
bool MwSystemMgr::_useOtherStorage(int type, const char* message)
{
    mwPost(message);
    _model->setStorageType(static_cast<MwStorageType>(type));
    return false;
}

bool MwSystemMgr::isLockscreenOn() const
{
    int state = 0;
    if (vconf_get_int(VCONFKEY_IDLE_LOCK_STATE, &state) != 0) {
        MW_LOGE("vconf_get_int fail");
        return false;
    }
    MW_LOGI("VCONFKEY_IDLE_LOCK_STATE state = [%d]", state);
    return state != 0;
}

bool MwSystemMgr::isLCDOn() const
{
    display_state_e state = DISPLAY_STATE_NORMAL;
    if (const int result = device_display_get_state(&state); result != 0) {
        MW_LOGE("device_display_get_state failed : [%d]!!!", result);
        return false;
    }
    MW_LOGI("LCD state : [%d]", state);
    return state != DISPLAY_STATE_SCREEN_OFF;
}

bool MwSystemMgr::isEarjackInserted() const
{
    sound_device_out_e output = SOUND_DEVICE_OUT_SPEAKER;
    if (sound_manager_get_active_route(nullptr, &output) != 0) {
        MW_LOGE("sound_manager_get_active_route failed");
        return false;
    }
    return output == SOUND_DEVICE_OUT_WIRED_ACCESSORY;
}

bool MwSystemMgr::isUPSModeEnabled() const
{
    int mode = 0;
    if (vconf_get_int(VCONFKEY_SETAPPL_PSMODE, &mode) != 0)
        return false;
    MW_LOGI("ups mode = %d", mode);
    return mode == ULTRA_POWER_SAVING;
}

bool MwSystemMgr::isPrivateModeInitialized() const
{
    int method = 0;
    if (vconf_get_int(platform::KEY_PRIVATE_METHOD, &method) != 0) {
        MW_LOGE("get private unlock mode vconf failed");
        return false;
    }
    MW_LOGI("private unlock mode = %d", method);
    return method != 0;
}

bool MwSystemMgr::isPrivateModeEnabled() const
{
    int enabled = 0;
    if (vconf_get_bool(VCONFKEY_PRIVATE_STORAGE_OPEN, &enabled) != 0) {
        MW_LOGE("get private mode vconf failed");
        return false;
    }
    MW_LOGI("private mode = %d", enabled);
    return enabled != 0;
}

bool MwSystemMgr::isPrivateModeEnabledByApp() const
{
    int enabled = 0;
    if (vconf_get_bool(KEY_MOVE_TO_PRIVATE, &enabled) != 0) {
        MW_LOGE("get private mode vconf failed");
        return false;
    }
    MW_LOGI("private mode by app = %d", enabled);
    return enabled != 0;
}

bool MwSystemMgr::getRejectCall() const
{
    int reject = 0;
    if (vconf_get_bool(VCONFKEY_CALL_RECORDING_REJECT, &reject) != 0) {
        MW_LOGE("vconf_get_int fail");
        return false;
    }
    MW_LOGI("reject call = [%d]", reject);
    return reject != 0;
}

void MwSystemMgr::setRejectCall(bool reject)
{
    MW_LOGI("set reject call: %d", reject);
    vconf_set_bool(VCONFKEY_CALL_RECORDING_REJECT, reject ? 1 : 0);
}

int MwSystemMgr::getModelType()
{
    if (_modelType != 0)
        return _modelType;
    char* text = nullptr;
    if (const int result = system_info_get_platform_string(SYSTEM_INFO_KEY_MODEL, &text); result != 0) {
        MW_LOGE("system_info_get_platform_string failed! [%d]", result);
        return _modelType;
    }
    const std::string name = mwAdopt(text);
    for (const ModelType& model : MODEL_TYPES) {
        if (name == model.name)
            _modelType = model.code;
    }
    return _modelType;
}

bool MwSystemMgr::requestLockCPU()
{
    const int result = device_power_request_lock(POWER_LOCK_CPU, 0);
    if (result != 0)
        MW_LOGE("device_power_request_lock fail [%d]", result);
    return result == 0;
}

bool MwSystemMgr::releaseLockCPU()
{
    const int result = device_power_release_lock(POWER_LOCK_CPU);
    if (result != 0)
        MW_LOGE("device_power_release_lock fail [%d]", result);
    return result == 0;
}

bool MwSystemMgr::requestLockDisplayDim()
{
    const int result = device_power_request_lock(POWER_LOCK_DISPLAY_DIM, 0);
    if (result != 0)
        MW_LOGE("device_power_request_lock fail [%d]", result);
    return result == 0;
}

bool MwSystemMgr::releaseLockDisplayDim()
{
    if (isLCDOn()) {
        if (const int result = device_power_wakeup(false); result != 0) {
            MW_LOGE("device_power_wakeup fail [%d]", result);
            return false;
        }
    }
    const int result = device_power_release_lock(POWER_LOCK_DISPLAY_DIM);
    if (result != 0)
        MW_LOGE("device_power_release_lock fail [%d]", result);
    return result == 0;
}

void MwSystemMgr::_callSafetyMainThread(std::function<void()> closure) { _mailbox.call(std::move(closure)); }
