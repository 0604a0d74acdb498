#pragma once

#include <functional>
#include <memory>

#include <panekit/WContentViewController.h>

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

protected:
    ~MwContentViewController() override;
    Evas_Object* onPushToNaviframe(Evas_Object* naviframe) override;
    bool onPop() override;

    // Needs the view; an empty handler is only stored.
    void setBackKeyHandler(std::function<void()> handler);
    // Expires with the screen: what may come back later holds it and gives up when it is gone.
    [[nodiscard]] std::weak_ptr<void> token() const { return _token; }

private:
    static void _backKeyCb(void* data, Evas_Object* object, void* info);

    MwModel* _model;
    MwAppController* _appController;
    std::function<void()> _backKeyHandler;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
