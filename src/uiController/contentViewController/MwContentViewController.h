#pragma once

#include <functional>
#include <memory>

#include <panekit/WContentViewController.h>

#include "MwSignalMgr.h"

class MwAppController;
class MwModel;

// The base of all screens: knows the model and the controller (both borrowed for the life of the application) and one
// handler for the back key. Main loop only.
class MwContentViewController : public panekit::WContentViewController {
public:
    MwContentViewController(MwModel* model, MwAppController* appController);

    const char* getClassName() const override;

    [[nodiscard]] MwModel* getModel() const { return _model; }
    [[nodiscard]] MwAppController* getAppController() const { return _appController; }
    // A title that is no string identifier: the number of selected rows.
    void setCountTitle(size_t count);

protected:
    ~MwContentViewController() override;
    Evas_Object* onPushToNaviframe(Evas_Object* naviframe) override;
    bool onPop() override;

    // Needs the view; an empty handler is only stored.
    void setBackKeyHandler(std::function<void()> handler);
    // Hears of changes in the device until the screen goes or the application ends: then the signals and the controller
    // are gone, while the screen may still wait for its window.
    void listenToSystemInfo(std::function<void(MwSignalMgr::SystemInfo)> listener);
    // Expires with the screen: what may come back later holds it and gives up when it is gone.
    [[nodiscard]] std::weak_ptr<void> token() const { return _token; }

private:
    void _stopListening();
    static void _backKeyCb(void* data, Evas_Object* object, void* info);

    MwModel* _model;
    MwAppController* _appController;
    std::function<void()> _backKeyHandler;
    unsigned int _systemInfoListener = 0;
    unsigned int _lifeCycleListener = 0;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
