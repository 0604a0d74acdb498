#include "MwRecordingsContentViewController.h"

#include <array>
#include <utility>

#include <Elementary.h>

#include <app.h>
#include <panekit/WNaviframeController.h>
#include <panekit/WPopupController.h>
#include <panekit/WTimer.h>

#include "MwBookmarksContentViewController.h"
#include "MwDetailsContentViewController.h"
#include "MwFileDeleter.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwPickReply.h"
#include "MwRecordingsMode.h"
#include "MwResourceMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WPopupController;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto LAYOUT_GROUP = "recordings_content_view";
constexpr auto TITLE = "IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB";

// One line for each view type, in their order.
const MwRecordingsMode& modeOf(MwRecordingsContentViewController::ViewType type)
{
    using Item = MwRecordingsListItem;
    using Rows = MwRecordingsRows;
    using Buttons = MwRecordingsMode::Buttons;
    constexpr auto DONE = "IDS_TPLATFORM_ACBUTTON_DONE_ABB";
    static constexpr std::array<MwRecordingsMode, 7> MODES = {{
        {.titleId = TITLE, .buttons = Buttons::BACK, .listType = Item::NO_CHOICE, .plays = true, .hasMenu = true},
        {.titleId = "IDS_GALLERY_HEADER_SELECT",
            .doneTextId = DONE,
            .listType = Item::SINGLE_CHOICE,
            .files = Rows::FOR_REQUEST,
            .plays = true,
            .picks = true},
        {.doneTextId = "IDS_TPLATFORM_ACBUTTON_DELETE_ABB"},
        {.doneTextId = DONE},
        {.titleId = "IDS_FM_HEADER_SELECT_RECORDING", .buttons = Buttons::BACK, .listType = Item::SINGLE_CHOICE},
        {.doneTextId = DONE, .files = Rows::OUTSIDE_PRIVATE},
        {.doneTextId = DONE, .files = Rows::IN_PRIVATE},
    }};
    return MODES.at(static_cast<size_t>(type));
}

}

MwRecordingsContentViewController::MwRecordingsContentViewController(MwModel* model, MwAppController* appController)
    : MwContentViewController(model, appController)
    , _playing(model, appController)
    , _saveToPopup(model)
{
    setTitle(TITLE);
}

MwRecordingsContentViewController::~MwRecordingsContentViewController() = default;

Evas_Object* MwRecordingsContentViewController::onCreateView(Evas_Object* parent, void*)
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

bool MwRecordingsContentViewController::_isComplete() const
{
    if (!getModel()) {
        MW_LOGE("model == nullptr");
        return false;
    }
    if (!getAppController()) {
        MW_LOGE("appController == nullptr");
        return false;
    }
    return true;
}

void MwRecordingsContentViewController::onCreated()
{
    if (!_isComplete())
        return;
    _createParts();
    _listen();
    getModel()->createRecordedFileList();
    _setViewType(_restingViewType());
    _list->load();
    _dock->createRecordController();
}

void MwRecordingsContentViewController::_createParts()
{
    const auto redraw = [this] { _update(); };
    const auto enterNormal = [this] { _enterViewType(NORMAL); };
    _list = std::make_unique<MwRecordingsList>(getEvasObject(), getModel(), modeOf(_viewType),
        MwRecordingsList::Screen{.onSelected = [this](MwRecordingsListItem& row) { _onSelectListItem(row); },
            .onKey = [this](const std::string& key) { return _keyPressed(key) || _dock->takeKey(key); },
            .onListCreated = [this] { _focusList(); }});
    _dock = std::make_unique<MwRecordingsDock>(getEvasObject(), getModel(), getAppController(),
        MwRecordingsDock::Screen{.recordingStarted = [this] { _recordingStarted(); },
            .bookmarkAdded = [this] { _list->forgetBookmarks(); },
            .fileChanged = [this] { _list->refreshRealizedItems(); },
            .trimRequested = redraw,
            .trimEnded = [this](bool saved) { _trimEnded(saved); }});
    _title = std::make_unique<MwRecordingsTitle>(*this,
        MwRecordingsTitle::Actions{.back = [this] { _clickBackKey(); },
            .done = [this] { _titleRightButtonClicked(); },
            .more = [this] { _clickMoreKey(); }});
    _fileJob = std::make_unique<MwRecordingsFileJob>(getWindow(), getModel(), &_privateStorage);
    _renaming = std::make_unique<MwRecordingsRenaming>(getModel(), _fileJob.get(), enterNormal);
    _sharing = std::make_unique<MwRecordingsSharing>(enterNormal);
    _follower = std::make_unique<MwCatalogueFollower>(
        getModel(), [this] { return _fileJob->isRunning(); }, [this] { _catalogueRead(); });
}

