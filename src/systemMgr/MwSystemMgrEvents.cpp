#include "MwSystemMgr.h"

#include <uxt_theme.h>

#include <unistd.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwSignalMgr.h"

namespace {

constexpr double MEDIA_DB_SETTLING_SECONDS = 1.0;
constexpr int CARD_REMOVED = 0, CARD_NOT_MOUNTED = 2;
constexpr int LOCK_STATES = 1; // 0 unlocked, 1 locked; above: other states of the lock screen
constexpr int POWERING_OFF = 2, RESTARTING = 3;
constexpr int EARJACK_ABSENT = 0;

void emitSystemInfo(MwSignalMgr::SystemInfo info) { MwSignalMgr::getInstance()->getSystemInfoSignal().emit(info); }

bool selfIsMissing(const void* self)
{
    if (self == nullptr)
        MW_LOGE("self is nullptr");
    return self == nullptr;
}

}

// What to watch, in the order of installing, with the line to log when that fails.
struct MwSystemMgr::KeyWatch {
    const char* key;
    vconf_callback_fn callback;
    const char* failure;
};

const std::array<MwSystemMgr::KeyWatch, 8>& MwSystemMgr::_keyWatches()
{
#define WATCH(name, function)                                                                                          \
    {                                                                                                                  \
        .key = (name), .callback = (function), .failure = "vconf_notify_key_changed(" #name ") failed"                 \
    }
    static const std::array<KeyWatch, 8> watches = {{
        WATCH(VCONFKEY_SYSMAN_MMC_STATUS, _mmcStatusChangedCb),
        WATCH(VCONFKEY_IDLE_LOCK_STATE, _lockscreenStateChangedCb),
        WATCH(VCONFKEY_SYSMAN_POWER_OFF_STATUS, _powerOffStateChangedCb),
        WATCH(VCONFKEY_SETAPPL_PSMODE, _upsModeChangedCb),
        WATCH(VCONFKEY_SYSMAN_EARJACK, _earjackStateChangedCb),
        WATCH(VCONFKEY_CALL_RECORDING_REJECT, _callRejectStateChangedCb),
        WATCH(VCONFKEY_MEWLO_MICROPHONE, _microphoneChangedCb),
        WATCH(VCONFKEY_PRIVATE_STORAGE_OPEN, _privateStorageChangedCb),
    }};
#undef WATCH
    return watches;
}

void MwSystemMgr::registerEvent()
{
    for (const KeyWatch& watch : _keyWatches()) {
        if (vconf_notify_key_changed(watch.key, watch.callback, this) != 0)
            MW_LOGE("%s", watch.failure);
    }
    if (media_content_set_db_updated_cb(_mediaDBUpdatedCb, this) != 0)
        MW_LOGE("media_content_set_db_updated_cb failed");
    for (const auto key : {SYSTEM_SETTINGS_KEY_TIME_CHANGED, SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR})
        MW_CALL(system_settings_set_changed_cb, key, _timeZoneStateChangedCb, this);
    MW_CALL(sound_manager_set_active_device_changed_cb, _soundActiveDeviceChangedCb, this);
    MW_CALL(device_add_callback, DEVICE_CALLBACK_DISPLAY_STATE, _powerStateChangedCb, this);
    MW_CALL(uxt_theme_add_changed_callback, _themeChangedCb, this);
}

void MwSystemMgr::unregisterEvent()
{
    for (const KeyWatch& watch : _keyWatches())
        MW_CALL(vconf_ignore_key_changed, watch.key, watch.callback);
    MW_CALL(media_content_unset_db_updated_cb);
    if (const int result = system_settings_unset_changed_cb(SYSTEM_SETTINGS_KEY_TIME_CHANGED); result != 0)
        MW_LOGE("system_settings_unset_changed_cb - SYSTEM_SETTINGS_KEY_TIME_CHANGED failed : [%d]!!!", result);
    if (const int result = system_settings_unset_changed_cb(SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR); result != 0)
        MW_LOGE(
            "system_settings_unset_changed_cb - SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR failed : [%d]!!!", result);
    MW_CALL(sound_manager_unset_active_device_changed_cb);
    MW_CALL(device_remove_callback, DEVICE_CALLBACK_DISPLAY_STATE, _powerStateChangedCb);
    MW_CALL(uxt_theme_remove_changed_callback, _themeChangedCb, this);
    panekit::WTimer::destroy(_mediaDBUpdateTimer);
}

