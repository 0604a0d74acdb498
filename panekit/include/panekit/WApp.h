#pragma once

#include <memory>

#include <app_control.h>

namespace panekit {

class WWindowController;

// The application object. start() runs the whole life of the process; the virtual operations are its steps, all on the
// main loop.
class WApp {
public:
    WApp() = default;
    virtual ~WApp() = default;
    WApp(const WApp&) = delete;
    WApp& operator=(const WApp&) = delete;

    int start(int argc, char** argv);

    // Creates the window and keeps the controller until the process ends.
    bool attachWindow(std::unique_ptr<WWindowController> window);
    [[nodiscard]] WWindowController* getWindow() const { return _window.get(); }

protected:
    virtual void onStart(int argc, char** argv);
    virtual bool onCreate();
    virtual void onTerminate();
    virtual void onPause();
    virtual void onResume();
    virtual void onAppControl(app_control_h request, bool firstLaunch);

private:
    void _terminate();
    std::unique_ptr<WWindowController> _window;
};

}