void MwRecordingsContentViewController::onPushed(Evas_Object*)
{
    if (!_isComplete())
        return;
    setMoreButton([this] { _clickMoreKey(); });
    _loadTitle();
    _focusList();
}

void MwRecordingsContentViewController::_listen()
{
    listenToSystemInfo([this](MwSignalMgr::SystemInfo info) { _onSystemInfoSignal(info); });
    // Goes with the view, or with the controller when that ends first.
    getAppController()->getPlayerUpdatedSignal().addListener([this] { _onPlayerUpdateSignal(); }, getEvasObject());
    setBackKeyHandler([this] { _clickBackKey(); });
    _listenToKeys();
    // The number in the title is no identifier that the toolkit could translate again.
    const auto retranslate = [](void* data, Evas_Object*, void*) {
        auto* self = static_cast<MwRecordingsContentViewController*>(data);
        self->_loadTitle();
        self->_list->refreshRealizedItems();
    };
    evas_object_smart_callback_add(getEvasObject(), "language,changed", retranslate, this);
}

// What must not outlive the screen. Leaving it and its window's end both come here.
void MwRecordingsContentViewController::onDestroy()
{
    if (!_list)
        return;
    _list->close();
    _dock->forget();
    _endJobs();
    _renaming->_closeRenamePopup();
    _saveToPopup.close();
}

void MwRecordingsContentViewController::_endJobs()
{
    _sharing->cancel();
    _privateStorage.cancel();
    _fileJob->end();
}

bool MwRecordingsContentViewController::onPop()
{
    if (_list) {
        _list->close(); // before the records it shows
        getModel()->setTrimMode(false);
        getModel()->destroyRecordedFileList();
        _endJobs();
        _privateStorage.handBack();
    }
    return MwContentViewController::onPop();
}

void MwRecordingsContentViewController::onTop()
{
    if (!_isComplete())
        return;
    _dock->clear();
    _dock->update(modeOf(_viewType));
    // The screen above may have removed bookmarks.
    _list->forgetBookmarks();
}

// The naviframe gives the keyboard to what comes first in the title.
void MwRecordingsContentViewController::onBecomeTop()
{
    if (_list)
        _focusList();
}

void MwRecordingsContentViewController::_onPlayerUpdateSignal()
{
    if (!_isComplete())
        return;
    _update();
    _list->bringInItem();
}

void MwRecordingsContentViewController::_onSystemInfoSignal(MwSignalMgr::SystemInfo info)
{
    MW_LOGW("system info signal: [%d]", info);
    if (!_isComplete())
        return;
    switch (info) {
    case MwSignalMgr::MMC_REMOVED:
        return _saveToPopup.close();
    case MwSignalMgr::MEDIA_DB_UPDATED:
        return _mediaDBUpdated();
    case MwSignalMgr::TIME_ZONE_CHANGED:
    case MwSignalMgr::REGION_FORMAT_CHANGED:
        return _formatChanged();
    case MwSignalMgr::POWER_OFF:
    case MwSignalMgr::UPS_MODE_CHANGED:
        return _stopAndExit();
    case MwSignalMgr::EARJACK_INSERTED:
        return _earjackInserted();
    case MwSignalMgr::EARJACK_REMOVED:
        return _playing.pause();
    case MwSignalMgr::THEME_CHANGED:
        return _themeChanged();
    case MwSignalMgr::LOCKSCREEN_CHANGED:
    case MwSignalMgr::MINI_CONTROLLER_RECORDING_SAVED:
    case MwSignalMgr::POWER_STATE_CHANGED:
    case MwSignalMgr::CALL_REJECT_CHANGED:
    case MwSignalMgr::MICROPHONE_BACK:
        return;
    case MwSignalMgr::PRIVATE_STORAGE_CHANGED:
        return _privateStorageChanged();
    }
}

