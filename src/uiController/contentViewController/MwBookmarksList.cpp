#include "MwBookmarksList.h"

#include <Elementary.h>

#include <media_content.h>

#include <algorithm>
#include <utility>

#include "MwLog.h"

namespace {

constexpr auto LIST_PART = "elm.swallow.list";
constexpr auto RADIO_KEY = "radio";
constexpr int FIRST_ROW_MIDDLE = 120; // design units below the upper edge of the window

void readingFailed(const char* call, int code) { MW_LOGW("%s()... [0x%X]", call, static_cast<unsigned int>(code)); }

}

MwBookmarksList::MwBookmarksList(Evas_Object* layout, std::string mediaId, Screen screen)
    : _mediaId(std::move(mediaId))
    , _screen(std::move(screen))
{
    _createList(layout);
    _loadListItems();
}

void MwBookmarksList::_createList(Evas_Object* layout)
{
    if (Evas_Object* other = elm_object_part_content_unset(layout, LIST_PART); other)
        evas_object_del(other);
    _genlist = elm_genlist_add(layout);
    elm_genlist_homogeneous_set(_genlist, EINA_TRUE);
    elm_genlist_mode_set(_genlist, ELM_LIST_COMPRESS);
    elm_object_part_content_set(layout, LIST_PART, _genlist);
    evas_object_show(_genlist);
    // What has the keyboard when the list is focused is its inner object; the list would scroll by Left and Right.
    evas_object_event_callback_priority_add(
        elm_layout_edje_get(_genlist), EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _listKeyCb, this);
    elm_object_focus_set(_genlist, EINA_TRUE);
}

void MwBookmarksList::_listKeyCb(void* data, Evas*, Evas_Object*, void* info)
{
    const auto* self = static_cast<MwBookmarksList*>(data);
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    if (self->_screen.onKey(event->key))
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
}

void MwBookmarksList::_loadListItems()
{
    int index = 0;
    for (MwSavedBookmark& bookmark : mwReadBookmarks(_mediaId, readingFailed)) {
        auto* row = new Item(std::move(bookmark), ++index, [this](Item& item) { _screen.onSelected(item); });
        if (!row->append(_genlist))
            delete row;
    }
}

// The row on top stays there.
void MwBookmarksList::reload()
{
    Eina_Rectangle area;
    evas_object_geometry_get(_genlist, &area.x, &area.y, &area.w, &area.h);
    Elm_Object_Item* top = elm_genlist_at_xy_item_get(_genlist, area.x + area.w / 2, area.y + 1, nullptr);
    const int index = top ? elm_genlist_item_index_get(top) : 1;
    _selectAllItem = nullptr;
    elm_genlist_clear(_genlist);
    _loadListItems();
    if (index > 1)
        elm_genlist_item_show(
            elm_genlist_nth_item_get(_genlist, static_cast<unsigned int>(index - 1)), ELM_GENLIST_ITEM_SCROLLTO_TOP);
}

void MwBookmarksList::refresh() { elm_genlist_realized_items_update(_genlist); }

std::vector<MwBookmarksList::Item*> MwBookmarksList::_rows() const
{
    std::vector<Item*> rows;
    for (Elm_Object_Item* item = elm_genlist_first_item_get(_genlist); item; item = elm_genlist_item_next_get(item)) {
        auto* row = static_cast<Item*>(panekit::WGenlistItem::fromItem(item));
        if (row && !row->isSelectAll())
            rows.push_back(row);
    }
    return rows;
}

void MwBookmarksList::setMode(Item::Mode mode)
{
    _clearSelection();
    if (mode == Item::DELETE)
        _appendSelectAllItem();
    else
        _removeSelectAllItem();
    if (mode == Item::RENAME)
        _createRadioGroup();
    for (Item* row : _rows())
        row->setMode(mode);
}

void MwBookmarksList::_clearSelection()
{
    for (Item* row : _rows())
        row->setChecked(false);
    elm_object_disabled_set(_genlist, EINA_FALSE);
}

