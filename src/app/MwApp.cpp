#include "MwApp.h"

#include <Elementary.h>
#include <media_content.h>
#include <panekit/WLanguage.h>
#include <panekit/WNaviframeController.h>
#include <panekit/WPopupController.h>
#include <panekit/WTimer.h>
#include <panekit/WWindowController.h>
#include <preference.h>
#include <vconf.h>

#include <array>
#include <libintl.h>
#include <string>

#include "MwAppController.h"
#include "MwHandle.h"
#include "MwLaunchRequests.h"
#include "MwLog.h"
#include "MwMiniControllerMgr.h"
#include "MwModel.h"
#include "MwRecorderContentViewController.h"
#include "MwRecordingRescue.h"
#include "MwRecordingsContentViewController.h"
#include "MwResourceMgr.h"
#include "MwSignalMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr auto TEXT_DOMAIN = "mewlo-lite";
constexpr auto WINDOW_NAME = "com.tovanic.mewlo-lite";
constexpr int WINDOW_TYPE = 1;
constexpr double BASE_SCALE = 2.6;
constexpr int INDICATOR_SHOWN = 2, INDICATOR_TRANSPARENT = 3;
constexpr auto STOP_PREFERENCE = "MainRecordingStopRequest";
constexpr int LOWEST_ALLOWED_BATTERY = 2;
constexpr std::array<const char*, 2> THEME_EXTENSIONS = {"edje/MwGenlist.edj", "edje/MwButton.edj"};

template <typename Apply>
void forEachThemeExtension(Apply apply)
{
    for (const char* name : THEME_EXTENSIONS) {
        std::string path;
        if (!MwResourceMgr::getInstance()->getEdjPath(name, path)) {
            MW_LOGE("getEdjPath fail");
            return;
        }
        apply(path.c_str());
    }
}

}

MwApp::MwApp() = default;

MwApp::~MwApp() = default;

bool MwApp::onCreate()
{
    _bindTextDomain();
    elm_app_base_scale_set(BASE_SCALE);
    _installEventHandlers();
    if (!MwResourceMgr::getInstance()->initialize()) {
        MW_LOGE("Failed to initialize app resource manager!");
        return false;
    }
    if (!_createWindow())
        return false;
    _setChangeableTableInfo();
    _setThemeExtension();
    _connectMediaContentDB();
    if (!_model)
        _model = std::make_unique<MwModel>();
    _model->setAppState(MwModel::APP_STATE_CREATED);
    if (!_appController)
        _appController = std::make_unique<MwAppController>();
    _requests = std::make_unique<MwLaunchRequests>(*_model);
    MwSystemMgr::getInstance()->initialize(_model.get());
    return true;
}

void MwApp::_bindTextDomain()
{
    const std::string resources = mwAdopt(app_get_resource_path());
    if (!resources.empty()) {
        bindtextdomain(TEXT_DOMAIN, (resources + "locale").c_str());
        bind_textdomain_codeset(TEXT_DOMAIN, "UTF-8");
    }
    textdomain(TEXT_DOMAIN);
}

void MwApp::_installEventHandlers()
{
    _languageChangedHandler.add(APP_EVENT_LANGUAGE_CHANGED, [this](app_event_info_h info) { _languageChanged(info); });
    _regionFormatChangedHandler.add(APP_EVENT_REGION_FORMAT_CHANGED, [](app_event_info_h) {
        MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::REGION_FORMAT_CHANGED);
    });
    _lowBatteryHandler.add(APP_EVENT_LOW_BATTERY, [this](app_event_info_h) { _lowBatteryEventCb(); });
}

void MwApp::_languageChanged(app_event_info_h info)
{
    char* text = nullptr;
    if (!MW_CALL(app_event_get_language, info, &text))
        return;
    const std::string language = mwAdopt(text);
    MW_LOGI("language changed - [%s]", language.c_str());
    // Also does what elm_language_set does, and falls back to English where there is no such translation.
    panekit::WLanguage::use(language);
    _renewTitle();
}

void MwApp::_renewTitle() { elm_win_title_set(getWindow()->getEvasObject(), mwTranslate("IDS_MW_APP_NAME").c_str()); }

bool MwApp::_createWindow()
{
    if (!attachWindow(std::make_unique<panekit::WWindowController>(WINDOW_NAME, WINDOW_TYPE))
        || !getWindow()->attachBaseViewController(new panekit::WNaviframeController)) {
        MW_LOGE("the window cannot be made");
        return false;
    }
    Evas_Object* window = getWindow()->getEvasObject();
    _renewTitle();
    elm_win_wm_rotation_preferred_rotation_set(window, 0);
    elm_win_indicator_mode_set(window, static_cast<Elm_Win_Indicator_Mode>(INDICATOR_SHOWN));
    elm_win_indicator_opacity_set(window, static_cast<Elm_Win_Indicator_Opacity_Mode>(INDICATOR_TRANSPARENT));
    elm_naviframe_prev_btn_auto_pushed_set(getWindow()->getBaseViewController()->getEvasObject(), EINA_FALSE);
    return true;
}