// What was opened for a move or its selection is not news.
void MwRecordingsContentViewController::_privateStorageChanged()
{
    const bool isSelecting = _viewType == MOVE_TO_PRIVATE || _viewType == REMOVE_FROM_PRIVATE;
    if (!_privateStorage.isOpening() && !(isSelecting && MwSystemMgr::getInstance()->isPrivateModeEnabled()))
        _mediaDBUpdated();
}

void MwRecordingsContentViewController::_mediaDBUpdated()
{
    destroyAttachedPopup();
    _sharing->cancel();
    _follower->follow();
}

void MwRecordingsContentViewController::_catalogueRead()
{
    _reloadNeeded = true;
    if (_viewType == RENAME && _renaming->isOpen() && !getModel()->getRecordedFileInfoByPath(_renaming->path()))
        _renaming->_closeRenamePopup();
    _forgetVanishedPlayPath();
    _setViewType(_restingViewType());
    if (_viewType == NORMAL)
        _renaming->_closeRenamePopup();
    _update();
    _list->forgetBookmarks();
}

void MwRecordingsContentViewController::_forgetVanishedPlayPath()
{
    const std::string path = getModel()->getCurrentPlayPath();
    if (path.empty() || (ecore_file_exists(path.c_str()) && !getModel()->isHiddenRecording(path)))
        return;
    getModel()->setCurrentPlayPath("");
    if (_dock->isEmpty())
        return;
    getModel()->setTrimMode(false);
    _playing.stop();
}

void MwRecordingsContentViewController::_formatChanged()
{
    _loadTitle();
    _list->renewDates();
    _fileJob->updateDuplicationPopup();
}

void MwRecordingsContentViewController::_themeChanged()
{
    _list->colourNoContents();
    _list->refreshRealizedItems();
}

void MwRecordingsContentViewController::_stopAndExit()
{
    _playing.stop();
    ui_app_exit();
}

void MwRecordingsContentViewController::_earjackInserted()
{
    if (isTop() && getModel()->getAppState() == MwModel::APP_STATE_RESUMED && !_dock->hasPanel())
        mwPost("IDS_MW_TPOP_EXTERNAL_MICROPHONE_WILL_BE_USED_TO_RECORD");
}

void MwRecordingsContentViewController::_update()
{
    if (!_isComplete())
        return;
    MW_LOGW("viewType : [%d], playerState : [%d]", _viewType, mwNumber(getModel()->getPlayerState()));
    if (std::exchange(_reloadNeeded, false))
        _list->load();
    _list->update();
    _loadTitle();
    _dock->update(modeOf(_viewType));
    _list->setDisabled(getModel()->isTrimMode());
}

void MwRecordingsContentViewController::_setViewType(ViewType type)
{
    _viewType = type;
    _list->setMode(modeOf(type));
}

void MwRecordingsContentViewController::_enterViewType(ViewType type)
{
    _setViewType(type);
    _update();
}

MwRecordingsContentViewController::ViewType MwRecordingsContentViewController::_restingViewType() const
{
    return getModel()->isRequestMode() ? PICK : NORMAL;
}

void MwRecordingsContentViewController::_loadTitle()
{
    const MwRecordingsMode& mode = modeOf(_viewType);
    _title->_loadTitle(mode, !_list->isShown(), _list->getCheckedCount());
    _title->_loadTitleButtons(mode, !_list->isShown());
    _title->_loadMoreButton(mode.hasMenu && (_list->isShown() || getModel()->hasHiddenRecordings()));
    _enableDoneButton();
}

