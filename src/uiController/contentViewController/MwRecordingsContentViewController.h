#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <app_control.h>

#include <panekit/WTimer.h>

#include "MwAppController.h"
#include "MwContentViewController.h"
#include "MwHandle.h"
#include "MwModel.h"
#include "MwPrivateStorage.h"
#include "MwRecordingsListItem.h"
#include "MwSignalMgr.h"

class MwCatalogueReader;
class MwFileOperationPopup;
class MwFileOperator;
class MwPlayViewController;
class MwRecordingsRows;
class MwRenamePopupController;
class MwTrimViewController;
typedef void (*Evas_Smart_Cb)(void* data, Evas_Object* object, void* info);

namespace panekit {
class WMenuPopupController;
class WPopupController;
}

// The list of recordings and the hub for all that is done with them: plays the tapped one in a panel docked below,
// selects several for deleting, sharing and moving, opens bookmarks and details, and in request mode hands one back to
// the caller. Its sources are split by concern: ...ContentViewController.cpp (life and signals), MwRecordingsList.cpp
// (contents and redraw), MwRecordingsSelection.cpp (modes, title, taps), MwRecordingsMenu.cpp (menu, keys),
// MwRecordingsFileOperations.cpp (delete, move), MwRecordingsSharing.cpp (share, rename).
// Owned by the naviframe. Main loop only.
class MwRecordingsContentViewController : public MwContentViewController {
public:
    enum ViewType : int { NORMAL, PICK, DELETE, SHARE, RENAME, MOVE_TO_PRIVATE, REMOVE_FROM_PRIVATE };
    using ListType = MwRecordingsListItem::ListType;

    MwRecordingsContentViewController(MwModel* model, MwAppController* appController);

    const char* getClassName() const override { return "MwRecordingsContentViewController"; }

protected:
    ~MwRecordingsContentViewController() override;

    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;
    void onPushed(Evas_Object* item) override;
    bool onPop() override;
    void onTop() override;

private:
    // Life and signals (MwRecordingsContentViewController.cpp)
    bool _isComplete() const;
    void _listen();
    void _onPlayerUpdateSignal();
    void _onSystemInfoSignal(MwSignalMgr::SystemInfo info);
    void _privateStorageChanged();
    void _mediaDBUpdated();
    void _adoptCatalogue(std::vector<MwFileInfo> files);
    void _catalogueRead();
    void _forgetVanishedPlayPath();
    void _formatChanged();
    void _themeChanged();
    void _stopAndExit();
    void _earjackInserted();
    void _earjackRemoved();
    bool _isPlayingOrPaused() const;
    void _stopPlaying();

    // Contents and redraw (MwRecordingsList.cpp)
    // Redraws everything from the model. Rows follow every change of the catalogue: those of records that were removed
    // from it vanish, renamed ones are rewritten. With _reloadNeeded set list and empty view change places as needed.
    void _update();
    void _loadContents();
    void _createNoContents();
    void _colourNoContents();
    void _createList();
    void _focusList();
    void _loadListItems();
    void _renewList();
    void _makeRows();
    Evas_Object* _radioGroup() const;
    void _loadSelectAllItem();
    void _removeSelectAllItem();
    void _refreshRealizedItems();
    void _updateController();
    void _createRecordController();
    void _createPlayViewController();
    void _createTrimViewController();
    void _destroyController();
    void _announcePlayViewClosed();
    void _playViewEvent(int event);
    void _trimViewEvent(int event);
    void _updateLater();
    void _bringInItem();
    void _bringInAfterFrame();
    void _cancelBringIn();
    static void _playerViewFulshPost(void* data, Evas* canvas, void* info);
    void _clickRecordButton();

    // Modes, title, taps (MwRecordingsSelection.cpp)
    ListType _getListType() const;
    ViewType _restingViewType() const;
    void _loadTitle(size_t count);
    void _loadTitleButtons();
    void _setTitleButton(const char* part, const char* style, const char* textId, Evas_Smart_Cb clicked);
    void _loadMoreButton();
    void _enableDoneButton();
    bool _isDonePossible() const;
    size_t _checkedCount() const;
    void _clearChecks();
    void _preselect();
    void _onSelectListItem(MwRecordingsListItem& item);
    void _toggle(MwRecordingsListItem& item);
    void _playListItem(MwRecordingsListItem& item);
    void _startPlaying(MwRecordingsListItem& item);
    void _toggleCurrent();
    void _playOther(MwRecordingsListItem& item);
    void _titleRightButtonClicked();
    void _replyWithSelected();