void MwApp::_setChangeableTableInfo()
{
    const std::string shared = mwAdopt(app_get_shared_resource_path());
    if (shared.empty()) {
        MW_LOGE("app_get_shared_resource_path fail");
        return;
    }
    _changeableColorTable
        = uxt_theme_add_color_table((shared + "tables/com.tovanic.mewlo-lite_ChangeableColorInfo.xml").c_str());
    if (_changeableColorTable == nullptr || uxt_theme_set_color_table(_changeableColorTable) != 0)
        MW_LOGE("uxt_theme_set_color_table failed");
    _changeableFontTable
        = uxt_theme_add_font_table((shared + "tables/com.tovanic.mewlo-lite_ChangeableFontInfo.xml").c_str());
    if (_changeableFontTable == nullptr || uxt_theme_set_font_table(_changeableFontTable) != 0)
        MW_LOGE("uxt_theme_set_font_table failed");
}

void MwApp::_unsetChangeableTableInfo()
{
    if (_changeableColorTable != nullptr)
        uxt_theme_delete_color_table(std::exchange(_changeableColorTable, nullptr));
    if (_changeableFontTable != nullptr)
        uxt_theme_delete_font_table(std::exchange(_changeableFontTable, nullptr));
}

void MwApp::_setThemeExtension()
{
    forEachThemeExtension([](const char* path) { elm_theme_extension_add(nullptr, path); });
}

void MwApp::_unsetThemeExtension()
{
    forEachThemeExtension([](const char* path) { elm_theme_extension_del(nullptr, path); });
}

void MwApp::_connectMediaContentDB()
{
    if (const int result = media_content_connect(); result != 0)
        MW_LOGE("media_content_connect() failed! [%d]", result);
}

void MwApp::_disconnectMediaContentDB()
{
    if (const int result = media_content_disconnect(); result != 0)
        MW_LOGE("media_content_disconnect() failed! [%d]", result);
}

void MwApp::onAppControl(app_control_h request, bool firstLaunch)
{
    MW_LOGI("BEGIN : first launch [%d]", firstLaunch);
    if (!_model) {
        MW_LOGE("_model is nullptr");
        return;
    }
    if (!_appController) {
        MW_LOGE("_appController is nullptr");
        return;
    }
    const bool records = _model->isStorageHeld();
    if (_requests->receive(request) == MwLaunchRequests::REFUSED && !records) {
        ui_app_exit();
        return;
    }
    if (firstLaunch)
        _launchFirst();
    MW_LOGI("END");
}

void MwApp::_launchFirst()
{
    MW_LOGI("First Launch");
    if (!_appController->initialize(_model.get(), getWindow())) {
        MW_LOGE("MwAppController initialize failed!");
        return;
    }
    _appController->getRecorderUpdatedSignal().addListener([this] { _requests->recorderUpdated(); });
    _appController->setRecordingsOpener([this] { _openRecordings(); });
    panekit::WNaviframeController* naviframe = getWindow()->getBaseViewController();
    naviframe->setOnLastItemPop([this] { return _lastItemPopped(); });
    naviframe->push(new MwRecorderContentViewController(_model.get(), _appController.get()));
    MwSystemMgr::getInstance()->registerEvent();
    if (_model->isRequestMode())
        return;
    _watchesStopRequests = MW_CALL(preference_set_changed_cb, STOP_PREFERENCE, _recordingStopRequestCb, this);
    _miniControllerMgr = std::make_unique<MwMiniControllerMgr>(_model.get(), _appController.get(), getWindow());
}

// After a stop and for the recordings button. A list that is open already follows by itself.
void MwApp::_openRecordings()
{
    panekit::WNaviframeController* naviframe = getWindow()->getBaseViewController();
    if (dynamic_cast<MwRecordingsContentViewController*>(naviframe->getTop()) == nullptr)
        naviframe->push(new MwRecordingsContentViewController(_model.get(), _appController.get()));
}

bool MwApp::_lastItemPopped()
{
    if (_model->isRequestMode()) {
        MW_LOGI("go to terminate");
        ui_app_exit();
        return true;
    }
    MW_LOGI("go to background");
    elm_win_lower(getWindow()->getEvasObject());
    return false;
}

