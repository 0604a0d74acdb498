#include "MwSaveToListItem.h"

#include <cstdlib>
#include <utility>

#include <Elementary.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwText.h"

namespace {

constexpr auto ROW_STYLE = "mewlo/1line";
constexpr auto NAME_PART = "elm.text.main.left";
constexpr auto RADIO_PART = "elm.icon.2";
constexpr auto RADIO_KEY = "radio";

}

MwSaveToListItem::MwSaveToListItem(MwModel* model, int index, std::function<void(int)> onChosen)
    : _model(model)
    , _index(index)
    , _onChosen(std::move(onChosen))
{
}

const char* MwSaveToListItem::getStyle() const { return ROW_STYLE; }

std::string MwSaveToListItem::getText(const char* part)
{
    if (std::string(part) != NAME_PART)
        return {};
    if (_index != MW_STORAGE_DEVICE && _index != MW_STORAGE_CARD) {
        MW_LOGE("invalid index!!![%d]", _index);
        return {};
    }
    const std::string name
        = mwTranslate(_index == MW_STORAGE_DEVICE ? "IDS_CAM_OPT_DEVICE_ABB_M_MEMORY" : "IDS_MW_BODY_SD_CARD");
    return mwAdopt(elm_entry_utf8_to_markup(name.c_str()));
}

Evas_Object* MwSaveToListItem::getContent(Evas_Object* genlist, const char* part)
{
    if (std::string(part) != RADIO_PART)
        return nullptr;
    auto* radioMain = static_cast<Evas_Object*>(evas_object_data_get(genlist, RADIO_KEY));
    if (!radioMain) {
        MW_LOGE("radioMain is nullptr");
        return nullptr;
    }
    Evas_Object* layout = elm_layout_add(genlist);
    elm_layout_theme_set(layout, "layout", "list/C/type.2", "default");
    elm_layout_signal_emit(layout, "elm,event,pass,enabled", "elm");
    Evas_Object* radio = elm_radio_add(layout);
    elm_radio_state_value_set(radio, _index);
    elm_radio_group_add(radio, radioMain);
    elm_radio_value_set(radioMain, _model ? _model->getStorageType() : MW_STORAGE_DEVICE);
    // The row is what is tapped.
    evas_object_pass_events_set(radio, EINA_TRUE);
    elm_object_focus_allow_set(radio, EINA_FALSE);
    elm_object_part_content_set(layout, "elm.swallow.content", radio);
    return layout;
}

void MwSaveToListItem::onSelected()
{
    // Choosing usually closes the popup and with it this row.
    if (const auto onChosen = _onChosen; onChosen)
        onChosen(_index);
}
