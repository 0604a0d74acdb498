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

    // Installs the more key and a more button: in the view's own part "more_button" when its layout has one, else in
    // the title's part "title_more_btn".
    void setMoreButton(std::function<void()> handler);

    // The screen whose view is this object, null when there is none.
    static WContentViewController* fromView(Evas_Object* view);

protected:
    friend class WNaviframeController;
    ~WContentViewController() override;
    void onDeleteView(Evas_Object* view) override;

    virtual void onSetContainerProperties();
    // Puts the view into the naviframe and answers its item.
    virtual Evas_Object* onPushToNaviframe(Evas_Object* naviframe);
    virtual void onPushed(Evas_Object* item);
    // Called when the screen is about to leave; true lets the naviframe drop it.
    virtual bool onPop();
    // The screen has been pushed or uncovered.
    virtual void onBecomeTop();
    virtual void onSetAsPageContent();
    virtual void onSetMoreButton();
    // The screen above this one has been left.
    virtual void onTop();

private:
    static void _moreKeyCb(void* data, Evas_Object* object, void* info);
    void _setItemTitle();

    std::string _title;
    WNaviframeController* _naviframe = nullptr;
    Evas_Object* _item = nullptr;
    WPopupController* _popup = nullptr;
    WMenuPopupController* _menu = nullptr;
    std::function<void()> _moreHandler;
};

}
