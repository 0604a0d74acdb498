#pragma once

#include "MwRecorder.h"
#include "ScreenWindow.h"

namespace ui {

// The recorder screen.
class RecorderScreen : public ScreenWindow {
public:
    RecorderScreen(int width, int height);
    explicit RecorderScreen(bool requestMode = false, int sizeLimit = MwModel::NO_SIZE_LIMIT,
        int format = MwModel::FORMAT_MP4, int width = 360, int height = 640);

    Evas_Object* view = nullptr;

    // Sets the model and announces it as the controller does.
    void enter(MwRecorder::RecordingState state);
    // The button in a part, null when there is none.
    [[nodiscard]] Evas_Object* button(const char* part) const;
    void press(const char* part);
    [[nodiscard]] std::string text(const char* part) const;

protected:
    bool execute(MwAppController::Command command) override;
};

}
