#include "ScreenWindow.h"

#include <Elementary.h>

#include "MwSystemMgr.h"
#include "fakes/Fakes.h"
#include "support/Screen.h"

namespace ui {

ScreenWindow::ScreenWindow(int width, int height)
{
    fakes::reset();
    fakes::controller = {};
    fakes::controller.onCommand = [this](MwAppController::Command command) { return execute(command); };
    model.setAppState(MwModel::APP_STATE_RESUMED);
    MwSystemMgr::getInstance()->initialize(&model);
    _controller = std::make_unique<MwAppController>();
    window = elm_win_util_standard_add("test", "test");
    evas_object_resize(window, width, height);
    naviframe = new panekit::WNaviframeController;
    naviframe->create(window);
    elm_win_resize_object_add(window, naviframe->getEvasObject());
    evas_object_show(window);
}

ScreenWindow::~ScreenWindow() { close(); }

void ScreenWindow::close()
{
    if (!window)
        return;
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::TERMINATE);
    evas_object_del(std::exchange(window, nullptr));
    support::runFor(0.01);
    MwSystemMgr::getInstance()->deinitialize();
    MwSignalMgr::destroyInstance();
    MwSystemMgr::destroyInstance();
}

void ScreenWindow::back() { support::key(window, "Escape"); }

void ScreenWindow::more() { support::key(window, "Menu"); }

}
