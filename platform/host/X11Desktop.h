// What the X11 desktop says about screens and windows. Main loop only; only while the toolkit shows windows on X11.
#pragma once

#include <Ecore.h>
#include <Ecore_X.h>

#include <functional>
#include <vector>

namespace host {

struct ScreenArea {
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
};

class X11Desktop {
public:
    // Told when something may be different: windows, their states, the desktop shown, screens, panels.
    explicit X11Desktop(std::function<void()> changed);
    ~X11Desktop();
    X11Desktop(const X11Desktop&) = delete;
    X11Desktop& operator=(const X11Desktop&) = delete;

    // What panels leave free of the monitor with the pointer.
    static ScreenArea workArea();
    // Whether a window is on the screen for its user: neither minimised nor withdrawn nor on another desktop.
    static bool isInView(Ecore_X_Window window);
    // Whether the active window fills a screen, and is of another process.
    [[nodiscard]] bool isCoveredByFullScreen() const;

    // A window that the desktop leaves alone: above others, on all desktops, in no list of windows, not focused when it
    // comes. To be called before each time it is shown, for a window manager forgets when it goes.
    static void makeAccessory(Ecore_X_Window window);

private:
    static Eina_Bool _propertyCb(void* self, int type, void* event);
    static Eina_Bool _screenCb(void* self, int type, void* event);
    void _followActive();

    std::function<void()> _changed;
    Ecore_X_Window _active = 0; // followed for its states
    std::vector<Ecore_Event_Handler*> _handlers;
};

}