    // Menu, keys (MwRecordingsMenu.cpp)
    void _clickMoreKey();
    void _clickBackKey();
    void _enterViewType(ViewType type);
    void _loadPrivateMoveView(ViewType type);
    void _clickDeleteMenu();
    void _clickShareMenu();
    void _clickRenameMenu();
    void _addPrivateItems(panekit::WMenuPopupController& menu);
    void _openPrivateMoveView();
    void _togglePrivateRecordings();
    void _createDeletePopup(
        std::function<void()> confirmed, const char* question = "IDS_MW_POP_THIS_VOICE_RECORDING_WILL_BE_DELETED");
    void _openBookmarks();
    void _openDetails();
    void _createSaveToPopup();
    void _destroySaveToPopup();
    void _listenToKeys();
    void _listenToListKeys();
    bool _listKeyPressed(const std::string& key);
    bool _keyPressed(const std::string& key);
    void _deleteHighlighted();
    void _renameHighlighted();
    void _tapHighlighted();
    std::string _highlightedPath() const;

    // File operations (MwRecordingsFileOperations.cpp). At most one runs at a time; while it runs, a change of the
    // media database does not rebuild the list.
    void _clickDeleteButton(const std::vector<std::string>& pathList);
    void _clickMoveDoneButton(const std::vector<std::string>& pathList);
    void _deletePlayingFile();
    void _deleteFileOperator();
    // Rewrites the texts of a clash popup after a change of language or region.
    void _updateDuplicationPopup();
    std::unique_ptr<MwFileOperator> _createFileOperator(int type, const std::vector<std::string>& pathList);
    void _cancelDeleting();
    void _startDeleting(int type, const std::vector<std::string>& pathList);
    void _onDeleteFiles();
    void _askToDeleteForGood(const std::vector<std::string>& pathList);
    bool _catchUp();
    void _catalogueShrank();
    void _moveStart(const std::vector<std::string>& pathList);
    void _createMovingingPopupController();
    void _cancelMoving();
    void _updateMovePopup();
    void _createDuplicationPopupController(const std::string& path);
    void _onSelectedDuplicationPopupButton(int action);
    void _moveFinished();
    void _onMoveFiles();
    void _moveEnded(const MwFileOperator& fileOperator);

    // Sharing and rename (MwRecordingsSharing.cpp)
    bool _clickShareDoneButton(const std::vector<std::string>& pathList);
    void _shareReply(int result);
    void _destroyShareRequest(bool terminate);
    void _openRenamePopup(const std::string& path);
    void _closeRenamePopup();
    void _renameResponseCb(const char* text, int response);
    bool _renameRecording(const std::string& name);
    void _onRenamed();

    using Request = MwHandle<app_control_h, app_control_destroy>;

    ViewType _viewType = NORMAL;
    bool _reloadNeeded = false;
    bool _databaseChanged = false; // while an operation ran
    unsigned int _askedRevision = 0; // of the catalogue when the reader was asked
    std::unique_ptr<MwCatalogueReader> _catalogueReader;
    Evas_Object* _genlist = nullptr; // at most one of these two
    Evas_Object* _noContents = nullptr;
    MwRecordingsListItem::Context _rowContext; // shared by all rows
    std::unique_ptr<MwRecordingsRows> _rows; // with the genlist
    MwPlayViewController* _playView = nullptr; // at most one of these two; deletes itself with its view
    MwTrimViewController* _trimView = nullptr;
    std::unique_ptr<MwFileOperator> _fileOperator;
    std::unique_ptr<MwFileOperationPopup> _fileOperationPopup; // while an operator works
    std::unique_ptr<MwPrivateStorage> _privateStorage = std::make_unique<MwPrivateStorage>(); // until the screen ends
    Request _shareRequest;
    panekit::WPopupController* _saveToPopup = nullptr; // deletes itself
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    std::string _renameTarget; // path
};
