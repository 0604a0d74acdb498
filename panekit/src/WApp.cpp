#include <panekit/WApp.h>

#include <utility>

#include <app.h>
#include <panekit/WLanguage.h>
#include <panekit/WWindowController.h>

namespace panekit {

int WApp::start(int argc, char** argv)
{
    WLanguage::initialize();
    onStart(argc, argv);
    const ui_app_lifecycle_s lifecycle = {
        .create = [](void* self) { return static_cast<WApp*>(self)->onCreate(); },
        .control
        = [](app_control_h request, bool first, void* self) { static_cast<WApp*>(self)->onAppControl(request, first); },
        .pause = [](void* self) { static_cast<WApp*>(self)->onPause(); },
        .resume = [](void* self) { static_cast<WApp*>(self)->onResume(); },
        .terminate = [](void* self) { static_cast<WApp*>(self)->_terminate(); },
    };
    return ui_app_main(argc, argv, &lifecycle, this);
}

// The window goes while the toolkit still runs.
void WApp::_terminate()
{
    onTerminate();
    _window.reset();
}

bool WApp::attachWindow(std::unique_ptr<WWindowController> window)
{
    if (!window || !window->create())
        return false;
    _window = std::move(window);
    return true;
}

void WApp::onStart(int, char**) { }

bool WApp::onCreate() { return true; }

void WApp::onTerminate() { }

void WApp::onPause() { }

void WApp::onResume() { }

void WApp::onAppControl(app_control_h, bool) { }

}
