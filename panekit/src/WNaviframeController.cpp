#include <panekit/WNaviframeController.h>

#include <utility>

#include <Elementary.h>

#include <panekit/WContentViewController.h>
#include <panekit/WWindowController.h>

namespace panekit {

namespace {

    // Screens leave through popOut() only, so that the last-item rule and the screen's own onPop are always asked.
    Eina_Bool refusePop(void*, Elm_Object_Item*) { return EINA_FALSE; }

}

const char* WNaviframeController::getClassName() const { return "WNaviframeController"; }

Evas_Object* WNaviframeController::onCreateView(Evas_Object* parent, void*)
{
    Evas_Object* naviframe = elm_naviframe_add(parent);
    if (!naviframe)
        return nullptr;
    evas_object_size_hint_weight_set(naviframe, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_show(naviframe);
    return naviframe;
}

bool WNaviframeController::push(WContentViewController* screen)
{
    if (!screen)
        return false;
    if (!getEvasObject() || !screen->create(getEvasObject())) {
        screen->destroy();
        return false;
    }
    screen->onSetContainerProperties();
    screen->_naviframe = this;
    screen->_item = screen->onPushToNaviframe(getEvasObject());
    if (!screen->_item) {
        screen->destroy();
        return false;
    }
    elm_naviframe_item_pop_cb_set(screen->_item, refusePop, nullptr);
    screen->_setItemTitle();
    screen->onPushed(screen->_item);
    screen->onSetMoreButton();
    screen->onSetAsPageContent();
    screen->onBecomeTop();
    return true;
}

void WNaviframeController::setOnLastItemPop(std::function<bool()> handler) { _onLastItemPop = std::move(handler); }

WContentViewController* WNaviframeController::getTop() const
{
    Elm_Object_Item* item = getEvasObject() ? elm_naviframe_top_item_get(getEvasObject()) : nullptr;
    return item ? WContentViewController::fromView(elm_object_item_part_content_get(item, "elm.swallow.content"))
                : nullptr;
}

bool WNaviframeController::_isBottom(const WContentViewController* screen) const
{
    return elm_naviframe_bottom_item_get(getEvasObject()) == screen->_item;
}

void WNaviframeController::pop(WContentViewController* screen)
{
    if (!screen || screen->_naviframe != this || !screen->_item)
        return;
    if (_isBottom(screen))
        return _popBottom(screen);
    // A screen may destroy itself in onPop and then answers false.
    if (screen->onPop())
        screen->destroy();
    if (WContentViewController* top = getTop(); top)
        top->onBecomeTop();
}

void WNaviframeController::_popBottom(WContentViewController* screen)
{
    const auto handler = _onLastItemPop;
    if (handler && !handler()) {
        if (WWindowController* window = WWindowController::getInstance(); window)
            window->minimise();
        return;
    }
    if (screen->onPop())
        screen->destroy();
}

}
