#pragma once

#include <panekit/WSignal.h>

#include <utility>

// The signals that concern the whole application. One instance for the process, made on first use. Main loop only.
class MwSignalMgr {
public:
    enum LifeCycle : int { RESUME, PAUSE, TERMINATE };

    enum SystemInfo : int {
        MMC_REMOVED,
        LOCKSCREEN_CHANGED,
        MEDIA_DB_UPDATED,
        TIME_ZONE_CHANGED,
        REGION_FORMAT_CHANGED,
        POWER_OFF,
        EARJACK_INSERTED,
        EARJACK_REMOVED,
        UPS_MODE_CHANGED,
        MINI_CONTROLLER_RECORDING_SAVED,
        POWER_STATE_CHANGED,
        THEME_CHANGED,
        CALL_REJECT_CHANGED,
        MICROPHONE_BACK,
        PRIVATE_STORAGE_CHANGED,
    };

    static MwSignalMgr* getInstance();
    // Ends the process-wide instance; nothing may listen any more.
    static void destroyInstance();
    // The instance if there is one. For teardown that must not bring it back.
    static MwSignalMgr* existing();

    panekit::WSignal<void(LifeCycle)>& getLifeCycleSignal() { return _lifeCycle; }
    panekit::WSignal<void(SystemInfo)>& getSystemInfoSignal() { return _systemInfo; }
    // Emitted after the model's play-view flag was cleared.
    panekit::WSignal<void()>& getPlayViewClosedSignal() { return _playViewClosed; }

private:
    panekit::WSignal<void(LifeCycle)> _lifeCycle;
    panekit::WSignal<void(SystemInfo)> _systemInfo;
    panekit::WSignal<void()> _playViewClosed;
};

// Removes a listener by the identifier its owner keeps, once; 0 is no listener.
template <typename Signal>
void mwForget(Signal& signal, unsigned int& listener)
{
    if (const unsigned int id = std::exchange(listener, 0); id != 0)
        signal.removeListener(id);
}
