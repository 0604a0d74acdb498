#pragma once

#include <Ecore.h>
#include <Ecore_File.h>
#include <media_content.h>
#include <panekit/WWindowController.h>

#include <chrono>

#include "MwAppController.h"
#include "MwModel.h"
#include "MwSystemMgr.h"

namespace bench {

// Model, controller and services without a window.
class Engines {
public:
    Engines()
    {
        ecore_init();
        ecore_file_init();
        media_content_connect();
        model.setRequestMode(true); // leaves the published state of a running recorder alone
        model.setAppState(MwModel::APP_STATE_RESUMED);
        MwSystemMgr::getInstance()->initialize(&model);
        controller.initialize(&model, &_window);
    }
    ~Engines()
    {
        controller.deinitialize();
        MwSystemMgr::getInstance()->deinitialize();
        media_content_disconnect();
        ecore_file_shutdown();
        ecore_shutdown();
    }
    Engines(const Engines&) = delete;
    Engines& operator=(const Engines&) = delete;

    MwModel model;
    MwAppController controller;

private:
    panekit::WWindowController _window{"bench", 0};
};

inline double milliseconds()
{
    using namespace std::chrono;
    return duration<double, std::milli>(steady_clock::now().time_since_epoch()).count();
}

}
