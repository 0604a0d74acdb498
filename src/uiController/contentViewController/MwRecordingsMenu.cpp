// The recordings list: the menu, the back key and the other keys.
#include "MwRecordingsContentViewController.h"

#include <algorithm>
#include <array>
#include <utility>

#include <Elementary.h>

#include <media_content.h>
#include <panekit/WMenuPopupController.h>
#include <panekit/WNaviframeController.h>
#include <panekit/WPopupController.h>

#include "MwBookmarksContentViewController.h"
#include "MwDetailsContentViewController.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwPlayViewController.h"
#include "MwRecordingsRows.h"
#include "MwSaveToPopup.h"
#include "MwStorageRoots.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "MwTrimViewController.h"

using panekit::WMenuPopupController;
using panekit::WPopupController;

namespace {

constexpr int ALL_ROWS = 1 << 30;

int bookmarkCount(const std::string& mediaId)
{
    int count = 0;
    if (const int result = media_info_get_bookmark_count_from_db(mediaId.c_str(), nullptr, &count); result != 0)
        MW_LOGE("media_info_get_bookmark_count_from_db : [%d]!!!", result);
    return count;
}

// How far a key moves the highlight, 0 for other keys.
int rowsOfKey(const std::string& key, int page)
{
    struct Move {
        const char* key;
        int rows;
    };
    const std::array<Move, 6> moves = {{
        {.key = "Down", .rows = 1},
        {.key = "Up", .rows = -1},
        {.key = "Next", .rows = page},
        {.key = "Prior", .rows = -page},
        {.key = "End", .rows = ALL_ROWS},
        {.key = "Home", .rows = -ALL_ROWS},
    }};
    const auto found = std::find_if(moves.begin(), moves.end(), [&](const Move& move) { return key == move.key; });
    return found != moves.end() ? found->rows : 0;
}

bool isBelow(const std::string& path, const std::string& root) { return path.starts_with(root + "/"); }

struct PrivateFiles {
    bool outside = false;
    bool inside = false;
};

PrivateFiles findPrivateFiles(const std::vector<MwFileInfo>& files)
{
    const std::string device = mwDeviceRoot();
    const std::string card = mwCardRoot();
    const std::string privateRoot = mwPrivateRoot();
    PrivateFiles found;
    for (const MwFileInfo& info : files) {
        if (isBelow(info.path, privateRoot))
            found.inside = true;
        else if (isBelow(info.path, device) || isBelow(info.path, card))
            found.outside = true;
    }
    return found;
}

}

void MwRecordingsContentViewController::_clickMoreKey()
{
    if (!_isComplete())
        return;
    if (_noContents && !getModel()->hasHiddenRecordings()) {
        MW_LOGW("No contents");
        return;
    }
    if (getModel()->isTrimMode() || _viewType != NORMAL || _renamePopup || _saveToPopup || _fileOperator)
        return;
    const std::string path = getModel()->getCurrentPlayPath();
    const MwFileInfo* info = path.empty() ? nullptr : getModel()->getRecordedFileInfoByPath(path);
    auto* menu = new WMenuPopupController();
    if (_genlist) {
        menu->addItem("IDS_MW_OPT_DELETE", [this] { _clickDeleteMenu(); });
        menu->addItem("IDS_MW_BODY_SHARE", [this] { _clickShareMenu(); });
        menu->addItem("IDS_MUSIC_OPT_RENAME", [this] { _clickRenameMenu(); });
    }
    if (info && bookmarkCount(info->mediaId) > 0)
        menu->addItem("IDS_MW_BODY_BOOKMARKS", [this] { _openBookmarks(); });
    if (info)
        menu->addItem("IDS_MW_OPT_DETAILS", [this] { _openDetails(); });
    _addPrivateItems(*menu);
    if (MwSystemMgr::getInstance()->isMMCMounted()) {
        menu->addItem("IDS_MW_HEADER_SAVE_TO", [this] {
            MW_LOGW("create save to menu");
            _createSaveToPopup();
        });
    }
    attachPopup(menu);
    menu->create(getWindow(), elm_object_item_widget_get(getNaviItem()));
}