// The group itself, hidden: the radios of the rows come and go with scrolling.
void MwBookmarksList::_createRadioGroup()
{
    if (!_radio) {
        _radio = elm_radio_add(_genlist);
        elm_radio_state_value_set(_radio, -1);
        evas_object_data_set(_genlist, RADIO_KEY, _radio);
    }
    elm_radio_value_set(_radio, -1);
}

void MwBookmarksList::_appendSelectAllItem()
{
    if (_selectAllItem)
        return;
    int x = 0;
    int y = 0;
    evas_object_geometry_get(_genlist, &x, &y, nullptr, nullptr);
    const auto below = static_cast<int>(FIRST_ROW_MIDDLE * elm_config_scale_get() / elm_app_base_scale_get());
    Elm_Object_Item* first = elm_genlist_at_xy_item_get(_genlist, x + 1, y + below, nullptr);
    auto* row = new Item([this](Item& item) { _screen.onSelected(item); });
    if (!row->prepend(_genlist)) {
        delete row;
        return;
    }
    _selectAllItem = row;
    // A list at its beginning shows the new row.
    if (first && elm_genlist_item_prev_get(first) == row->getItem())
        elm_genlist_item_show(row->getItem(), ELM_GENLIST_ITEM_SCROLLTO_TOP);
}

void MwBookmarksList::_removeSelectAllItem()
{
    if (Item* row = std::exchange(_selectAllItem, nullptr); row)
        elm_object_item_del(row->getItem());
}

int MwBookmarksList::getCheckedCount() const
{
    const auto rows = _rows();
    return static_cast<int>(std::count_if(rows.begin(), rows.end(), [](const auto* row) { return row->isChecked(); }));
}

void MwBookmarksList::toggle(Item& item)
{
    const bool checked = !item.isChecked();
    item.setChecked(checked);
    if (item.isSelectAll()) {
        for (Item* row : _rows())
            row->setChecked(checked);
    } else if (_selectAllItem) {
        _selectAllItem->setChecked(getCheckedCount() == static_cast<int>(_rows().size()));
    }
}

void MwBookmarksList::choose(const Item& row) { elm_radio_value_set(_radio, row.getIndex()); }

bool MwBookmarksList::isNameTaken(int bookmark, const std::string& name) const
{
    const auto rows = _rows();
    return std::any_of(rows.begin(), rows.end(),
        [&](const Item* row) { return row->getBookmark().id != bookmark && row->getBookmark().name == name; });
}

void MwBookmarksList::rename(int bookmark, const std::string& name)
{
    const auto rows = _rows();
    const auto found
        = std::find_if(rows.begin(), rows.end(), [&](const Item* row) { return row->getBookmark().id == bookmark; });
    if (found != rows.end())
        _replace((*found)->getBookmark(), name);
    reload();
}

// A name cannot be changed: a new bookmark takes the place of the old one. The new one first, so that nothing is lost
// when the program ends in between.
void MwBookmarksList::_replace(const MwSavedBookmark& bookmark, const std::string& name) const
{
    int result = media_bookmark_insert_to_db(_mediaId.c_str(), bookmark.markedTime, name.c_str());
    if (result != MEDIA_CONTENT_ERROR_NONE) {
        MW_LOGW("media_bookmark_insert_db()... [0x%X]", static_cast<unsigned int>(result));
        return;
    }
    result = media_bookmark_delete_from_db(bookmark.id);
    if (result != MEDIA_CONTENT_ERROR_NONE)
        MW_LOGW("media_bookmark_delete_from_db()... [0x%X]", static_cast<unsigned int>(result));
}

void MwBookmarksList::deleteChecked()
{
    for (Item* row : _rows()) {
        if (!row->isChecked())
            continue;
        const int result = media_bookmark_delete_from_db(row->getBookmark().id);
        if (result != MEDIA_CONTENT_ERROR_NONE) {
            MW_LOGW("media_bookmark_delete_from_db().. [0x%X]", static_cast<unsigned int>(result));
            break;
        }
        elm_object_item_del(row->getItem());
    }
}
