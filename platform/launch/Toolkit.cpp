#include "launch/Toolkit.h"

#include <Efreet.h>
#include <Elementary.h>

#include <cstdlib>
#include <string>

#include "host/DisplayServer.h"

namespace platform {

namespace {

    Evas_Object*& window()
    {
        static Evas_Object* current = nullptr;
        return current;
    }

    void windowGoneCb(void*, Evas*, Evas_Object*, void*) { window() = nullptr; }

    void setDefault(const char* name, const char* value) { ::setenv(name, value, 0); }

}

void prepareToolkitEnvironment()
{
    setDefault("ECORE_NO_SYSTEM_MODULES", "1"); // they speak to the system bus on their own, noisily
    if (const std::string server = host::displayServer(); !server.empty())
        ::setenv("ELM_DISPLAY", server.c_str(), 1); // also where it is set, but empty
}

bool startToolkit(int argc, char** argv)
{
    efreet_cache_disable(); // starts a daemon for the menu index otherwise
    return elm_init(argc, argv) > 0;
}

void stopToolkit()
{
    setMainWindow(nullptr);
    elm_shutdown();
}

void setMainWindow(void* next)
{
    if (window() != nullptr)
        evas_object_event_callback_del(window(), EVAS_CALLBACK_DEL, windowGoneCb);
    window() = static_cast<Evas_Object*>(next);
    if (window() != nullptr)
        evas_object_event_callback_add(window(), EVAS_CALLBACK_DEL, windowGoneCb, nullptr);
}

void* mainWindow() { return window(); }

void raiseMainWindow()
{
    if (window() == nullptr)
        return;
    evas_object_show(window());
    elm_win_raise(window());
    elm_win_activate(window());
}

}
