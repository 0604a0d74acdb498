// The bookmarks screen: its rows and what is done to them.
#include "MwBookmarksContentViewController.h"

#include <Elementary.h>

#include <media_content.h>

#include <algorithm>
#include <utility>

#include "MwAppController.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwPlayViewController.h"
#include "MwRenamePopupController.h"
#include "MwText.h"

namespace {

constexpr auto LIST_PART = "elm.swallow.list";

void readingFailed(const char* call, int code) { MW_LOGW("%s()... [0x%X]", call, static_cast<unsigned int>(code)); }

}

void MwBookmarksContentViewController::_createList()
{
    if (Evas_Object* other = elm_object_part_content_unset(getEvasObject(), LIST_PART); other)
        evas_object_del(other);
    _genlist = elm_genlist_add(getEvasObject());
    elm_genlist_homogeneous_set(_genlist, EINA_TRUE);
    elm_genlist_mode_set(_genlist, ELM_LIST_COMPRESS);
    elm_object_part_content_set(getEvasObject(), LIST_PART, _genlist);
    evas_object_show(_genlist);
    // What has the keyboard when the list is focused is its inner object; the list would scroll by Left and Right.
    evas_object_event_callback_priority_add(
        elm_layout_edje_get(_genlist), EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _listKeyCb, this);
    elm_object_focus_set(_genlist, EINA_TRUE);
}

void MwBookmarksContentViewController::_listKeyCb(void* data, Evas*, Evas_Object*, void* info)
{
    const auto* self = static_cast<MwBookmarksContentViewController*>(data);
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    if (self->_playView && self->_playView->takeKey(event->key))
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
}

void MwBookmarksContentViewController::_loadListItems()
{
    int index = 0;
    for (MwSavedBookmark& bookmark : mwReadBookmarks(_mediaId, readingFailed)) {
        auto* row = new MwBookmarkListItem(
            std::move(bookmark), ++index, [this](MwBookmarkListItem& item) { _itemListenerCb(item); });
        if (!row->append(_genlist))
            delete row;
    }
}

// The row on top stays there.
void MwBookmarksContentViewController::_reloadList()
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
    _updateMoreButton();
}

std::vector<MwBookmarkListItem*> MwBookmarksContentViewController::_rows() const
{
    std::vector<MwBookmarkListItem*> rows;
    for (Elm_Object_Item* item = elm_genlist_first_item_get(_genlist); item; item = elm_genlist_item_next_get(item)) {
        auto* row = static_cast<MwBookmarkListItem*>(panekit::WGenlistItem::fromItem(item));
        if (row && !row->isSelectAll())
            rows.push_back(row);
    }
    return rows;
}

int MwBookmarksContentViewController::_checkedCount() const
{
    const auto rows = _rows();
    return static_cast<int>(std::count_if(rows.begin(), rows.end(), [](const auto* row) { return row->isChecked(); }));
}

void MwBookmarksContentViewController::_itemListenerCb(MwBookmarkListItem& item)
{
    switch (_mode) {
    case MwBookmarkListItem::NORMAL:
        return _jumpTo(item);
    case MwBookmarkListItem::RENAME:
        return _openRenamePopup(item);
    case MwBookmarkListItem::DELETE:
        return item.isSelectAll() ? _toggleAll() : _toggle(item);
    }
}

void MwBookmarksContentViewController::_jumpTo(const MwBookmarkListItem& item)
{
    const std::weak_ptr<void> screen = token();
    getModel()->setCurrentPlayPosition(item.getBookmark().markedTime * 1000);
    getAppController()->getPlayerUpdatedSignal().emit();
    if (screen.expired() || !_playView)
        return;
    if (!getAppController()->dispatchCommand(MwAppController::SET_PLAYER_POSITION))
        MW_LOGE("set play position failed!");
}

void MwBookmarksContentViewController::_toggle(MwBookmarkListItem& item)
{
    item.setChecked(!item.isChecked());
    if (_selectAllItem)
        _selectAllItem->setChecked(_checkedCount() == static_cast<int>(_rows().size()));
    _updateCount();
}

void MwBookmarksContentViewController::_toggleAll()
{
    const bool checked = !_selectAllItem->isChecked();
    _selectAllItem->setChecked(checked);
    for (MwBookmarkListItem* row : _rows())
        row->setChecked(checked);
    _updateCount();
}

void MwBookmarksContentViewController::_openRenamePopup(MwBookmarkListItem& item)
{
    if (_renamePopup) {
        MW_LOGW("rename popup already show");
        _closeRenamePopup();
    }
    elm_radio_value_set(_radio, item.getIndex());
    _renamedBookmark = item.getBookmark().id;
    _renamePopup = std::make_unique<MwRenamePopupController>(item.getBookmark().name.c_str());
    _renamePopup->setResponseCb(
        [this](void*, const char* name, int response) { _renameResponseCb(name, response); }, this);
    if (!_renamePopup->create(getWindow(), nullptr))
        _closeRenamePopup();
}

// Gone after the callback that is still running in it.
void MwBookmarksContentViewController::_closeRenamePopup()
{
    _renamedBookmark = 0;
    if (const auto popup = std::exchange(_renamePopup, nullptr); popup)
        popup->destory();
}

bool MwBookmarksContentViewController::_isNameTaken(const std::string& name) const
{
    const auto rows = _rows();
    return std::any_of(rows.begin(), rows.end(), [&](const MwBookmarkListItem* row) {
        return row->getBookmark().id != _renamedBookmark && row->getBookmark().name == name;
    });
}

void MwBookmarksContentViewController::_renameResponseCb(const char* text, int response)
{
    if (response != MwRenamePopupController::RESPONSE_RENAME)
        return _closeRenamePopup();
    const std::string name = text ? text : "";
    if (name.find_first_not_of(' ') == std::string::npos)
        return mwPost("IDS_MW_POP_INVALID_FILE_NAME");
    if (_isNameTaken(name))
        return mwPost("IDS_MW_POP_RENAMEALREADYUSED");
    const auto rows = _rows();
    const auto found = std::find_if(rows.begin(), rows.end(),
        [this](const MwBookmarkListItem* row) { return row->getBookmark().id == _renamedBookmark; });
    if (found != rows.end())
        _renameBookmark((*found)->getBookmark(), name);
    _reloadList();
    _closeRenamePopup();
    _enterMode(MwBookmarkListItem::NORMAL);
}

// A name cannot be changed: a new bookmark takes the place of the old one. The new one first, so that nothing is lost
// when the program ends in between.
void MwBookmarksContentViewController::_renameBookmark(const MwSavedBookmark& bookmark, const std::string& name)
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

void MwBookmarksContentViewController::_deleteSelected()
{
    for (MwBookmarkListItem* row : _rows()) {
        if (!row->isChecked())
            continue;
        const int result = media_bookmark_delete_from_db(row->getBookmark().id);
        if (result != MEDIA_CONTENT_ERROR_NONE) {
            MW_LOGW("media_bookmark_delete_from_db().. [0x%X]", static_cast<unsigned int>(result));
            break;
        }
        elm_object_item_del(row->getItem());
    }
    _enterMode(MwBookmarkListItem::NORMAL);
}
