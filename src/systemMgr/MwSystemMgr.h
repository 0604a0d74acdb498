#pragma once

#include <MainLoopMailbox.h>
#include <callmgr.h>
#include <device.h>
#include <media_content.h>
#include <panekit/WTimer.h>
#include <sound_manager.h>
#include <system_settings.h>
#include <vconf.h>

#include <array>
#include <functional>

class MwModel;

// Knows the device around the application: watches its state keys and services and turns changes into the
// system-information signal, answers questions about it, holds the power locks. One instance for the process. Queries
// and locks from any thread; everything else on the main loop.
class MwSystemMgr {
public:
    static MwSystemMgr* getInstance();
    static void destroyInstance();

    MwSystemMgr() = default;
    MwSystemMgr(const MwSystemMgr&) = delete;
    MwSystemMgr& operator=(const MwSystemMgr&) = delete;

    // The model is borrowed until deinitialize.
    bool initialize(MwModel* model);
    void deinitialize();
    void registerEvent();
    void unregisterEvent();

    bool isCallConnected() const;
    bool isMMCMounted() const;
    // No room to record. May switch the storage choice to the other storage, and then says so to the user.
    bool isStorageFull();
    bool getAvailStorageSize(int storageType, double* bytes) const;
    bool isLockscreenOn() const;
    bool isLCDOn() const;
    bool isEarjackInserted() const;
    bool isUPSModeEnabled() const;
    bool isPrivateModeInitialized() const;
    bool isPrivateModeEnabled() const;
    bool isPrivateModeEnabledByApp() const;
    bool getRejectCall() const;
    int getModelType();

    void setRejectCall(bool reject);
    bool requestLockCPU();
    bool releaseLockCPU();
    bool requestLockDisplayDim();
    bool releaseLockDisplayDim();

    // Runs the closure on the main loop: at once when already there.
    void _callSafetyMainThread(std::function<void()> closure);

private:
    struct KeyWatch;
    static const std::array<KeyWatch, 8>& _keyWatches();

    static void _mmcStatusChangedCb(keynode_t* node, void* userData);
    static void _lockscreenStateChangedCb(keynode_t* node, void* userData);
    static void _powerOffStateChangedCb(keynode_t* node, void* userData);
    static void _upsModeChangedCb(keynode_t* node, void* userData);
    static void _earjackStateChangedCb(keynode_t* node, void* userData);
    static void _callRejectStateChangedCb(keynode_t* node, void* userData);
    static void _microphoneChangedCb(keynode_t* node, void* userData);
    static void _privateStorageChangedCb(keynode_t* node, void* userData);
    static void _mediaDBUpdatedCb(media_content_error_e error, int pid, media_content_db_update_item_type_e updateItem,
        media_content_db_update_type_e updateType, media_content_type_e mediaType, char* uuid, char* path, char* mime,
        void* userData);
    static void _timeZoneStateChangedCb(system_settings_key_e key, void* userData);
    static void _soundActiveDeviceChangedCb(
        sound_device_in_e inputDevice, sound_device_out_e outputDevice, void* userData);
    static void _powerStateChangedCb(device_callback_e type, void* value, void* userData);
    static void _themeChangedCb(void* userData);
    bool _useOtherStorage(int type, const char* message);

    MwModel* _model = nullptr;
    panekit::WTimer::Weak _mediaDBUpdateTimer;
    int _modelType = 0;
    platform::MainLoopMailbox _mailbox;
};