void MwRecordingsContentViewController::_enableDoneButton()
{
    const bool isMultiple = modeOf(_viewType).listType == MwRecordingsListItem::MULTIPLE_CHOICE;
    _title->_enableDoneButton(isMultiple ? _list->getCheckedCount() > 0 : _list->hasChoice());
}

// The arrow keys mean the list, unless something lies over it.
void MwRecordingsContentViewController::_focusList()
{
    if (isTop() && !hasAttachedPopup() && !WPopupController::topmost())
        _list->focus();
}

void MwRecordingsContentViewController::_recordingStarted()
{
    if (isTop())
        popOut(); // to the screen of the recorder
}

// Closed or saved, the player comes back.
void MwRecordingsContentViewController::_trimEnded(bool saved)
{
    if (saved) {
        getModel()->createRecordedFileList();
        getModel()->setCurrentPlayPosition(0);
        _reloadNeeded = true;
    }
    _update();
    _focusList(); // what had the keyboard is gone
}

void MwRecordingsContentViewController::_onSelectListItem(MwRecordingsListItem& item)
{
    if (!_isComplete())
        return;
    switch (modeOf(_viewType).listType) {
    case MwRecordingsListItem::NO_CHOICE:
        return _playListItem(item);
    case MwRecordingsListItem::MULTIPLE_CHOICE:
        _list->toggle(item);
        return _loadTitle();
    case MwRecordingsListItem::SINGLE_CHOICE:
        break;
    }
    _list->choose(item);
    if (_viewType == RENAME)
        return _renaming->_openRenamePopup(getWindow(), item.getPath());
    _playListItem(item);
    _enableDoneButton();
}

void MwRecordingsContentViewController::_playListItem(MwRecordingsListItem& item)
{
    switch (_playing.tap(item.getPath())) {
    case MwRecordingsPlaying::Tap::STARTED:
        _list->bringInAfterFrame();
        return item.refresh();
    case MwRecordingsPlaying::Tap::CHANGED:
        return _list->refreshRealizedItems();
    case MwRecordingsPlaying::Tap::FAILED:
    case MwRecordingsPlaying::Tap::TOGGLED:
        return;
    }
}

void MwRecordingsContentViewController::_titleRightButtonClicked()
{
    if (!_list->isShown())
        return;
    switch (_viewType) {
    case PICK:
        mwReplyWithRecording(*getModel(), _list->getChosenPath());
        return;
    case DELETE:
        return _startDeleting(_list->getCheckedPaths(), false);
    case SHARE:
        _sharing->share(_list->getCheckedPaths());
        return;
    case MOVE_TO_PRIVATE:
    case REMOVE_FROM_PRIVATE:
        return _clickMoveDoneButton(_list->getCheckedPaths());
    case NORMAL:
    case RENAME:
        break;
    }
    MW_LOGE("View type error : [%d]!!!", _viewType);
}

void MwRecordingsContentViewController::_clickMoreKey()
{
    if (!_isComplete())
        return;
    if (!_list->isShown() && !getModel()->hasHiddenRecordings()) {
        MW_LOGW("No contents");
        return;
    }
    if (getModel()->isTrimMode() || _viewType != NORMAL || _renaming->isOpen() || _saveToPopup.isOpen()
        || _fileJob->isRunning())
        return;
    MwRecordingsMenu::open(*this, [this](MwRecordingsMenu::Item item) { _menuItemChosen(item); });
}

