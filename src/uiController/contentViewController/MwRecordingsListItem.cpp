#include "MwRecordingsListItem.h"

#include <Elementary.h>

#include <algorithm>
#include <string_view>
#include <tuple>
#include <utility>

#include <media_content.h>
#include <uxt_theme.h>

#include "MwDisplayText.h"
#include "MwListDates.h"
#include "MwLog.h"
#include "MwResourceMgr.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr auto ROW_STYLE = "mewlo/2line.top.3";
constexpr auto SELECT_ALL_STYLE = "select_all";
constexpr auto SELECT_ALL_PART = "elm.text.main";
constexpr auto NAME_PART = "elm.text.main.left.top";
constexpr auto MMS_PART = "elm.text.sub.right.bottom";
constexpr auto DATE_PART = "elm.text.sub.left.bottom";
constexpr auto DURATION_PART = "elm.text.sub.left.bottom.1";
constexpr auto CHOICE_PART = "elm.icon.2";
constexpr auto BOOKMARK_PART = "elm.swallow.content.bookmark";
constexpr auto PRIVATE_PART = "elm.swallow.content.private";
constexpr auto CHOICE_STYLE = "mewlo";
constexpr auto INNER_PART = "elm.swallow.content";
constexpr auto CURRENT_NAME_COLOR = "ATO003";
constexpr auto CURRENT_DETAIL_COLOR = "ATO005";
constexpr auto RADIO_KEY = "radio";
constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr int MARK_SIZE = 49; // design units
constexpr std::string_view MMS_EXTENSION = ".amr";
const std::string NO_PATH;

bool isMms(const std::string& path) { return path.size() > MMS_EXTENSION.size() && path.ends_with(MMS_EXTENSION); }

Evas_Object* createMark(Evas_Object* genlist, const char* image, const char* color)
{
    std::string file;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, file) || file.empty()) {
        MW_LOGE("getEdjPath fail");
        return nullptr;
    }
    Evas_Object* mark = elm_image_add(genlist);
    elm_image_file_set(mark, file.c_str(), image);
    evas_object_size_hint_min_set(mark, ELM_SCALE_SIZE(MARK_SIZE), ELM_SCALE_SIZE(MARK_SIZE));
    uxt_theme_object_set_color(mark, color);
    return mark;
}

}

MwRecordingsListItem::MwRecordingsListItem(const Context& context, MwFileInfo info, int index, bool isHighlighted)
    : _context(context)
    , _info(std::move(info))
    , _index(index)
    , _highlighted(isHighlighted)
{
}

MwRecordingsListItem::MwRecordingsListItem(const Context& context)
    : _context(context)
{
}

MwRecordingsListItem* MwRecordingsListItem::from(Evas_Object* item)
{
    return static_cast<MwRecordingsListItem*>(WGenlistItem::fromItem(item));
}

const std::string& MwRecordingsListItem::getPath() const { return _info ? _info->path : NO_PATH; }

const char* MwRecordingsListItem::getStyle() const { return isSelectAll() ? SELECT_ALL_STYLE : ROW_STYLE; }

void MwRecordingsListItem::setFileInfo(const MwFileInfo& info)
{
    const auto shown = [](const MwFileInfo& each) {
        return std::tie(each.path, each.displayName, each.mediaId, each.modifiedTime, each.duration);
    };
    if (_info && shown(*_info) == shown(info))
        return;
    _info = info;
    _bookmarked.reset();
    elm_genlist_item_update(getItem());
}

bool MwRecordingsListItem::_isCurrent() const
{
    return _info && !_info->path.empty() && _context.model->getCurrentPlayPath() == _info->path;
}

// The whole text of the current row is coloured.
std::string MwRecordingsListItem::_coloured(const std::string& markup, const char* code) const
{
    if (markup.empty() || !_isCurrent())
        return markup;
    int red = 0;
    int green = 0;
    int blue = 0;
    int alpha = 0;
    uxt_theme_get_color(code, &red, &green, &blue, &alpha);
    return mwFormat("<color=#%02X%02X%02X%02X>%s</color>", static_cast<unsigned>(red), static_cast<unsigned>(green),
        static_cast<unsigned>(blue), static_cast<unsigned>(alpha), markup.c_str());
}

std::string MwRecordingsListItem::getText(const char* part)
{
    const std::string_view name = part;
    if (isSelectAll())
        return name == SELECT_ALL_PART ? mwDisplayMarkup(mwTranslate("IDS_ST_BODY_SELECT_ALL")) : std::string();
    if (name == NAME_PART)
        return _coloured(_nameText(), CURRENT_NAME_COLOR);
    if (name == DATE_PART)
        return _coloured(_dateText(), CURRENT_DETAIL_COLOR);
    if (name == DURATION_PART)
        return _coloured(_durationText(), CURRENT_DETAIL_COLOR);
    if (name == MMS_PART && isMms(_info->path))
        return _coloured("MMS", CURRENT_DETAIL_COLOR);
    return {};
}