void MwApp::onResume()
{
    _model->setAppState(MwModel::APP_STATE_RESUMED);
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::RESUME);
    if (_model->isRequestMode())
        _checkMainAppRecordingState();
    _rescueOnce();
}

void MwApp::_rescueOnce()
{
    if (_rescue)
        return;
    _rescue = std::make_unique<MwRecordingRescue>(*_model);
    // After the first frame.
    panekit::WTimer::addIdler([this](void*) {
        if (_rescue)
            _rescue->start();
        return false;
    });
}

void MwApp::onPause()
{
    _model->setAppState(MwModel::APP_STATE_PAUSED);
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::PAUSE);
}

void MwApp::onTerminate()
{
    WASSERT(_model);
    WASSERT(_appController);
    _rescue.reset();
    if (_mainAppRecordingPopup != nullptr)
        _mainAppRecordingPopup->destroy();
    if (_watchesStopRequests)
        MW_CALL(preference_unset_changed_cb, STOP_PREFERENCE, _recordingStopRequestCb);
    _model->setAppState(MwModel::APP_STATE_TERMINATED);
    _languageChangedHandler.remove();
    _regionFormatChangedHandler.remove();
    _lowBatteryHandler.remove();
    MwSystemMgr::getInstance()->setRejectCall(false);
    MwSystemMgr::getInstance()->unregisterEvent();
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::TERMINATE);
    _miniControllerMgr.reset();
    MwSystemMgr::getInstance()->deinitialize();
    getWindow()->destroy(); // the screens drop their listeners while the signals still exist
    _unsetChangeableTableInfo();
    _unsetThemeExtension();
    _disconnectMediaContentDB();
    MwSignalMgr::destroyInstance();
    MwSystemMgr::destroyInstance();
    MwResourceMgr::destroyInstance();
    _appController.reset();
    _requests.reset();
    _model.reset();
}

void MwApp::_checkMainAppRecordingState()
{
    if (MwModel::isMainInstanceRecording()) {
        MW_LOGI("main app state is recording. display check popup");
        if (_mainAppRecordingPopup == nullptr)
            _createMainAppRecordingPopup();
    } else if (_mainAppRecordingPopup != nullptr) {
        _mainAppRecordingPopup->destroy();
    }
}

void MwApp::_createMainAppRecordingPopup()
{
    using panekit::WPopupController;
    auto* popup = new WPopupController;
    _mainAppRecordingPopup = popup;
    popup->setTitle("IDS_MW_HEADER_UNABLE_TO_RECORD_VOICE_ABB");
    popup->setContent(
        "IDS_MW_POP_RECORDING_IS_IN_PROGRESS_THE_CURRENT_RECORDING_WILL_BE_SAVED_AND_A_NEW_RECORDING_WILL_BE_STARTED");
    popup->setOnDestroyed([this] { _mainAppRecordingPopup = nullptr; });
    popup->addButton("IDS_MW_BUTTON_CANCEL", [](WPopupController* self) {
        self->destroy();
        ui_app_exit();
    });
    popup->addButton("IDS_MW_BUTTON_OK", [](WPopupController* self) {
        self->destroy();
        MW_LOGI("request stop recording to main app");
        MW_CALL(preference_set_boolean, STOP_PREFERENCE, true);
    });
    popup->setOnBack([](WPopupController* self) { self->destroy(); });
    if (!popup->create(getWindow()->getEvasObject()))
        MW_LOGE("the popup cannot be made");
}

void MwApp::_recordingStopRequestCb(const char*, void* userData)
{
    auto* self = static_cast<MwApp*>(userData);
    if (self == nullptr || !self->_appController) {
        MW_LOGE("self is nullptr");
        return;
    }
    bool requested = false;
    if (preference_get_boolean(STOP_PREFERENCE, &requested) != 0 || !requested)
        return;
    MW_LOGI("request stop recording by sub app");
    // On the worker: the window does not wait for the save.
    self->_appController->dispatchCommandAsync(
        MwAppController::STOP_RECORDING,
        [](MwAppController::Command, MwAppController::Result result, void*) {
            if (result == MwAppController::SUCCESS)
                MW_LOGI("recording stop success");
            else
                MW_LOGE("STOP recording failed!!!");
        },
        nullptr);
}

void MwApp::_lowBatteryEventCb()
{
    MW_LOGW("BEGIN");
    if (!_model) {
        MW_LOGE("self->_model is nullptr");
        return;
    }
    if (!_appController) {
        MW_LOGE("self->_appController is nullptr");
        return;
    }
    int level = 0;
    if (const int result = vconf_get_int(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, &level); result != 0) {
        MW_LOGE("get low state %d", result);
        return;
    }
    if (level < LOWEST_ALLOWED_BATTERY)
        ui_app_exit();
    MW_LOGW("END");
}