void MwRecordingsContentViewController::_menuItemChosen(MwRecordingsMenu::Item item)
{
    const std::string path = getModel()->getCurrentPlayPath();
    switch (item) {
    case MwRecordingsMenu::DELETE:
        return path.empty() ? _enterViewType(DELETE) : _createDeletePopup([this] { _deletePlayingFile(); });
    case MwRecordingsMenu::SHARE:
        if (path.empty())
            _enterViewType(SHARE);
        else
            _sharing->share({path});
        return;
    case MwRecordingsMenu::RENAME:
        if (path.empty())
            _enterViewType(RENAME);
        else
            _renaming->_openRenamePopup(getWindow(), path);
        MwLoggingMgr::getInstance()->insert("Rena", "RecordedFiles");
        return;
    case MwRecordingsMenu::BOOKMARKS:
        return _openBookmarks();
    case MwRecordingsMenu::DETAILS:
        return _openDetails();
    case MwRecordingsMenu::MOVE_TO_PRIVATE:
        MwLoggingMgr::getInstance()->insert("MTPR");
        MwLoggingMgr::getInstance()->insert("MTPF", MwSystemMgr::getInstance()->isPrivateModeEnabled() ? "on" : "off");
        return _loadPrivateMoveView(MOVE_TO_PRIVATE);
    case MwRecordingsMenu::REMOVE_FROM_PRIVATE:
        return _openPrivateMoveView();
    case MwRecordingsMenu::HIDE_PRIVATE:
        return _privateStorage.close();
    case MwRecordingsMenu::SHOW_PRIVATE:
        return _showPrivateRecordings();
    case MwRecordingsMenu::SAVE_TO:
        return _saveToPopup.open(getWindow());
    }
}

void MwRecordingsContentViewController::_openPrivateMoveView()
{
    if (!getModel()->hasHiddenRecordings())
        return _loadPrivateMoveView(REMOVE_FROM_PRIVATE);
    _privateStorage.open([this](bool open) {
        if (!open)
            return mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
        if (_viewType != NORMAL || _fileJob->isRunning())
            return _privateStorage.handBack();
        getModel()->createRecordedFileList();
        _loadPrivateMoveView(REMOVE_FROM_PRIVATE);
    });
}

// What is shown is hidden again with the screen at the latest, unless it was shown before.
void MwRecordingsContentViewController::_showPrivateRecordings()
{
    _privateStorage.open([](bool open) {
        if (!open)
            mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
    });
}

