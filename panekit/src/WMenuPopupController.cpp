#include <panekit/WMenuPopupController.h>

#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <eext_event.h>
#include <uxt_theme.h>

#include "PopupEnd.h"

namespace panekit {

struct WMenuPopupController::Impl {
    struct Item {
        std::string label;
        std::function<void()> action;
        WMenuPopupController* owner = nullptr;
    };

    Evas_Object* popup = nullptr;
    // Filled before create and then left alone: callbacks point into it.
    std::vector<Item> items;
    PopupEnd end;

    static void closeCb(void* data, Evas_Object* object, void* info);
    static void itemCb(void* data, Evas_Object* object, void* info);
    static void deletedCb(void* data, Evas* canvas, Evas_Object* object, void* info);
    Evas_Object* createList(WMenuPopupController* owner);
};

void WMenuPopupController::Impl::closeCb(void* data, Evas_Object*, void*)
{
    static_cast<WMenuPopupController*>(data)->destroy();
}

void WMenuPopupController::Impl::itemCb(void* data, Evas_Object*, void*)
{
    const auto* item = static_cast<Item*>(data);
    // The menu is gone before its action runs, which may open a popup in its place.
    const auto action = item->action;
    item->owner->destroy();
    if (action)
        action();
}

void WMenuPopupController::Impl::deletedCb(void* data, Evas*, Evas_Object*, void*)
{
    auto* self = static_cast<WMenuPopupController*>(data);
    self->_impl->popup = nullptr;
    self->_impl->end.tell();
    delete self;
}

Evas_Object* WMenuPopupController::Impl::createList(WMenuPopupController* owner)
{
    Evas_Object* box = elm_box_add(popup);
    for (Item& item : items) {
        item.owner = owner;
        Evas_Object* button = uxt_button_add_with_style(box, "mewlo/menu_item");
        elm_object_domain_translatable_part_text_set(button, nullptr, textdomain(nullptr), item.label.c_str());
        evas_object_size_hint_weight_set(button, EVAS_HINT_EXPAND, 0.0);
        evas_object_size_hint_align_set(button, EVAS_HINT_FILL, EVAS_HINT_FILL);
        evas_object_smart_callback_add(button, "clicked", itemCb, &item);
        elm_box_pack_end(box, button);
        evas_object_show(button);
    }
    evas_object_show(box);
    return box;
}

WMenuPopupController::WMenuPopupController()
    : _impl(std::make_unique<Impl>())
{
}

WMenuPopupController::~WMenuPopupController() = default;

void WMenuPopupController::addItem(std::string label, std::function<void()> action)
{
    if (!_impl->popup)
        _impl->items.push_back({std::move(label), std::move(action), this});
}

void WMenuPopupController::setOnDestroyed(std::function<void()> handler)
{
    _impl->end.onDestroyed = std::move(handler);
}

void WMenuPopupController::_setOnDetached(std::function<void()> handler) { _impl->end.onDetached = std::move(handler); }

bool WMenuPopupController::create(Evas_Object* window, Evas_Object*)
{
    if (_impl->popup || !window)
        return false;
    Evas_Object* popup = elm_popup_add(window);
    if (!popup)
        return false;
    _impl->popup = popup;
    elm_popup_align_set(popup, 0.5, 1.0);
    evas_object_event_callback_add(popup, EVAS_CALLBACK_DEL, Impl::deletedCb, this);
    evas_object_smart_callback_add(popup, "block,clicked", Impl::closeCb, this);
    eext_object_event_callback_add(popup, EEXT_CALLBACK_BACK, Impl::closeCb, this);
    eext_object_event_callback_add(popup, EEXT_CALLBACK_MORE, Impl::closeCb, this);
    elm_object_content_set(popup, _impl->createList(this));
    evas_object_show(popup);
    return true;
}

void WMenuPopupController::destroy()
{
    if (_impl->popup)
        return deletePopup(_impl->popup);
    _impl->end.tell();
    delete this;
}

Evas_Object* WMenuPopupController::getEvasObject() const { return _impl->popup; }

std::vector<std::string> WMenuPopupController::labels() const
{
    std::vector<std::string> labels;
    for (const Impl::Item& item : _impl->items)
        labels.push_back(item.label);
    return labels;
}

void WMenuPopupController::choose(size_t position)
{
    if (position < _impl->items.size())
        Impl::itemCb(&_impl->items[position], nullptr, nullptr);
}

}
