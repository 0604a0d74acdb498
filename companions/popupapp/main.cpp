// Asks before a recording is thrown away from outside the recorder's window. Replies that it was confirmed (0), or that
// the recording goes on (-1), which is also what a closed window and an ended process say.
#include <app.h>
#include <panekit/WPopupController.h>
#include <panekit/WWindowController.h>

#include "CompanionWindow.h"

namespace {

constexpr int WIDTH = 660; // design units
constexpr int HEIGHT = 440;

class PopupApp : public CompanionWindow {
public:
    PopupApp()
        : CompanionWindow("com.tovanic.mewlo-lite.popupapp", "IDS_MW_HEADER_DISCARD_RECORDING_ABB3", WIDTH, HEIGHT)
    {
    }

protected:
    void onAppControl(app_control_h request, bool) override
    {
        _reply(APP_CONTROL_RESULT_FAILED); // another question takes the place of this one
        app_control_clone(&_request, request);
        if (_isAsking)
            return;
        _isAsking = true;
        auto* popup = new panekit::WPopupController;
        popup->setTitle("IDS_MW_HEADER_DISCARD_RECORDING_ABB3");
        popup->setContent("IDS_MW_POP_RECORDING_WILL_BE_STOPPED_AND_THE_FILE_WILL_BE_DISCARDED");
        popup->addButton("IDS_MW_BUTTON_CANCEL", [this](auto*) { _answer(APP_CONTROL_RESULT_FAILED); });
        popup->addButton("IDS_MW_BUTTON_DISCARD_ABB3", [this](auto*) { _answer(APP_CONTROL_RESULT_SUCCEEDED); });
        popup->setOnBack([this](auto*) { _answer(APP_CONTROL_RESULT_FAILED); });
        popup->create(getWindow()->getEvasObject());
    }

    void onTerminate() override { _reply(APP_CONTROL_RESULT_FAILED); }

private:
    void _answer(app_control_result_e result)
    {
        _reply(result);
        ui_app_exit();
    }
    void _reply(app_control_result_e result)
    {
        if (_request == nullptr)
            return;
        app_control_reply_to_launch_request(nullptr, _request, result);
        app_control_destroy(_request);
        _request = nullptr;
    }

    app_control_h _request = nullptr;
    bool _isAsking = false;
};

}

int main(int argc, char** argv)
{
    PopupApp app;
    return app.start(argc, argv);
}
