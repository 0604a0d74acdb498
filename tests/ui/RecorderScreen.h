#pragma once

#include <memory>

#include <panekit/WNaviframeController.h>

#include "FakeController.h"
#include "MwModel.h"
#include "MwRecorder.h"

class MwRecorderContentViewController;

namespace ui {

// The recorder screen in a window of its own, with a model and a controller that records nothing.
class RecorderScreen {
public:
    RecorderScreen(int width, int height);
    explicit RecorderScreen(bool requestMode = false, int sizeLimit = MwModel::NO_SIZE_LIMIT,
        int format = MwModel::FORMAT_MP4, int width = 360, int height = 640);
    ~RecorderScreen();
    RecorderScreen(const RecorderScreen&) = delete;
    RecorderScreen& operator=(const RecorderScreen&) = delete;

    MwModel model;
    Evas_Object* window = nullptr;
    Evas_Object* view = nullptr;
    panekit::WNaviframeController* naviframe = nullptr;

    // Sets the model and announces it as the controller does.
    void enter(MwRecorder::RecordingState state);
    // The button in a part, null when there is none.
    [[nodiscard]] Evas_Object* button(const char* part) const;
    void press(const char* part);
    [[nodiscard]] std::string text(const char* part) const;
    // Presses a key of the device.
    void back();
    void more();

private:
    void _build(int width, int height);
    bool _execute(MwAppController::Command command);
    std::unique_ptr<MwAppController> _controller;
};

}
