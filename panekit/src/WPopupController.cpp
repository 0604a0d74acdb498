#include <panekit/WPopupController.h>

#include <algorithm>
#include <array>
#include <libintl.h>
#include <utility>
#include <vector>

#include <Elementary.h>

#include <eext_event.h>
#include <uxt_theme.h>

#include "PopupEnd.h"

namespace panekit {

namespace {

    constexpr std::array<const char*, 3> BUTTON_PARTS = {"button1", "button2", "button3"};

    // Open popups in the order of opening.
    std::vector<WPopupController*>& openPopups()
    {
        static std::vector<WPopupController*> popups;
        return popups;
    }

    void setText(Evas_Object* object, const char* part, const std::string& text, WPopupController::Text kind)
    {
        if (kind == WPopupController::Text::Translatable)
            elm_object_domain_translatable_part_text_set(object, part, textdomain(nullptr), text.c_str());
        else
            elm_object_part_text_set(object, part, text.c_str());
    }

}

struct WPopupController::Impl {
    struct Label {
        std::string text;
        Text kind = Text::Translatable;
    };
    struct Button {
        Label label;
        Handler handler;
        WPopupController* owner = nullptr;
    };

    Evas_Object* popup = nullptr;
    Label title;
    Label text;
    ContentBuilder content;
    std::string style;
    // Filled before create and then left alone: callbacks point into it.
    std::vector<Button> buttons;
    Handler onBack;
    PopupEnd end;

    static void backCb(void* data, Evas_Object* object, void* info);
    static void buttonCb(void* data, Evas_Object* object, void* info);
    static void deletedCb(void* data, Evas* canvas, Evas_Object* object, void* info);
    void addTexts();
    void addButtons(WPopupController* owner);
};

void WPopupController::Impl::backCb(void* data, Evas_Object*, void*)
{
    auto* self = static_cast<WPopupController*>(data);
    if (const Handler handler = self->_impl->onBack; handler)
        return handler(self);
    self->destroy();
}

void WPopupController::Impl::buttonCb(void* data, Evas_Object*, void*)
{
    auto* button = static_cast<Button*>(data);
    WPopupController* owner = button->owner;
    // The handler may destroy the popup, and the button with it, while it runs.
    if (const Handler handler = button->handler; handler)
        return handler(owner);
    owner->destroy();
}

void WPopupController::Impl::deletedCb(void* data, Evas*, Evas_Object*, void*)
{
    auto* self = static_cast<WPopupController*>(data);
    self->_impl->popup = nullptr;
    std::erase(openPopups(), self);
    self->_impl->end.tell();
    delete self;
}

void WPopupController::Impl::addTexts()
{
    if (!title.text.empty())
        setText(popup, "title,text", title.text, title.kind);
    if (Evas_Object* view = content ? content(popup) : nullptr; view)
        elm_object_content_set(popup, view);
    else if (!text.text.empty())
        setText(popup, nullptr, text.text, text.kind);
}

void WPopupController::Impl::addButtons(WPopupController* owner)
{
    for (size_t i = 0; i < std::min(buttons.size(), BUTTON_PARTS.size()); ++i) {
        buttons[i].owner = owner;
        Evas_Object* button = uxt_button_add_with_style(popup, "popup");
        setText(button, nullptr, buttons[i].label.text, buttons[i].label.kind);
        elm_object_part_content_set(popup, BUTTON_PARTS[i], button);
        evas_object_smart_callback_add(button, "clicked", buttonCb, &buttons[i]);
    }
}

WPopupController::WPopupController()
    : _impl(std::make_unique<Impl>())
{
}

WPopupController::~WPopupController() = default;

void WPopupController::setTitle(std::string title, Text kind) { _impl->title = {std::move(title), kind}; }

void WPopupController::setContent(std::string text, Text kind) { _impl->text = {std::move(text), kind}; }

void WPopupController::setContent(ContentBuilder builder) { _impl->content = std::move(builder); }

void WPopupController::setStyle(std::string style) { _impl->style = std::move(style); }

void WPopupController::addButton(std::string label, Handler handler, Text kind)
{
    if (!_impl->popup)
        _impl->buttons.push_back({{std::move(label), kind}, std::move(handler), this});
}

void WPopupController::setOnBack(Handler handler) { _impl->onBack = std::move(handler); }

void WPopupController::setOnDestroyed(std::function<void()> handler) { _impl->end.onDestroyed = std::move(handler); }

void WPopupController::_setOnDetached(std::function<void()> handler) { _impl->end.onDetached = std::move(handler); }

bool WPopupController::create(Evas_Object* window)
{
    if (_impl->popup || !window)
        return false;
    Evas_Object* popup = elm_popup_add(window);
    if (!popup)
        return false;
    _impl->popup = popup;
    // Styles that the theme does not know would leave the popup without a layout: "theme_bg" is the default look here.
    if (!_impl->style.empty() && _impl->style != "theme_bg")
        elm_object_style_set(popup, _impl->style.c_str());
    elm_popup_align_set(popup, 0.5, 1.0);
    openPopups().push_back(this);
    evas_object_event_callback_add(popup, EVAS_CALLBACK_DEL, Impl::deletedCb, this);
    eext_object_event_callback_add(popup, EEXT_CALLBACK_BACK, Impl::backCb, this);
    // Taken so that the menu of the screen below stays closed.
    eext_object_event_callback_add(
        popup, EEXT_CALLBACK_MORE, [](void*, Evas_Object*, void*) {}, this);
    _impl->addTexts();
    _impl->addButtons(this);
    evas_object_show(popup);
    return true;
}

void WPopupController::destroy()
{
    if (_impl->popup)
        return deletePopup(_impl->popup);
    _impl->end.tell();
    delete this;
}

Evas_Object* WPopupController::getEvasObject() const { return _impl->popup; }

void WPopupController::press(size_t button)
{
    if (_impl->popup && button < _impl->buttons.size())
        Impl::buttonCb(&_impl->buttons[button], nullptr, nullptr);
}

WPopupController* WPopupController::topmost() { return openPopups().empty() ? nullptr : openPopups().back(); }

}