void MwRecordingsContentViewController::_addPrivateItems(WMenuPopupController& menu)
{
    const MwSystemMgr* system = MwSystemMgr::getInstance();
    if (!system->isPrivateModeInitialized() || system->isUPSModeEnabled())
        return;
    const PrivateFiles files = findPrivateFiles(getModel()->getRecordedFileList());
    if (files.outside) {
        menu.addItem("IDS_GALLERY_OPT_MOVE_TO_PRIVATE", [this, system] {
            MwLoggingMgr::getInstance()->insert("MTPR");
            MwLoggingMgr::getInstance()->insert("MTPF", system->isPrivateModeEnabled() ? "on" : "off");
            _loadPrivateMoveView(MOVE_TO_PRIVATE);
        });
    }
    if (!files.inside && !getModel()->hasHiddenRecordings())
        return;
    menu.addItem("IDS_GALLERY_OPT_REMOVE_FROM_PRIVATE", [this] { _openPrivateMoveView(); });
    menu.addItem(files.inside ? "IDS_MW_OPT_HIDE_PRIVATE_RECORDINGS" : "IDS_MW_OPT_SHOW_PRIVATE_RECORDINGS",
        [this] { _togglePrivateRecordings(); });
}

void MwRecordingsContentViewController::_openPrivateMoveView()
{
    if (!getModel()->hasHiddenRecordings())
        return _loadPrivateMoveView(REMOVE_FROM_PRIVATE);
    _privateStorage->open([this](bool open) {
        if (!open)
            return mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
        if (_viewType != NORMAL || _fileOperator)
            return _privateStorage->handBack();
        getModel()->createRecordedFileList();
        _loadPrivateMoveView(REMOVE_FROM_PRIVATE);
    });
}

// What is shown is hidden again with the screen at the latest, unless it was shown before.
void MwRecordingsContentViewController::_togglePrivateRecordings()
{
    if (!getModel()->hasHiddenRecordings())
        return _privateStorage->close();
    _privateStorage->open([](bool open) {
        if (!open)
            mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
    });
}

void MwRecordingsContentViewController::_enterViewType(ViewType type)
{
    _viewType = type;
    _update();
}

void MwRecordingsContentViewController::_loadPrivateMoveView(ViewType type)
{
    _reloadNeeded = true;
    _stopPlaying();
    getModel()->setCurrentPlayPath("");
    _enterViewType(type);
}

void MwRecordingsContentViewController::_clickDeleteMenu()
{
    if (getModel()->getCurrentPlayPath().empty())
        return _enterViewType(DELETE);
    _createDeletePopup([this] { _deletePlayingFile(); });
}

void MwRecordingsContentViewController::_createDeletePopup(std::function<void()> confirmed, const char* question)
{
    auto* popup = new WPopupController();
    popup->setTitle("IDS_MW_OPT_DELETE");
    popup->setContent(question);
    popup->addButton("IDS_MW_BUTTON_CANCEL", [](WPopupController* self) { self->destroy(); });
    popup->addButton("IDS_MW_OPT_DELETE", [confirmed = std::move(confirmed)](WPopupController* self) {
        const auto action = confirmed; // goes with the popup
        self->destroy();
        action();
    });
    attachPopup(popup);
    popup->create(getWindow());
}

void MwRecordingsContentViewController::_clickShareMenu()
{
    const std::string path = getModel()->getCurrentPlayPath();
    if (path.empty())
        _enterViewType(SHARE);
    else
        _clickShareDoneButton({path});
}

void MwRecordingsContentViewController::_clickRenameMenu()
{
    const std::string path = getModel()->getCurrentPlayPath();
    if (path.empty())
        _enterViewType(RENAME);
    else
        _openRenamePopup(path);
    MwLoggingMgr::getInstance()->insert("Rena", "RecordedFiles");
}

void MwRecordingsContentViewController::_openBookmarks()
{
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(getModel()->getCurrentPlayPath());
    if (info)
        getNaviframe()->push(new MwBookmarksContentViewController(getModel(), getAppController(), info->mediaId));
}

void MwRecordingsContentViewController::_openDetails()
{
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(getModel()->getCurrentPlayPath());
    if (info)
        getNaviframe()->push(new MwDetailsContentViewController(getModel(), getAppController(), *info));
}

void MwRecordingsContentViewController::_createSaveToPopup()
{
    if (_saveToPopup)
        return;
    _saveToPopup = mwCreateSaveToPopup(getWindow(), getModel());
    _saveToPopup->setOnDestroyed([this] { _saveToPopup = nullptr; });
}

void MwRecordingsContentViewController::_destroySaveToPopup()
{
    if (auto* popup = std::exchange(_saveToPopup, nullptr); popup)
        popup->destroy();
}

