#include "MwBookmarksContentViewController.h"

#include <Elementary.h>

#include <media_content.h>

#include <utility>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwPlayViewController.h"
#include "MwRenamePopupController.h"
#include "MwResourceMgr.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwBookmarksContentView.edj";
constexpr auto LAYOUT_GROUP = "bookmarks_content_view";

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
    _createList();
    _loadListItems();
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
        _reloadList();
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
    elm_genlist_realized_items_update(_genlist);
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
