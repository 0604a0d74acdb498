#include <panekit/WContentViewController.h>

#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <eext_event.h>
#include <panekit/WAccessibility.h>
#include <panekit/WMenuPopupController.h>
#include <panekit/WNaviframeController.h>
#include <panekit/WPopupController.h>
#include <uxt_theme.h>

namespace panekit {

namespace {

    constexpr auto SCREEN_KEY = "panekit.screen";
    constexpr auto MORE_PART = "more_button";
    constexpr auto TITLE_MORE_PART = "title_more_btn";

}

// A popup that outlives the screen for a moment, while their window goes, must not report to it any more.
WContentViewController::~WContentViewController()
{
    if (_popup)
        _popup->_setOnDetached(nullptr);
    if (_menu)
        _menu->_setOnDetached(nullptr);
}

const char* WContentViewController::getClassName() const { return "WContentViewController"; }

bool WContentViewController::create(Evas_Object* parent, void* viewParam)
{
    if (!WViewController::create(parent, viewParam))
        return false;
    evas_object_data_set(getEvasObject(), SCREEN_KEY, this);
    return true;
}

void WContentViewController::setTitle(std::string titleId)
{
    _title = std::move(titleId);
    if (_item)
        _setItemTitle();
}

void WContentViewController::_setItemTitle()
{
    if (!_title.empty())
        elm_object_item_domain_translatable_part_text_set(_item, nullptr, textdomain(nullptr), _title.c_str());
}

Evas_Object* WContentViewController::getWindow() const
{
    // The parent chain of widgets walks on into a parent window; stop at the first window.
    Evas_Object* widget = getEvasObject();
    while (widget && !evas_object_smart_type_check(widget, "elm_win"))
        widget = elm_object_parent_widget_get(widget);
    return widget;
}

bool WContentViewController::isTop() const { return _naviframe && _naviframe->getTop() == this; }

void WContentViewController::popOut()
{
    if (_naviframe)
        _naviframe->pop(this);
}

void WContentViewController::attachPopup(WPopupController* popup)
{
    destroyAttachedPopup();
    _popup = popup;
    if (popup)
        popup->_setOnDetached([this] { _popup = nullptr; });
}

void WContentViewController::attachPopup(WMenuPopupController* menu)
{
    destroyAttachedPopup();
    _menu = menu;
    if (menu)
        menu->_setOnDetached([this] { _menu = nullptr; });
}

void WContentViewController::destroyAttachedPopup()
{
    if (auto* popup = std::exchange(_popup, nullptr); popup) {
        popup->_setOnDetached(nullptr);
        popup->destroy();
    }
    if (auto* menu = std::exchange(_menu, nullptr); menu) {
        menu->_setOnDetached(nullptr);
        menu->destroy();
    }
}

bool WContentViewController::hasAttachedPopup() const { return _popup || _menu; }

void WContentViewController::setMoreButton(std::function<void()> handler)
{
    if (!getEvasObject())
        return;
    if (!_moreHandler)
        eext_object_event_callback_add(getEvasObject(), EEXT_CALLBACK_MORE, _moreKeyCb, this);
    _moreHandler = std::move(handler);

    Evas_Object* button = uxt_button_add_with_style(getEvasObject(), "mewlo/title/more");
    evas_object_smart_callback_add(button, "clicked", _moreKeyCb, this);
    setAccessibleName(button, "IDS_MW_BUTTON_MORE");
    // A click or touch leaves the keyboard where it was.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_show(button);
    if (elm_layout_content_set(getEvasObject(), MORE_PART, button))
        return;
    if (_item)
        elm_object_item_part_content_set(_item, TITLE_MORE_PART, button);
    if (!_item || elm_object_item_part_content_get(_item, TITLE_MORE_PART) != button)
        evas_object_del(button);
}

void WContentViewController::_moreKeyCb(void* data, Evas_Object*, void*)
{
    const auto* self = static_cast<WContentViewController*>(data);
    // The handler may end the screen and itself with it.
    if (const auto handler = self->_moreHandler; handler)
        handler();
}

WContentViewController* WContentViewController::fromView(Evas_Object* view)
{
    return view ? static_cast<WContentViewController*>(evas_object_data_get(view, SCREEN_KEY)) : nullptr;
}

void WContentViewController::onDeleteView(Evas_Object* view)
{
    destroyAttachedPopup();
    evas_object_data_del(view, SCREEN_KEY);
    Elm_Object_Item* item = std::exchange(_item, nullptr);
    if (!item)
        return evas_object_del(view);
    elm_object_item_part_content_unset(item, "elm.swallow.content");
    elm_object_item_del(item);
    evas_object_del(view);
}

void WContentViewController::onSetContainerProperties() { }

Evas_Object* WContentViewController::onPushToNaviframe(Evas_Object* naviframe)
{
    return elm_naviframe_item_push(naviframe, nullptr, nullptr, nullptr, getEvasObject(), nullptr);
}

void WContentViewController::onPushed(Evas_Object*) { }

bool WContentViewController::onPop() { return true; }

void WContentViewController::onBecomeTop() { }

void WContentViewController::onSetAsPageContent() { }

void WContentViewController::onSetMoreButton() { }

void WContentViewController::onTop() { }

}
