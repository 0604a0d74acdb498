#pragma once

#include <memory>
#include <string>

#include <panekit/WNaviframeController.h>

#include "FakeController.h"
#include "MwModel.h"
#include "MwSignalMgr.h"

namespace ui {

// A window of its own for screens, with a model and a controller that records and plays nothing.
class ScreenWindow {
public:
    ScreenWindow(const ScreenWindow&) = delete;
    ScreenWindow& operator=(const ScreenWindow&) = delete;

    MwModel model;
    Evas_Object* window = nullptr;
    panekit::WNaviframeController* naviframe = nullptr;

    [[nodiscard]] MwAppController* controller() const { return _controller.get(); }
    // Presses a key of the device.
    void back();
    void more();

protected:
    ScreenWindow(int width, int height);
    virtual ~ScreenWindow();
    // Ends the application and its window, while what the screens need is still there.
    void close();
    // Answers whether a command succeeds; does to the model what the controller does.
    virtual bool execute(MwAppController::Command command) = 0;

private:
    std::unique_ptr<MwAppController> _controller;
};

}
