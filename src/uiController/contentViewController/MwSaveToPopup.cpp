#include "MwSaveToPopup.h"

#include <utility>

#include <Elementary.h>

#include <panekit/WPopupController.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwSaveToListItem.h"
#include "MwSystemMgr.h"

using panekit::WPopupController;

namespace {

void chooseStorage(MwModel* model, WPopupController* chooser, int storage)
{
    if (storage == MW_STORAGE_DEVICE || storage == MW_STORAGE_CARD)
        model->setStorageType(static_cast<MwStorageType>(storage));
    else
        MW_LOGE("invalid index!! [%d]", storage);
    chooser->destroy();
}

Evas_Object* createSaveToList(Evas_Object* popup, MwModel* model, WPopupController* chooser)
{
    Evas_Object* genlist = elm_genlist_add(popup);
    elm_genlist_homogeneous_set(genlist, EINA_TRUE);
    elm_genlist_mode_set(genlist, ELM_LIST_COMPRESS);
    elm_scroller_content_min_limit(genlist, EINA_FALSE, EINA_TRUE);
    evas_object_size_hint_weight_set(genlist, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(genlist, EVAS_HINT_FILL, EVAS_HINT_FILL);
    // The group itself, hidden: the radios of the rows come and go with scrolling.
    Evas_Object* radioMain = elm_radio_add(genlist);
    elm_radio_state_value_set(radioMain, -1);
    evas_object_data_set(genlist, "radio", radioMain);
    const auto chosen = [model, chooser](int storage) { chooseStorage(model, chooser, storage); };
    (new MwSaveToListItem(model, MW_STORAGE_DEVICE, chosen))->append(genlist);
    if (MwSystemMgr::getInstance()->isMMCMounted())
        (new MwSaveToListItem(model, MW_STORAGE_CARD, chosen))->append(genlist);
    else
        MW_LOGE("MMC not mounted");
    evas_object_show(genlist);
    return genlist;
}

}

MwSaveToPopup::MwSaveToPopup(MwModel* model)
    : _model(model)
{
}

MwSaveToPopup::~MwSaveToPopup() { close(); }

void MwSaveToPopup::open(Evas_Object* window)
{
    if (_popup)
        return;
    MW_LOGW("create save to menu");
    _popup = new WPopupController();
    _popup->setTitle("IDS_MW_HEADER_SAVE_TO");
    _popup->setStyle("theme_bg");
    _popup->setContent(
        [model = _model, popup = _popup](Evas_Object* parent) { return createSaveToList(parent, model, popup); });
    _popup->setOnBack([](WPopupController* self) { self->destroy(); });
    _popup->setOnDestroyed([this] { _popup = nullptr; });
    _popup->create(window);
}

void MwSaveToPopup::close()
{
    auto* popup = std::exchange(_popup, nullptr);
    if (!popup)
        return;
    popup->setOnDestroyed(nullptr);
    popup->destroy();
}
