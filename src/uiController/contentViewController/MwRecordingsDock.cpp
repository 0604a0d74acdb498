#include "MwRecordingsDock.h"

#include <utility>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <panekit/WTimer.h>
#include <uxt_theme.h>

#include "MwAppController.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwPartImage.h"
#include "MwPlayViewController.h"
#include "MwRecordingsMode.h"
#include "MwResourceMgr.h"
#include "MwSignalMgr.h"
#include "MwTrimViewController.h"

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto RECORD_CONTROLLER_GROUP = "record_controller";
constexpr auto CONTROLLER_PART = "elm.swallow.controller";
constexpr auto RECORD_PART = "record_button";

}

MwRecordingsDock::MwRecordingsDock(Evas_Object* layout, MwModel* model, MwAppController* appController, Screen screen)
    : _layout(layout)
    , _model(model)
    , _appController(appController)
    , _screen(std::move(screen))
{
}

void MwRecordingsDock::update(const MwRecordingsMode& mode)
{
    if (!mode.plays)
        return clear();
    if (_model->isTrimMode())
        return _createTrimViewController();
    if (_trimView)
        clear();
    if (!_model->getCurrentPlayPath().empty())
        return _createPlayViewController();
    if (_playView)
        clear();
    createRecordController();
}

void MwRecordingsDock::createRecordController()
{
    if (elm_object_part_content_get(_layout, CONTROLLER_PART))
        return;
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return;
    }
    Evas_Object* layout = elm_layout_add(_layout);
    elm_layout_file_set(layout, path.c_str(), RECORD_CONTROLLER_GROUP);
    Evas_Object* button = uxt_button_add_with_style(layout, "mewlo/circle_button/large");
    mwSetPartImage(button, "elm.icon.normal", "mainView/voice_btn_rec.png", "AO014");
    mwSetPartImage(button, "elm.icon.bg", "mainView/voice_btn_bg_rec.png", "AO001");
    panekit::setAccessibleName(button, "IDS_MW_BODY_RECORD");
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    const auto clicked
        = [](void* data, Evas_Object*, void*) { static_cast<MwRecordingsDock*>(data)->_clickRecordButton(); };
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    elm_object_part_content_set(layout, RECORD_PART, button);
    elm_object_part_content_set(_layout, CONTROLLER_PART, layout);
    evas_object_show(layout);
}

void MwRecordingsDock::_clickRecordButton()
{
    const auto finished
        = [this, alive = std::weak_ptr<void>(_token)](MwAppController::Command, MwAppController::Result result, void*) {
              if (result != MwAppController::SUCCESS)
                  MW_LOGE("START_RECORDING failed");
              else if (!alive.expired())
                  _screen.recordingStarted();
          };
    if (!_appController->dispatchCommandAsync(MwAppController::START_RECORDING, finished, nullptr))
        MW_LOGE("START_RECORDING failed");
}

void MwRecordingsDock::clear()
{
    _playView = nullptr;
    _trimView = nullptr;
    if (Evas_Object* content = elm_object_part_content_unset(_layout, CONTROLLER_PART); content)
        evas_object_del(content);
    _announcePlayViewClosed();
}

void MwRecordingsDock::forget()
{
    _trimView = nullptr;
    if (std::exchange(_playView, nullptr))
        _announcePlayViewClosed();
}

bool MwRecordingsDock::isEmpty() const { return !elm_object_part_content_get(_layout, CONTROLLER_PART); }

bool MwRecordingsDock::takeKey(const std::string& key) { return _playView && _playView->takeKey(key); }

bool MwRecordingsDock::takeBack()
{
    if (_trimView)
        _trimView->back();
    return _trimView != nullptr;
}

void MwRecordingsDock::_announcePlayViewClosed()
{
    if (!_model->isPlayViewShown())
        return;
    _model->setPlayViewShown(false);
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals)
        signals->getPlayViewClosedSignal().emit();
}

void MwRecordingsDock::_createPlayViewController()
{
    if (_playView)
        return;
    clear();
    _playView = new MwPlayViewController(_model, _appController);
    _playView->getEventSignal().addListener([this](MwPlayViewController::eventType type) { _playViewEvent(type); });
    if (!_playView->dock(_layout, MwPlayViewController::REPORTS_FILE_CHANGES))
        return std::exchange(_playView, nullptr)->destroy();
    _model->setPlayViewShown(true);
}

void MwRecordingsDock::_createTrimViewController()
{
    if (_trimView)
        return;
    clear();
    _trimView = new MwTrimViewController(_model, _appController);
    _trimView->getEventSignal().addListener([this](MwTrimViewController::eventType type) { _trimViewEvent(type); });
    if (!_trimView->dock(_layout)) {
        _model->setTrimMode(false);
        std::exchange(_trimView, nullptr)->destroy();
    }
}

void MwRecordingsDock::_trimViewEvent(int event)
{
    const bool saved = event == MwTrimViewController::TRIM_VIEW_EVENT_SAVED;
    if (!saved && event != MwTrimViewController::TRIM_VIEW_EVENT_CLOSE) {
        MW_LOGE("invalid eventType");
        return;
    }
    _model->setTrimMode(false);
    _later([this, saved] { _screen.trimEnded(saved); });
}

void MwRecordingsDock::_playViewEvent(int event)
{
    switch (event) {
    case MwPlayViewController::BOOKMARK_ADDED:
        return _screen.bookmarkAdded();
    case MwPlayViewController::FILE_CHANGED:
        return _screen.fileChanged();
    case MwPlayViewController::TRIM_REQUESTED:
        return _later([this] { _screen.trimRequested(); });
    default:
        MW_LOGE("invalid eventType");
    }
}

void MwRecordingsDock::_later(const std::function<void()>& call)
{
    panekit::WTimer::addJob([call, alive = std::weak_ptr<void>(_token)](void*) {
        if (!alive.expired())
            call();
    });
}
