#include "MwContentViewController.h"

#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <eext_event.h>

#include "MwLog.h"
#include "MwText.h"

namespace {

// The item below the top one of a naviframe, null when there is none.
Elm_Object_Item* secondItem(Evas_Object* naviframe)
{
    Eina_List* items = elm_naviframe_items_get(naviframe);
    const unsigned int count = eina_list_count(items);
    auto* second = count < 2 ? nullptr : static_cast<Elm_Object_Item*>(eina_list_nth(items, count - 2));
    eina_list_free(items);
    return second;
}

}

MwContentViewController::MwContentViewController(MwModel* model, MwAppController* appController)
    : _model(model)
    , _appController(appController)
{
}

MwContentViewController::~MwContentViewController() { _stopListening(); }

const char* MwContentViewController::getClassName() const { return "MwContentViewController"; }

void MwContentViewController::setBackKeyHandler(std::function<void()> handler)
{
    const bool wasRegistered = static_cast<bool>(_backKeyHandler);
    _backKeyHandler = std::move(handler);
    if (_backKeyHandler && !wasRegistered)
        eext_object_event_callback_add(getEvasObject(), EEXT_CALLBACK_BACK, _backKeyCb, this);
}

void MwContentViewController::listenToSystemInfo(std::function<void(MwSignalMgr::SystemInfo)> listener)
{
    _stopListening();
    MwSignalMgr* signals = MwSignalMgr::getInstance();
    _systemInfoListener = signals->getSystemInfoSignal().addListener(std::move(listener));
    _lifeCycleListener = signals->getLifeCycleSignal().addListener([this](MwSignalMgr::LifeCycle lifeCycle) {
        if (lifeCycle == MwSignalMgr::TERMINATE)
            _stopListening();
    });
}

void MwContentViewController::_stopListening()
{
    MwSignalMgr* signals = MwSignalMgr::existing();
    if (!signals)
        return;
    mwForget(signals->getSystemInfoSignal(), _systemInfoListener);
    mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
}

void MwContentViewController::setCountTitle(size_t count)
{
    Elm_Object_Item* item = getNaviItem();
    elm_object_item_domain_part_text_translatable_set(item, nullptr, textdomain(nullptr), EINA_FALSE);
    elm_object_item_text_set(item, mwTranslateNumber("IDS_MW_HEADER_PD_SELECTED_ABB", count).c_str());
}

void MwContentViewController::_backKeyCb(void* data, Evas_Object*, void*)
{
    const auto* self = static_cast<MwContentViewController*>(data);
    if (!self) {
        MW_LOGE("self is nullptr");
        return;
    }
    // The handler may end the screen and itself with it.
    if (const auto handler = self->_backKeyHandler; handler)
        handler();
}

Evas_Object* MwContentViewController::onPushToNaviframe(Evas_Object* naviframe)
{
    if (!naviframe) {
        MW_LOGE("naviFrame is nullptr");
        return nullptr;
    }
    Elm_Object_Item* top = elm_naviframe_top_item_get(naviframe);
    // Translated already: a screen reader reads what stands here.
    const std::string text = getTitle().empty() ? std::string() : mwTranslate(getTitle().c_str());
    const char* title = text.c_str();
    Elm_Object_Item* item = top
        ? elm_naviframe_item_insert_after(naviframe, top, title, nullptr, nullptr, getEvasObject(), nullptr)
        : elm_naviframe_item_push(naviframe, title, nullptr, nullptr, getEvasObject(), nullptr);
    if (!item)
        MW_LOGE("Failed to insert naviframe item");
    return item;
}

bool MwContentViewController::onPop()
{
    Evas_Object* naviframe = elm_object_item_widget_get(getNaviItem());
    if (Elm_Object_Item* below = secondItem(naviframe); below) {
        Evas_Object* view = elm_object_item_part_content_get(below, "elm.swallow.content");
        if (auto* screen = dynamic_cast<MwContentViewController*>(fromView(view)); screen)
            screen->onTop();
    }
    if (elm_naviframe_bottom_item_get(naviframe) == getNaviItem())
        return true;
    destroy();
    return false;
}