std::string MwRecordingsListItem::_nameText() const
{
    if (!_info->displayName.empty())
        return mwDisplayMarkup(mwWithoutExtension(_info->displayName));
    MW_LOGE("item file info display name is nullptr");
    return {};
}

std::string MwRecordingsListItem::_dateText() const
{
    return mwDisplayMarkup(mwDateText(getGenlist(), _info->modifiedTime, MwICU::DATE));
}

std::string MwRecordingsListItem::_durationText() const { return MwModel::getLengthText(_info->duration); }

Evas_Object* MwRecordingsListItem::getContent(Evas_Object* genlist, const char* part)
{
    const std::string_view name = part;
    if (name == CHOICE_PART)
        return _createChoice(genlist);
    if (isSelectAll())
        return nullptr;
    if (name == BOOKMARK_PART && _hasBookmarks())
        return createMark(genlist, "mainView/voice_list_ic_bookmark.png", "AO002");
    if (name == PRIVATE_PART && _info->path.find(mwPrivateRoot() + "/") != std::string::npos)
        return createMark(genlist, "mainView/voice_list_ic_private.png", "AO020");
    return nullptr;
}

// Asked once for each row: scrolling must not wait for the database.
bool MwRecordingsListItem::_hasBookmarks()
{
    if (_bookmarked)
        return *_bookmarked;
    int count = 0;
    if (const int result = media_info_get_bookmark_count_from_db(_info->mediaId.c_str(), nullptr, &count); result != 0)
        MW_LOGE("media_info_get_bookmark_count_from_db : [%d]!!!", result);
    _bookmarked = count > 0;
    return *_bookmarked;
}

Evas_Object* MwRecordingsListItem::_createChoice(Evas_Object* genlist)
{
    const ListType type = _context.getListType();
    if (type == NO_CHOICE || (type == SINGLE_CHOICE && isSelectAll()))
        return nullptr;
    Evas_Object* layout = elm_layout_add(genlist);
    elm_layout_theme_set(layout, "layout", "list/C/type.2", "default");
    elm_layout_signal_emit(layout, "elm,event,pass,enabled", "elm");
    Evas_Object* choice = type == SINGLE_CHOICE ? _createRadio(layout, genlist) : _createCheck(layout);
    if (!choice) {
        evas_object_del(layout);
        return nullptr;
    }
    // The row is what is tapped and what has the keyboard.
    evas_object_pass_events_set(choice, EINA_TRUE);
    elm_object_focus_allow_set(choice, EINA_FALSE);
    elm_object_part_content_set(layout, INNER_PART, choice);
    return layout;
}

Evas_Object* MwRecordingsListItem::_createRadio(Evas_Object* layout, Evas_Object* genlist) const
{
    auto* radioMain = static_cast<Evas_Object*>(evas_object_data_get(genlist, RADIO_KEY));
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

Evas_Object* MwRecordingsListItem::_createCheck(Evas_Object* layout) const
{
    Evas_Object* check = elm_check_add(layout);
    elm_object_style_set(check, CHOICE_STYLE);
    elm_check_state_set(check, _checked);
    return check;
}

void MwRecordingsListItem::setChecked(bool checked)
{
    _checked = checked;
    Evas_Object* layout = getItem() ? elm_object_item_part_content_get(getItem(), CHOICE_PART) : nullptr;
    Evas_Object* check = layout ? elm_object_part_content_get(layout, INNER_PART) : nullptr;
    if (check)
        elm_layout_signal_emit(check, checked ? "elm,activate,check,on" : "elm,activate,check,off", "elm");
}

void MwRecordingsListItem::takeOver(const MwRecordingsListItem& former)
{
    _checked = former._checked;
    _highlighted = former._highlighted;
    _bookmarked = former._bookmarked;
}

void MwRecordingsListItem::refresh()
{
    elm_genlist_item_fields_update(getItem(), "elm.text.*", ELM_GENLIST_ITEM_FIELD_TEXT);
    elm_genlist_item_fields_update(getItem(), CHOICE_PART, ELM_GENLIST_ITEM_FIELD_CONTENT);
    _emitState();
}

void MwRecordingsListItem::refreshBookmarks()
{
    forgetBookmarks();
    elm_genlist_item_fields_update(getItem(), BOOKMARK_PART, ELM_GENLIST_ITEM_FIELD_CONTENT);
}

// Signals that are emitted while the toolkit asks for texts get lost, hence here and on changes.
void MwRecordingsListItem::_emitState()
{
    if (!isSelectAll())
        elm_object_item_signal_emit(getItem(), _isCurrent() ? "set_focus" : "set_normal", "*");
    elm_object_item_signal_emit(getItem(), _highlighted ? "highlight,on" : "highlight,off", "c_source");
}

void MwRecordingsListItem::setHighlighted(bool highlighted)
{
    _highlighted = highlighted;
    _emitState();
}

void MwRecordingsListItem::onRealized() { _emitState(); }

void MwRecordingsListItem::onSelected()
{
    if (_context.onSelected)
        _context.onSelected(*this);
}
