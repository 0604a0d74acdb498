#include "MwRecordingsContentViewController.h"

#include <utility>

#include <Elementary.h>

#include <app.h>
#include <panekit/WMenuPopupController.h>
#include <panekit/WPopupController.h>

#include "MwCatalogueReader.h"
#include "MwFileOperationPopup.h"
#include "MwFileOperator.h"
#include "MwListDates.h"
#include "MwLog.h"
#include "MwPlayViewController.h"
#include "MwRecordingsModes.h"
#include "MwRecordingsRows.h"
#include "MwRenamePopupController.h"
#include "MwResourceMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto LAYOUT_GROUP = "recordings_content_view";
constexpr auto TITLE = "IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB";
constexpr size_t READ_AT_ONCE = 500; // recordings: nobody notices a few milliseconds

}

MwRecordingsContentViewController::MwRecordingsContentViewController(MwModel* model, MwAppController* appController)
    : MwContentViewController(model, appController)
{
    setTitle(TITLE);
    _catalogueReader = std::make_unique<MwCatalogueReader>(
        [this](std::vector<MwFileInfo> files) { _adoptCatalogue(std::move(files)); });
    _rowContext.model = model;
    _rowContext.getListType = [this] { return _getListType(); };
    _rowContext.onSelected = [this](MwRecordingsListItem& item) { _onSelectListItem(item); };
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
    _listen();
    getModel()->createRecordedFileList();
    _viewType = _restingViewType();
    _loadContents();
    _createRecordController();
}

void MwRecordingsContentViewController::onPushed(Evas_Object*)
{
    if (!_isComplete())
        return;
    _loadTitle(0);
    _loadTitleButtons();
    setMoreButton([this] { _clickMoreKey(); });
    _loadMoreButton();
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
        self->_loadTitle(self->_checkedCount());
        self->_refreshRealizedItems();
    };
    evas_object_smart_callback_add(getEvasObject(), "language,changed", retranslate, this);
}

// What must not outlive the screen. Leaving it and its window's end both come here.
void MwRecordingsContentViewController::onDestroy()
{
    _cancelBringIn();
    _rows.reset();
    if (std::exchange(_playView, nullptr))
        _announcePlayViewClosed();
    _trimView = nullptr;
    _destroyShareRequest(true);
    _privateStorage->cancel();
    if (_fileOperator)
        _deleteFileOperator();
    _closeRenamePopup();
    _fileOperationPopup.reset();
    auto* chooser = std::exchange(_saveToPopup, nullptr);
    if (!chooser)
        return;
    chooser->setOnDestroyed(nullptr);
    chooser->destroy();
}

bool MwRecordingsContentViewController::onPop()
{
    _cancelBringIn();
    _rows.reset(); // before the records it shows
    getModel()->setTrimMode(false);
    getModel()->destroyRecordedFileList();
    _destroyShareRequest(true);
    _privateStorage->cancel();
    if (_fileOperator)
        _deleteFileOperator();
    _privateStorage->handBack();
    return MwContentViewController::onPop();
}

void MwRecordingsContentViewController::onTop()
{
    if (!_isComplete())
        return;
    _destroyController();
    _updateController();
    // The screen above may have removed bookmarks.
    if (_rows)
        _rows->forgetBookmarks();
}

bool MwRecordingsContentViewController::_isPlayingOrPaused() const
{
    const auto state = getModel()->getPlayerState();
    return state == PLAY_STATE_PLAYING || state == PLAY_STATE_PAUSED;
}

void MwRecordingsContentViewController::_stopPlaying()
{
    if (_isPlayingOrPaused() && !getAppController()->dispatchCommand(MwAppController::STOP_PLAYING))
        MW_LOGE("play stop failed!");
}

void MwRecordingsContentViewController::_onPlayerUpdateSignal()
{
    if (!_isComplete())
        return;
    _update();
    _bringInItem();
}

void MwRecordingsContentViewController::_onSystemInfoSignal(MwSignalMgr::SystemInfo info)
{
    MW_LOGW("system info signal: [%d]", info);
    if (!_isComplete())
        return;
    switch (info) {
    case MwSignalMgr::MMC_REMOVED:
        return _destroySaveToPopup();
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
        return _earjackRemoved();
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
    if (!_privateStorage->isOpening() && !(isSelecting && MwSystemMgr::getInstance()->isPrivateModeEnabled()))
        _mediaDBUpdated();
}

void MwRecordingsContentViewController::_mediaDBUpdated()
{
    destroyAttachedPopup();
    _destroyShareRequest(true);
    // The operation that runs redraws the screen when it ends.
    if (_fileOperator) {
        _databaseChanged = true;
        return;
    }
    if (getModel()->getRecordedFileList().size() < READ_AT_ONCE) {
        getModel()->createRecordedFileList();
        return _catalogueRead();
    }
    _askedRevision = getModel()->getCatalogueRevision();
    _catalogueReader->ask();
}

// What has changed here meanwhile is newer than what was read.
void MwRecordingsContentViewController::_adoptCatalogue(std::vector<MwFileInfo> files)
{
    if (_fileOperator) {
        _databaseChanged = true;
        return;
    }
    if (_askedRevision != getModel()->getCatalogueRevision()) {
        _askedRevision = getModel()->getCatalogueRevision();
        return _catalogueReader->ask();
    }
    getModel()->setRecordedFiles(std::move(files));
    _catalogueRead();
}

void MwRecordingsContentViewController::_catalogueRead()
{
    _reloadNeeded = true;
    if (_viewType == RENAME && _renamePopup && !getModel()->getRecordedFileInfoByPath(_renameTarget))
        _closeRenamePopup();
    _forgetVanishedPlayPath();
    _viewType = _restingViewType();
    if (_viewType == NORMAL)
        _closeRenamePopup();
    _update();
    if (_rows)
        _rows->forgetBookmarks();
}

void MwRecordingsContentViewController::_forgetVanishedPlayPath()
{
    const std::string path = getModel()->getCurrentPlayPath();
    if (path.empty() || (ecore_file_exists(path.c_str()) && !getModel()->isHiddenRecording(path)))
        return;
    getModel()->setCurrentPlayPath("");
    if (!elm_object_part_content_get(getEvasObject(), "elm.swallow.controller"))
        return;
    getModel()->setTrimMode(false);
    _stopPlaying();
}

void MwRecordingsContentViewController::_formatChanged()
{
    _loadTitle(_checkedCount());
    if (_genlist)
        mwRenewDates(_genlist);
    _refreshRealizedItems();
    _updateDuplicationPopup();
}

void MwRecordingsContentViewController::_themeChanged()
{
    _colourNoContents();
    _refreshRealizedItems();
}

void MwRecordingsContentViewController::_stopAndExit()
{
    _stopPlaying();
    ui_app_exit();
}

void MwRecordingsContentViewController::_earjackInserted()
{
    if (isTop() && getModel()->getAppState() == MwModel::APP_STATE_RESUMED && !_playView && !_trimView)
        mwPost("IDS_MW_TPOP_EXTERNAL_MICROPHONE_WILL_BE_USED_TO_RECORD");
}

void MwRecordingsContentViewController::_earjackRemoved()
{
    if (_isPlayingOrPaused() && !getAppController()->dispatchCommand(MwAppController::PAUSE_PLAYING))
        MW_LOGE("play pause failed!");
}
