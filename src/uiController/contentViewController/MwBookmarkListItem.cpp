#include "MwBookmarkListItem.h"

#include <Elementary.h>

#include <algorithm>
#include <string_view>
#include <utility>

#include "MwDisplayText.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr auto ROW_STYLE = "mewlo/1line.sub.right";
constexpr auto SELECT_ALL_STYLE = "select_all";
constexpr std::string_view NAME_PART = "elm.text.main.left";
constexpr std::string_view TIME_PART = "elm.text.sub.right";
constexpr std::string_view SELECT_ALL_PART = "elm.text.main";
constexpr auto CHOICE_PART = "elm.icon.2";
constexpr auto CHOICE_STYLE = "mewlo";
constexpr auto INNER_PART = "elm.swallow.content";
constexpr auto RADIO_KEY = "radio";

}

MwBookmarkListItem::MwBookmarkListItem(MwSavedBookmark bookmark, int index, Selected onSelected)
    : _mode(NORMAL)
    , _bookmark(std::move(bookmark))
    , _index(index)
    , _onSelected(std::move(onSelected))
{
}

MwBookmarkListItem::MwBookmarkListItem(Selected onSelected)
    : _mode(DELETE)
    , _onSelected(std::move(onSelected))
{
}

std::string MwBookmarkListItem::timeText(long long seconds)
{
    const auto time = static_cast<int>(std::max(seconds, 0LL));
    return mwFormat("%02d:%02d:%02d", time / 3600, time / 60 % 60, time % 60);
}

const char* MwBookmarkListItem::getStyle() const { return isSelectAll() ? SELECT_ALL_STYLE : ROW_STYLE; }

std::string MwBookmarkListItem::getText(const char* part)
{
    if (isSelectAll())
        return part == SELECT_ALL_PART ? mwDisplayMarkup(mwTranslate("IDS_ST_BODY_SELECT_ALL")) : std::string();
    if (part == NAME_PART)
        return mwDisplayMarkup(_bookmark->name);
    if (part == TIME_PART)
        return timeText(_bookmark->markedTime);
    return {};
}

Evas_Object* MwBookmarkListItem::getContent(Evas_Object* genlist, const char* part)
{
    if (_mode == NORMAL || std::string_view(part) != CHOICE_PART)
        return nullptr;
    Evas_Object* layout = elm_layout_add(genlist);
    elm_layout_theme_set(layout, "layout", "list/C/type.2", "default");
    elm_layout_signal_emit(layout, "elm,event,pass,enabled", "elm");
    Evas_Object* choice = _mode == RENAME ? _createRadio(layout) : _createCheck(layout);
    if (!choice) {
        evas_object_del(layout);
        return nullptr;
    }
    // The row is what is tapped.
    evas_object_pass_events_set(choice, EINA_TRUE);
    elm_object_focus_allow_set(choice, EINA_FALSE);
    elm_object_part_content_set(layout, INNER_PART, choice);
    return layout;
}

Evas_Object* MwBookmarkListItem::_createRadio(Evas_Object* layout) const
{
    auto* radioMain = static_cast<Evas_Object*>(evas_object_data_get(getGenlist(), RADIO_KEY));
    if (!radioMain) {
        MW_LOGE("radioMain is nullptr");
        return nullptr;
    }
    Evas_Object* radio = elm_radio_add(layout);
    elm_object_style_set(radio, CHOICE_STYLE);
    elm_radio_state_value_set(radio, _index);
    elm_radio_group_add(radio, radioMain);
    return radio;
}

Evas_Object* MwBookmarkListItem::_createCheck(Evas_Object* layout) const
{
    Evas_Object* check = elm_check_add(layout);
    elm_object_style_set(check, CHOICE_STYLE);
    elm_check_state_set(check, _checked);
    return check;
}

void MwBookmarkListItem::setChecked(bool checked)
{
    if (std::exchange(_checked, checked) == checked)
        return;
    if (_mode != DELETE)
        return;
    const char* signal = checked ? "elm,activate,check,on" : "elm,activate,check,off";
    elm_object_item_signal_emit(getItem(), signal, "elm");
    Evas_Object* layout = elm_object_item_part_content_get(getItem(), CHOICE_PART);
    if (Evas_Object* check = layout ? elm_object_part_content_get(layout, INNER_PART) : nullptr; check)
        elm_layout_signal_emit(check, signal, "elm");
}

void MwBookmarkListItem::setMode(Mode mode)
{
    _checked = false;
    _mode = mode;
    elm_genlist_item_fields_update(getItem(), CHOICE_PART, ELM_GENLIST_ITEM_FIELD_CONTENT);
}

void MwBookmarkListItem::onSelected()
{
    // The screen may delete this row.
    if (const Selected onSelected = _onSelected; onSelected)
        onSelected(*this);
}