void MwSystemMgr::_mmcStatusChangedCb(keynode_t* node, void* userData)
{
    auto* self = static_cast<MwSystemMgr*>(userData);
    if (selfIsMissing(self))
        return;
    if (self->_model == nullptr) {
        MW_LOGE("self->_model is nullptr");
        return;
    }
    const int status = vconf_keynode_get_int(node);
    MW_LOGI("mmc status changed to [%d]", status);
    if (status != CARD_REMOVED && status != CARD_NOT_MOUNTED)
        return;
    emitSystemInfo(MwSignalMgr::MMC_REMOVED);
    // The choice is asked for: the storage type itself is the device's as soon as the card is gone.
    if (self->_model->getStorageChoice() == MW_STORAGE_CARD)
        self->_model->setStorageType(MW_STORAGE_DEVICE);
}

void MwSystemMgr::_lockscreenStateChangedCb(keynode_t* node, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("lockscreen state changed!");
    const int state = vconf_keynode_get_int(node);
    if (state >= 0 && state <= LOCK_STATES)
        emitSystemInfo(MwSignalMgr::LOCKSCREEN_CHANGED);
}

void MwSystemMgr::_powerOffStateChangedCb(keynode_t* node, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("powerOff state changed!");
    const int state = vconf_keynode_get_int(node);
    if (state != POWERING_OFF && state != RESTARTING)
        return;
    MW_LOGI("emit signal as POWER OFFED");
    emitSystemInfo(MwSignalMgr::POWER_OFF);
}

void MwSystemMgr::_upsModeChangedCb(keynode_t*, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("ups mode state changed!");
    emitSystemInfo(MwSignalMgr::UPS_MODE_CHANGED);
}

void MwSystemMgr::_earjackStateChangedCb(keynode_t* node, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("earjack state changed!");
    if (vconf_keynode_get_int(node) != EARJACK_ABSENT)
        return;
    MW_LOGI("emit signal as EARJACK REMOVED");
    emitSystemInfo(MwSignalMgr::EARJACK_REMOVED);
}

void MwSystemMgr::_callRejectStateChangedCb(keynode_t*, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("call reject state changed!");
    emitSystemInfo(MwSignalMgr::CALL_REJECT_CHANGED);
}

void MwSystemMgr::_microphoneChangedCb(keynode_t* node, void* userData)
{
    if (selfIsMissing(userData))
        return;
    if (vconf_keynode_get_int(node) != 0)
        emitSystemInfo(MwSignalMgr::MICROPHONE_BACK);
}

void MwSystemMgr::_privateStorageChangedCb(keynode_t*, void* userData)
{
    if (!selfIsMissing(userData))
        emitSystemInfo(MwSignalMgr::PRIVATE_STORAGE_CHANGED);
}

void MwSystemMgr::_mediaDBUpdatedCb(media_content_error_e, int pid, media_content_db_update_item_type_e updateItem,
    media_content_db_update_type_e, media_content_type_e mediaType, char*, char*, char*, void* userData)
{
    auto* self = static_cast<MwSystemMgr*>(userData);
    if (selfIsMissing(self))
        return;
    if (pid == ::getpid() || (updateItem == MEDIA_ITEM_FILE && mediaType != MEDIA_CONTENT_TYPE_SOUND))
        return;
    // A burst of changes gives one event, when it has settled.
    panekit::WTimer::destroy(self->_mediaDBUpdateTimer);
    self->_mediaDBUpdateTimer = panekit::WTimer::addTimer(MEDIA_DB_SETTLING_SECONDS, [](void*) {
        MW_LOGI("media DB update timeout!");
        emitSystemInfo(MwSignalMgr::MEDIA_DB_UPDATED);
        return false;
    });
}

void MwSystemMgr::_timeZoneStateChangedCb(system_settings_key_e, void* userData)
{
    if (selfIsMissing(userData))
        return;
    emitSystemInfo(MwSignalMgr::TIME_ZONE_CHANGED);
}

void MwSystemMgr::_soundActiveDeviceChangedCb(sound_device_in_e inputDevice, sound_device_out_e, void* userData)
{
    auto* self = static_cast<MwSystemMgr*>(userData);
    if (selfIsMissing(self))
        return;
    MW_LOGI("sound route device is changed");
    if (inputDevice != SOUND_DEVICE_IN_WIRED_ACCESSORY)
        return;
    MW_LOGI("earjact is inserted");
    self->_callSafetyMainThread([] { emitSystemInfo(MwSignalMgr::EARJACK_INSERTED); });
}

void MwSystemMgr::_powerStateChangedCb(device_callback_e, void* value, void* userData)
{
    if (selfIsMissing(userData))
        return;
    MW_LOGI("BEGIN - POWER state : [%d]", static_cast<int>(reinterpret_cast<intptr_t>(value)));
    emitSystemInfo(MwSignalMgr::POWER_STATE_CHANGED);
}

void MwSystemMgr::_themeChangedCb(void* userData)
{
    if (selfIsMissing(userData))
        return;
    emitSystemInfo(MwSignalMgr::THEME_CHANGED);
}
