#pragma once

#include <functional>
#include <string>

#include <panekit/WViewController.h>

namespace panekit {

class WNaviframeController;
class WPopupController;
class WMenuPopupController;

// One screen of the naviframe. Owned by the naviframe from push until it is popped. Items and naviframes are passed as
// the toolkit's own objects (Elm_Object_Item* is an Evas_Object* here). Main loop only.
class WContentViewController : public WViewController {
public:
    const char* getClassName() const override;
    bool create(Evas_Object* parent, void* viewParam = nullptr) override;

    void setTitle(std::string titleId);
    [[nodiscard]] const std::string& getTitle() const { return _title; }
    [[nodiscard]] WNaviframeController* getNaviframe() const { return _naviframe; }
    // The screen's item in the naviframe, null before it is pushed. Borrowed.
    [[nodiscard]] Evas_Object* getNaviItem() const { return _item; }
    [[nodiscard]] Evas_Object* getWindow() const;
    [[nodiscard]] bool isTop() const;

    // Leaves the screen: pops it from its naviframe.
    void popOut();

    // One popup or menu may be attached to a screen; attaching closes the one before, and leaving the screen closes it.
    void attachPopup(WPopupController* popup);
    void attachPopup(WMenuPopupController* menu);
    void destroyAttachedPopup();
    [[nodiscard]] bool hasAttachedPopup() const;

    // Installs the more key and the title's more button.
    void setMoreButton(std::function<void()> handler);

    // The screen whose view is this object, null when there is none.
    static WContentViewController* fromView(Evas_Object* view);

protected:
    friend class WNaviframeController;
    ~WContentViewController() override;

    virtual void onSetContainerProperties();
    // Puts the view into the naviframe and answers its item.
    virtual Evas_Object* onPushToNaviframe(Evas_Object* naviframe);
    virtual void onPushed(Evas_Object* item);
    // Called when the screen is about to leave; true lets the naviframe drop it.
    virtual bool onPop();
    virtual void onBecomeTop();
    virtual void onSetAsPageContent();
    virtual void onSetMoreButton();
    // The screen is on top (again).
    virtual void onTop();

private:
    static void _moreKeyCb(void* data, Evas_Object* object, void* info);

    std::string _title;
    WNaviframeController* _naviframe = nullptr;
    Evas_Object* _item = nullptr;
    WPopupController* _popup = nullptr;
    WMenuPopupController* _menu = nullptr;
    std::function<void()> _moreHandler;
};

}
