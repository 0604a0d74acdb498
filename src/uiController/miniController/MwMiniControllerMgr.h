#pragma once

#include <app_control.h>
#include <panekit/WTimer.h>

#include <memory>
#include <vector>

#include "MwAppController.h"
#include "MwHandle.h"
#include "MwMiniController.h"
#include "MwSignalMgr.h"

// Decides when each control surface exists, keeps it up to date and turns what its user pressed into commands. Lives as
// long as the program, in normal mode. Main loop only.
class MwMiniControllerMgr {
public:
    // All are borrowed and outlive it.
    MwMiniControllerMgr(MwModel* model, MwAppController* appController, panekit::WWindowController* windowController);
    ~MwMiniControllerMgr();
    MwMiniControllerMgr(const MwMiniControllerMgr&) = delete;
    MwMiniControllerMgr& operator=(const MwMiniControllerMgr&) = delete;

private:
    enum Kind { LOCKSCREEN, NOTIFICATION_PANEL, NOTIFICATION };
    // The identifier is that of the listener on its actions.
    struct Entry {
        MwMiniController* controller; // deletes itself
        unsigned int actionListenerId;
        Kind kind;
    };

    void _initialize();
    void _removeListeners();
    void _createNotiMiniController();
    void _createLockscreenMiniController();
    void _choosePanelSurface();
    [[nodiscard]] bool _isAway() const;
    static void _notificationChangedCb(void* data);
    [[nodiscard]] Evas_Object* _window() const;
    static void _focusChangedCb(void* data, Evas_Object* window, void* info);
    static void _preferenceChangedCb(const char* key, void* data);
    template <typename Surface>
    void _createMiniController(Kind kind);
    void _destroyMiniController(Kind kind);
    static void _end(Entry& entry);
    void _destoryAllMiniController();
    void _updateAll();

    void _onRecorderUpdated();
    void _onPlayerUpdated();
    void _onSystemInfo(MwSignalMgr::SystemInfo info);
    void _onLifeCycle(MwSignalMgr::LifeCycle lifeCycle);
    void _appPause();
    void _appResume();
    void _appTerminate();

    bool _dispatchCommandToAppController(MwMiniController::ActionType action);
    bool _dispatch(MwAppController::Command command, const char* failure);
    void _stopRecord();
    void _cancelRecord();
    static void _stopCb(MwAppController::Command command, MwAppController::Result result, void* userData);
    static void _tooShortCb(MwAppController::Command command, MwAppController::Result result, void* userData);
    void _later(void (MwMiniControllerMgr::*operation)());
    void _hideLockscreen() { _destroyMiniController(LOCKSCREEN); }
    void _playbackEnded();

    void _requestAlarmService();
    void _terminateAlarmService();
    void _alarmReply(app_control_result_e result);

    MwModel* _model;
    MwAppController* _appController;
    panekit::WWindowController* _windowController;
    std::vector<Entry> _miniControllers; // in the order of their creation
    panekit::WTimer::Weak _preloading;
    MwHandle<app_control_h, app_control_destroy> _alarmAppControl;
    unsigned int _lifeCycleListenerId = 0;
    unsigned int _systemInfoListenerId = 0;
    unsigned int _playerUpdatedListenerId = 0;
    unsigned int _recorderUpdatedListenerId = 0;
    unsigned int _playViewClosedListenerId = 0;
    std::shared_ptr<void> _alive = std::make_shared<int>(0); // for what comes later
};
