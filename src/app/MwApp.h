#pragma once

#include <panekit/WApp.h>
#include <panekit/WAppEventHandler.h>
#include <uxt_theme.h>

#include <memory>
#include <string>

class MwAppController;
class MwLaunchRequests;
class MwMiniControllerMgr;
class MwModel;
class MwRecordingRescue;

namespace panekit {
class WPopupController;
}

// The application object: builds model, controller and first screen, answers launch requests and follows the lifecycle.
// Owns the model and the controller. Main loop only.
class MwApp : public panekit::WApp {
public:
    MwApp();
    ~MwApp() override;

protected:
    bool onCreate() override;
    void onTerminate() override;
    void onPause() override;
    void onResume() override;
    void onAppControl(app_control_h request, bool firstLaunch) override;

private:
    static void _bindTextDomain();
    void _installEventHandlers();
    bool _createWindow();
    void _setChangeableTableInfo();
    void _unsetChangeableTableInfo();
    static void _setThemeExtension();
    static void _unsetThemeExtension();
    static void _connectMediaContentDB();
    static void _disconnectMediaContentDB();
    void _launchFirst();
    bool _lastItemPopped();
    void _openRecordings();
    void _rescueOnce();
    void _checkMainAppRecordingState();
    void _createMainAppRecordingPopup();
    void _languageChanged(app_event_info_h info);
    void _renewTitle();
    void _lowBatteryEventCb();
    static void _recordingStopRequestCb(const char* key, void* userData);

    panekit::WAppEventHandler _languageChangedHandler;
    panekit::WAppEventHandler _regionFormatChangedHandler;
    panekit::WAppEventHandler _lowBatteryHandler;
    std::unique_ptr<MwModel> _model;
    std::unique_ptr<MwAppController> _appController;
    std::unique_ptr<MwLaunchRequests> _requests;
    std::unique_ptr<MwMiniControllerMgr> _miniControllerMgr; // in normal mode
    uxt_color_table_h _changeableColorTable = nullptr;
    uxt_font_table_h _changeableFontTable = nullptr;
    panekit::WPopupController* _mainAppRecordingPopup = nullptr;
    std::unique_ptr<MwRecordingRescue> _rescue;
    bool _watchesStopRequests = false;
};
