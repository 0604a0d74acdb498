// The bookmarks screen: its modes, the title with its buttons, and the menu.
#include "MwBookmarksContentViewController.h"

#include <Elementary.h>

#include <libintl.h>
#include <panekit/WMenuPopupController.h>

#include "MwLog.h"
#include "MwNaviButtons.h"
#include "MwText.h"

namespace {

constexpr auto BACK_PART = "prev_btn";
constexpr auto LEFT_PART = "title_left_btn";
constexpr auto LEFT_STYLE = "naviframe/title_left";
constexpr auto RIGHT_PART = "title_right_btn";
constexpr auto RIGHT_STYLE = "naviframe/title_right";
constexpr auto MORE_PART = "title_more_btn";
constexpr auto RADIO_KEY = "radio";
constexpr int FIRST_ROW_MIDDLE = 120; // design units below the upper edge of the window

}

void MwBookmarksContentViewController::_enterMode(Mode mode)
{
    _mode = mode;
    _clearSelection();
    if (mode == MwBookmarkListItem::NORMAL) {
        _createPlayView();
        _removeSelectAllItem();
    } else {
        _destroyPlayView();
        mode == MwBookmarkListItem::RENAME ? _removeSelectAllItem() : _appendSelectAllItem();
    }
    if (mode == MwBookmarkListItem::RENAME)
        _createRadioGroup();
    for (MwBookmarkListItem* row : _rows())
        row->setMode(mode);
    _updateTitle();
    _updateNaviButton();
    _updateMoreButton();
}

void MwBookmarksContentViewController::_clearSelection()
{
    for (MwBookmarkListItem* row : _rows())
        row->setChecked(false);
    elm_object_disabled_set(_genlist, EINA_FALSE);
}

// The group itself, hidden: the radios of the rows come and go with scrolling.
void MwBookmarksContentViewController::_createRadioGroup()
{
    if (!_radio) {
        _radio = elm_radio_add(_genlist);
        elm_radio_state_value_set(_radio, -1);
        evas_object_data_set(_genlist, RADIO_KEY, _radio);
    }
    elm_radio_value_set(_radio, -1);
}

void MwBookmarksContentViewController::_appendSelectAllItem()
{
    if (_selectAllItem)
        return;
    int x = 0;
    int y = 0;
    evas_object_geometry_get(_genlist, &x, &y, nullptr, nullptr);
    const auto below = static_cast<int>(FIRST_ROW_MIDDLE * elm_config_scale_get() / elm_app_base_scale_get());
    Elm_Object_Item* first = elm_genlist_at_xy_item_get(_genlist, x + 1, y + below, nullptr);
    auto* row = new MwBookmarkListItem([this](MwBookmarkListItem& item) { _itemListenerCb(item); });
    if (!row->prepend(_genlist)) {
        delete row;
        return;
    }
    _selectAllItem = row;
    // A list at its beginning shows the new row.
    if (first && elm_genlist_item_prev_get(first) == row->getItem())
        elm_genlist_item_show(row->getItem(), ELM_GENLIST_ITEM_SCROLLTO_TOP);
}

void MwBookmarksContentViewController::_removeSelectAllItem()
{
    if (MwBookmarkListItem* row = std::exchange(_selectAllItem, nullptr); row)
        elm_object_item_del(row->getItem());
}

void MwBookmarksContentViewController::_updateTitle()
{
    if (_mode == MwBookmarkListItem::NORMAL)
        return setTitle("IDS_MW_BODY_BOOKMARKS");
    const int count = _mode == MwBookmarkListItem::DELETE ? _checkedCount() : 0;
    if (count == 0)
        return setTitle("IDS_MW_HEADER_SELECT_BOOKMARKS");
    setCountTitle(static_cast<size_t>(count));
}

void MwBookmarksContentViewController::_updateNaviButton()
{
    for (const char* part : {BACK_PART, LEFT_PART, RIGHT_PART})
        mwRemoveNaviButton(getNaviItem(), part);
    const auto leave = [](void* data, Evas_Object*, void*) {
        static_cast<MwBookmarksContentViewController*>(data)->_backKeyClicked();
    };
    if (_mode == MwBookmarkListItem::NORMAL) {
        mwSetBackButton(getNaviItem(), leave, this);
        return;
    }
    mwSetTitleButton(getNaviItem(), LEFT_PART, LEFT_STYLE, "IDS_TPLATFORM_ACBUTTON_CANCEL_ABB", leave, this);
    if (_mode != MwBookmarkListItem::DELETE)
        return;
    const auto clicked = [](void* data, Evas_Object*, void*) {
        static_cast<MwBookmarksContentViewController*>(data)->_deleteSelected();
    };
    mwSetTitleButton(getNaviItem(), RIGHT_PART, RIGHT_STYLE, "IDS_TPLATFORM_ACBUTTON_DELETE_ABB", clicked, this);
    _updateCount();
}

// What the menu offers needs the normal mode and a bookmark.
void MwBookmarksContentViewController::_updateMoreButton()
{
    if (!getNaviItem())
        return;
    mwRemoveNaviButton(getNaviItem(), MORE_PART);
    if (_mode == MwBookmarkListItem::NORMAL && !_rows().empty())
        setMoreButton([this] { _moreKeyClicked(); });
}

void MwBookmarksContentViewController::_updateCount()
{
    if (Evas_Object* button = elm_object_item_part_content_get(getNaviItem(), RIGHT_PART); button)
        elm_object_disabled_set(button, _checkedCount() == 0);
    _updateTitle();
}

void MwBookmarksContentViewController::_moreKeyClicked()
{
    if (_mode != MwBookmarkListItem::NORMAL || _rows().empty())
        return;
    auto* menu = new panekit::WMenuPopupController;
    menu->addItem("IDS_MUSIC_OPT_RENAME", [this] {
        MW_LOGW("Rename mode");
        _enterMode(MwBookmarkListItem::RENAME);
    });
    menu->addItem("IDS_MW_OPT_DELETE", [this] {
        MW_LOGW("Delete mode");
        _enterMode(MwBookmarkListItem::DELETE);
    });
    attachPopup(menu);
    menu->create(getWindow(), elm_object_item_widget_get(getNaviItem()));
}
