#include "RecorderScreen.h"

#include <Elementary.h>

#include "MwRecorderContentViewController.h"
#include "support/Screen.h"

namespace ui {

RecorderScreen::RecorderScreen(int width, int height)
    : RecorderScreen(false, MwModel::NO_SIZE_LIMIT, MwModel::FORMAT_MP4, width, height)
{
}

RecorderScreen::RecorderScreen(bool requestMode, int sizeLimit, int format, int width, int height)
    : ScreenWindow(width, height)
{
    model.setRequestMode(requestMode);
    model.setSizeLimit(sizeLimit);
    model.setFileFormat(format);
    model.setCurrentRecordingFileName("Voice 001");
    model.setRecorderState(REC_STATE_READY);
    auto* screen = new MwRecorderContentViewController(&model, controller());
    naviframe->push(screen);
    view = screen->getEvasObject();
    support::settle(window);
}

bool RecorderScreen::execute(MwAppController::Command command)
{
    switch (command) {
    case MwAppController::START_RECORDING:
    case MwAppController::RESUME_RECORDING:
        enter(REC_STATE_RECORDING);
        return true;
    case MwAppController::PAUSE_RECORDING:
        enter(REC_STATE_PAUSED);
        return true;
    default:
        enter(REC_STATE_READY);
        return true;
    }
}

void RecorderScreen::enter(MwRecorder::RecordingState state)
{
    model.setRecorderState(state);
    controller()->getRecorderUpdatedSignal().emit();
}

Evas_Object* RecorderScreen::button(const char* part) const { return elm_object_part_content_get(view, part); }

void RecorderScreen::press(const char* part)
{
    support::settle(window);
    if (Evas_Object* found = button(part); found)
        support::click(found);
}

std::string RecorderScreen::text(const char* part) const { return support::text(view, part); }

}
