#include "RecorderScreen.h"

#include <Elementary.h>

#include "MwRecorderContentViewController.h"
#include "MwSignalMgr.h"
#include "MwSystemMgr.h"
#include "fakes/Fakes.h"
#include "support/Screen.h"

namespace ui {

RecorderScreen::RecorderScreen(int width, int height)
    : RecorderScreen(false, MwModel::NO_SIZE_LIMIT, MwModel::FORMAT_MP4, width, height)
{
}

RecorderScreen::RecorderScreen(bool requestMode, int sizeLimit, int format, int width, int height)
{
    fakes::reset();
    fakes::controller = {};
    fakes::controller.onCommand = [this](MwAppController::Command command) { return _execute(command); };
    model.setRequestMode(requestMode);
    model.setSizeLimit(sizeLimit);
    model.setFileFormat(format);
    model.setCurrentRecordingFileName("Voice 001");
    model.setAppState(MwModel::APP_STATE_RESUMED);
    model.setRecorderState(MwRecorder::REC_STATE_READY);
    MwSystemMgr::getInstance()->initialize(&model);
    _controller = std::make_unique<MwAppController>();
    _build(width, height);
}

void RecorderScreen::_build(int width, int height)
{
    window = elm_win_util_standard_add("test", "test");
    evas_object_resize(window, width, height);
    naviframe = new panekit::WNaviframeController;
    naviframe->create(window);
    elm_win_resize_object_add(window, naviframe->getEvasObject());
    evas_object_show(window);
    auto* screen = new MwRecorderContentViewController(&model, _controller.get());
    naviframe->push(screen);
    view = screen->getEvasObject();
    support::settle(window);
}

RecorderScreen::~RecorderScreen()
{
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::TERMINATE);
    evas_object_del(window);
    support::runFor(0.01);
    MwSystemMgr::getInstance()->deinitialize();
    MwSignalMgr::destroyInstance();
    MwSystemMgr::destroyInstance();
}

// What the controller does to the model.
bool RecorderScreen::_execute(MwAppController::Command command)
{
    switch (command) {
    case MwAppController::START_RECORDING:
    case MwAppController::RESUME_RECORDING:
        enter(MwRecorder::REC_STATE_RECORDING);
        return true;
    case MwAppController::PAUSE_RECORDING:
        enter(MwRecorder::REC_STATE_PAUSED);
        return true;
    default:
        enter(MwRecorder::REC_STATE_READY);
        return true;
    }
}

void RecorderScreen::enter(MwRecorder::RecordingState state)
{
    model.setRecorderState(state);
    _controller->getRecorderUpdatedSignal().emit();
}

Evas_Object* RecorderScreen::button(const char* part) const { return elm_object_part_content_get(view, part); }

void RecorderScreen::press(const char* part)
{
    support::settle(window);
    if (Evas_Object* found = button(part); found)
        support::click(found);
}

std::string RecorderScreen::text(const char* part) const { return support::text(view, part); }

void RecorderScreen::back() { support::key(window, "Escape"); }

void RecorderScreen::more() { support::key(window, "Menu"); }

}