void MwRecordingsContentViewController::_loadPrivateMoveView(ViewType type)
{
    _reloadNeeded = true;
    _playing.stop();
    getModel()->setCurrentPlayPath("");
    _enterViewType(type);
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

void MwRecordingsContentViewController::_clickBackKey()
{
    if (!_isComplete() || _dock->takeBack())
        return;
    const bool rests = _viewType == NORMAL || _viewType == PICK;
    if (rests && getModel()->getCurrentPlayPath().empty())
        return popOut();
    if (!_playing.stop())
        return;
    getModel()->setCurrentPlayPath("");
    if (_viewType == MOVE_TO_PRIVATE || _viewType == REMOVE_FROM_PRIVATE) {
        _reloadNeeded = true;
        _privateStorage.cancel();
        _privateStorage.handBack();
    }
    getModel()->setTrimMode(false);
    _enterViewType(_restingViewType());
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

bool MwRecordingsContentViewController::_keyPressed(const std::string& key)
{
    if (!_isComplete() || _viewType != NORMAL || !_list->isShown() || _fileJob->isRunning() || getModel()->isTrimMode())
        return false;
    if (key == "Delete" || key == "KP_Delete")
        _deleteHighlighted();
    else if (key == "F2")
        _renameHighlighted();
    else
        return false;
    return true;
}

// The recording that is loaded, else the one that the arrow keys went to.
std::string MwRecordingsContentViewController::_highlightedPath() const
{
    const std::string path = getModel()->getCurrentPlayPath();
    return path.empty() ? _list->getHighlightedPath() : path;
}

void MwRecordingsContentViewController::_deleteHighlighted()
{
    const std::string path = _highlightedPath();
    if (path.empty())
        return;
    if (path == getModel()->getCurrentPlayPath())
        _createDeletePopup([this] { _deletePlayingFile(); });
    else
        _createDeletePopup([this, path] { _startDeleting({path}, false); });
}

void MwRecordingsContentViewController::_renameHighlighted()
{
    if (const std::string path = _highlightedPath(); !path.empty())
        _renaming->_openRenamePopup(getWindow(), path);
}

void MwRecordingsContentViewController::_startDeleting(const std::vector<std::string>& pathList, bool forGood)
{
    _fileJob->remove(
        pathList, forGood, [this](const MwRecordingsFileJob::Deleted& deleted) { _onDeleteFiles(deleted); });
}

void MwRecordingsContentViewController::_onDeleteFiles(const MwRecordingsFileJob::Deleted& deleted)
{
    if (!deleted.hasBegun) {
        if (_catchUp())
            _update();
        return;
    }
    getModel()->removeRecordedFiles(deleted.donePaths);
    if (deleted.hasFailed)
        mwPost("IDS_MW_TPOP_SOME_RECORDINGS_NOT_DELETED");
    _catchUp();
    _catalogueShrank();
    _enterViewType(NORMAL);
    if (deleted.withoutTrash.empty())
        return;
    // After the former popup, and the list behind it, are gone for good.
    panekit::WTimer::addJob([this, alive = std::weak_ptr<void>(token()), rest = deleted.withoutTrash](void*) {
        if (!alive.expired())
            _askToDeleteForGood(rest);
    });
}

void MwRecordingsContentViewController::_askToDeleteForGood(const std::vector<std::string>& pathList)
{
    const std::string question = pathList.size() == 1
        ? mwTranslate("IDS_MW_POP_RECORDING_CANNOT_GO_TO_THE_TRASH_DELETE_FOR_GOOD_Q")
        : mwTranslateNumber("IDS_MW_POP_PD_RECORDINGS_CANNOT_GO_TO_THE_TRASH_DELETE_FOR_GOOD_Q", pathList.size());
    _createDeletePopup([this, pathList] { _startDeleting(pathList, true); }, question.c_str());
}

// With what the database was told of while a job ran. False when that was nothing.
bool MwRecordingsContentViewController::_catchUp()
{
    if (!_follower->catchUp())
        return false;
    return _reloadNeeded = true;
}

void MwRecordingsContentViewController::_catalogueShrank()
{
    if (getModel()->getRecordedFileList().empty())
        _reloadNeeded = true;
    if (!getModel()->updateLastRecordedFileNumber())
        MW_LOGE("updateLastRecordedFileNumber failed!");
}

void MwRecordingsContentViewController::_deletePlayingFile()
{
    const std::string path = getModel()->getCurrentPlayPath();
    const MwFileInfo* info = getModel()->getRecordedFileInfoByPath(path);
    MwFileDeleter deleter(true); // asked already
    deleter.remove(path, info ? info->mediaId : std::string());
    if (deleter.finish().empty()) {
        mwPost("IDS_MW_TPOP_SOME_RECORDINGS_NOT_DELETED");
        return;
    }
    getModel()->removeRecordedFiles({path});
    getModel()->setCurrentPlayPath("");
    _catalogueShrank();
    if (getModel()->getPlayerState() == PLAY_STATE_NONE)
        _update();
    else
        _playing.stop();
}

void MwRecordingsContentViewController::_clickMoveDoneButton(const std::vector<std::string>& pathList)
{
    // Nothing else is held up while the service makes up its mind.
    if (pathList.empty() || _fileJob->isRunning() || _privateStorage.isOpening())
        return;
    _privateStorage.open([this, pathList](bool open) {
        if (open)
            _moveStart(pathList);
        else
            mwPost("IDS_MW_TPOP_PRIVATE_STORAGE_NOT_AVAILABLE");
    });
}

void MwRecordingsContentViewController::_moveStart(const std::vector<std::string>& pathList)
{
    // The user may have left the selection, or begun something else, while the storage was made available.
    if ((_viewType != MOVE_TO_PRIVATE && _viewType != REMOVE_FROM_PRIVATE) || _fileJob->isRunning())
        return _privateStorage.handBack();
    const auto type
        = _viewType == MOVE_TO_PRIVATE ? MwFileOperator::MOVE_TO_PRIVATE : MwFileOperator::REMOVE_FROM_PRIVATE;
    _fileJob->move(type, pathList, [this] { _onMoveFiles(); });
}

void MwRecordingsContentViewController::_onMoveFiles()
{
    if (!MwSystemMgr::getInstance()->isPrivateModeEnabledByApp()) {
        getModel()->createRecordedFileList();
        _reloadNeeded = true;
    }
    _enterViewType(NORMAL);
}
