#include "MwBookmarksContentViewController.h"

#include <Elementary.h>

#include <media_content.h>
#include <panekit/WMenuPopupController.h>

#include <utility>

#include "MwAppController.h"
#include "MwBookmarksList.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwNaviButtons.h"
#include "MwPlayViewController.h"
#include "MwRenamePopupController.h"
#include "MwResourceMgr.h"
#include "MwText.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwBookmarksContentView.edj";
constexpr auto LAYOUT_GROUP = "bookmarks_content_view";
constexpr auto BACK_PART = "prev_btn";
constexpr auto LEFT_PART = "title_left_btn";
constexpr auto LEFT_STYLE = "naviframe/title_left";
constexpr auto RIGHT_PART = "title_right_btn";
constexpr auto RIGHT_STYLE = "naviframe/title_right";
constexpr auto MORE_PART = "title_more_btn";

}

MwBookmarksContentViewController::MwBookmarksContentViewController(
    MwModel* model, MwAppController* appController, std::string mediaId)
    : MwContentViewController(model, appController)
    , _mediaId(std::move(mediaId))
{
}

MwBookmarksContentViewController::~MwBookmarksContentViewController() = default;

Evas_Object* MwBookmarksContentViewController::onCreateView(Evas_Object* parent, void*)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return nullptr;
    }
    Evas_Object* layout = elm_layout_add(parent);
    elm_layout_file_set(layout, path.c_str(), LAYOUT_GROUP);
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_show(layout);
    return layout;
}

void MwBookmarksContentViewController::onCreated()
{
    listenToSystemInfo([this](MwSignalMgr::SystemInfo info) { _systemInfoChanged(info); });
    setBackKeyHandler([this] { _backKeyClicked(); });
    _list = std::make_unique<MwBookmarksList>(getEvasObject(), _mediaId,
        MwBookmarksList::Screen{.onSelected = [this](MwBookmarkListItem& row) { _itemListenerCb(row); },
            .onKey = [this](const std::string& key) { return _playView && _playView->takeKey(key); }});
    _createPlayView();
}

void MwBookmarksContentViewController::onPushed(Evas_Object*)
{
    _updateTitle();
    _updateNaviButton();
    _updateMoreButton();
}

void MwBookmarksContentViewController::onDestroy()
{
    WTimer::destroy(_popJob);
    _renamePopup.reset();
    _playView = nullptr;
}

void MwBookmarksContentViewController::_createPlayView()
{
    if (_playView)
        return;
    if (getModel()->getCurrentPlayPath().empty()) {
        MW_LOGE("getCurrentPlayPath is null");
        return;
    }
    auto* panel = new MwPlayViewController(getModel(), getAppController());
    if (!panel->dock(getEvasObject(), MwPlayViewController::REPORTS_FILE_CHANGES)) {
        panel->destroy();
        return;
    }
    _playView = panel;
    panel->getEventSignal().addListener([this](MwPlayViewController::eventType event) { _playViewEvent(event); });
}

void MwBookmarksContentViewController::_destroyPlayView()
{
    if (MwPlayViewController* panel = std::exchange(_playView, nullptr); panel)
        panel->destroy();
}

void MwBookmarksContentViewController::_playViewEvent(int event)
{
    switch (event) {
    case MwPlayViewController::BOOKMARK_ADDED:
        _list->reload();
        _updateMoreButton();
        return _updateTitle();
    case MwPlayViewController::FILE_CHANGED:
    case MwPlayViewController::TRIM_REQUESTED:
        // The panel is still in the middle of it.
        _popJob = WTimer::addJob([this](void*) { popOut(); });
        return;
    }
    MW_LOGE("invalid eventType");
}

void MwBookmarksContentViewController::_systemInfoChanged(MwSignalMgr::SystemInfo info)
{
    if (info == MwSignalMgr::MEDIA_DB_UPDATED)
        return _mediaDBUpdated();
    if (info != MwSignalMgr::TIME_ZONE_CHANGED && info != MwSignalMgr::REGION_FORMAT_CHANGED) {
        MW_LOGW("Not handled signal : [%d]", info);
        return;
    }
    _updateTitle();
    _list->refresh();
}

void MwBookmarksContentViewController::_mediaDBUpdated()
{
    MwHandle<media_info_h, media_info_destroy> media;
    if (media_info_get_media_from_db(_mediaId.c_str(), media.out()) == MEDIA_CONTENT_ERROR_NONE)
        return;
    _closeRenamePopup();
    popOut();
}

void MwBookmarksContentViewController::_backKeyClicked()
{
    if (_mode == MwBookmarkListItem::NORMAL)
        return popOut();
    _enterMode(MwBookmarkListItem::NORMAL);
}

void MwBookmarksContentViewController::_enterMode(Mode mode)
{
    _mode = mode;
    if (mode == MwBookmarkListItem::NORMAL)
        _createPlayView();
    else
        _destroyPlayView();
    _list->setMode(mode);
    _updateTitle();
    _updateNaviButton();
    _updateMoreButton();
}

void MwBookmarksContentViewController::_updateTitle()
{
    if (_mode == MwBookmarkListItem::NORMAL)
        return setTitle("IDS_MW_BODY_BOOKMARKS");
    const int count = _mode == MwBookmarkListItem::DELETE ? _list->getCheckedCount() : 0;
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
    if (_mode == MwBookmarkListItem::NORMAL && !_list->isEmpty())
        setMoreButton([this] { _moreKeyClicked(); });
}

void MwBookmarksContentViewController::_updateCount()
{
    if (Evas_Object* button = elm_object_item_part_content_get(getNaviItem(), RIGHT_PART); button)
        elm_object_disabled_set(button, _list->getCheckedCount() == 0);
    _updateTitle();
}

void MwBookmarksContentViewController::_moreKeyClicked()
{
    if (_mode != MwBookmarkListItem::NORMAL || _list->isEmpty())
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

void MwBookmarksContentViewController::_itemListenerCb(MwBookmarkListItem& item)
{
    switch (_mode) {
    case MwBookmarkListItem::NORMAL:
        return _jumpTo(item);
    case MwBookmarkListItem::RENAME:
        return _openRenamePopup(item);
    case MwBookmarkListItem::DELETE:
        _list->toggle(item);
        return _updateCount();
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

void MwBookmarksContentViewController::_openRenamePopup(MwBookmarkListItem& item)
{
    if (_renamePopup) {
        MW_LOGW("rename popup already show");
        _closeRenamePopup();
    }
    _list->choose(item);
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

void MwBookmarksContentViewController::_renameResponseCb(const char* text, int response)
{
    if (response != MwRenamePopupController::RESPONSE_RENAME)
        return _closeRenamePopup();
    const std::string name = text ? text : "";
    if (name.find_first_not_of(' ') == std::string::npos)
        return mwPost("IDS_MW_POP_INVALID_FILE_NAME");
    if (_list->isNameTaken(_renamedBookmark, name))
        return mwPost("IDS_MW_POP_RENAMEALREADYUSED");
    _list->rename(_renamedBookmark, name);
    _closeRenamePopup();
    _enterMode(MwBookmarkListItem::NORMAL);
}

void MwBookmarksContentViewController::_deleteSelected()
{
    _list->deleteChecked();
    _enterMode(MwBookmarkListItem::NORMAL);
}