void MwRecordingsContentViewController::_clickBackKey()
{
    if (!_isComplete())
        return;
    // While the trim panel is docked, leaving it is its own business.
    if (_trimView)
        return _trimView->back();
    const bool rests = _viewType == NORMAL || _viewType == PICK;
    if (rests && getModel()->getCurrentPlayPath().empty())
        return popOut();
    if (getModel()->getPlayerState() != PLAY_STATE_NONE
        && !getAppController()->dispatchCommand(MwAppController::STOP_PLAYING)) {
        MW_LOGE("play stop failed!");
        return;
    }
    getModel()->setCurrentPlayPath("");
    if (_viewType == MOVE_TO_PRIVATE || _viewType == REMOVE_FROM_PRIVATE) {
        _reloadNeeded = true;
        _privateStorage->cancel();
        _privateStorage->handBack();
    }
    _viewType = _restingViewType();
    getModel()->setTrimMode(false);
    _update();
}

// Keys for whatever has the keyboard on this screen. The list itself takes arrows, Return and the like.
void MwRecordingsContentViewController::_listenToKeys()
{
    const auto pressed = [](void* data, Evas_Object*, Evas_Object*, Evas_Callback_Type type, void* info) -> Eina_Bool {
        auto* event = static_cast<Evas_Event_Key_Down*>(info);
        if (type != EVAS_CALLBACK_KEY_DOWN || (event->event_flags & EVAS_EVENT_FLAG_ON_HOLD))
            return EINA_FALSE;
        if (!static_cast<MwRecordingsContentViewController*>(data)->_keyPressed(event->key))
            return EINA_FALSE;
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
        return EINA_TRUE;
    };
    elm_object_event_callback_add(getEvasObject(), pressed, this);
}

// Before the list makes a scroll of Left and Right; the rest is like the list's own, but for the mark, which the list
// moves only while its window has the keyboard.
void MwRecordingsContentViewController::_listenToListKeys()
{
    const auto pressed = [](void* data, Evas*, Evas_Object*, void* info) {
        auto* event = static_cast<Evas_Event_Key_Down*>(info);
        auto* self = static_cast<MwRecordingsContentViewController*>(data);
        if (self->_keyPressed(event->key) || self->_listKeyPressed(event->key))
            event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
    };
    // What has the keyboard when the list is focused is its inner object.
    evas_object_event_callback_priority_add(
        elm_layout_edje_get(_genlist), EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, pressed, this);
    const auto unfocused = [](void* data, Evas_Object*, void*) {
        if (const auto* self = static_cast<MwRecordingsContentViewController*>(data); self->_rows)
            self->_rows->removeHighlight();
    };
    evas_object_smart_callback_add(_genlist, "unfocused", unfocused, this);
}

bool MwRecordingsContentViewController::_keyPressed(const std::string& key)
{
    if (!_isComplete() || _viewType != NORMAL || !_genlist || _fileOperator || getModel()->isTrimMode())
        return false;
    if (key == "Delete" || key == "KP_Delete")
        _deleteHighlighted();
    else if (key == "F2")
        _renameHighlighted();
    else
        return false;
    return true;
}

bool MwRecordingsContentViewController::_listKeyPressed(const std::string& key)
{
    if (_playView && _playView->takeKey(key))
        return true;
    if (key == "space" || key == "Return" || key == "KP_Enter")
        _tapHighlighted();
    else if (const int rows = rowsOfKey(key, _rows->getPage()); rows != 0)
        _rows->moveHighlight(rows);
    else
        return false;
    return true;
}

void MwRecordingsContentViewController::_tapHighlighted()
{
    if (MwRecordingsListItem* row = _rows->getHighlighted(); row)
        _onSelectListItem(*row);
}

// The recording that is loaded, else the one that the arrow keys went to.
std::string MwRecordingsContentViewController::_highlightedPath() const
{
    if (std::string path = getModel()->getCurrentPlayPath(); !path.empty())
        return path;
    const MwRecordingsListItem* row = _rows->getHighlighted();
    return row ? row->getPath() : std::string();
}

void MwRecordingsContentViewController::_deleteHighlighted()
{
    const std::string path = _highlightedPath();
    if (path.empty())
        return;
    if (path == getModel()->getCurrentPlayPath())
        _createDeletePopup([this] { _deletePlayingFile(); });
    else
        _createDeletePopup([this, path] { _clickDeleteButton({path}); });
}

void MwRecordingsContentViewController::_renameHighlighted()
{
    if (const std::string path = _highlightedPath(); !path.empty())
        _openRenamePopup(path);
}
