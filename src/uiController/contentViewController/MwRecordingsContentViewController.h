#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "MwCatalogueFollower.h"
#include "MwContentViewController.h"
#include "MwPrivateStorage.h"
#include "MwRecordingsDock.h"
#include "MwRecordingsFileJob.h"
#include "MwRecordingsList.h"
#include "MwRecordingsMenu.h"
#include "MwRecordingsPlaying.h"
#include "MwRecordingsRenaming.h"
#include "MwRecordingsSharing.h"
#include "MwRecordingsTitle.h"
#include "MwSaveToPopup.h"
#include "MwSignalMgr.h"

// The list of recordings and the hub for all that is done with them: plays the tapped one in a panel docked below,
// selects several for deleting, sharing and moving, opens bookmarks and details, and in request mode hands one back to
// the caller. Its parts do the work; the screen decides by its view type which of them is meant.
// Owned by the naviframe. Main loop only.
class MwRecordingsContentViewController : public MwContentViewController {
public:
    enum ViewType : int { NORMAL, PICK, DELETE, SHARE, RENAME, MOVE_TO_PRIVATE, REMOVE_FROM_PRIVATE };

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
    void onBecomeTop() override;

private:
    // Life and signals
    bool _isComplete() const;
    void _createParts();
    void _listen();
    void _endJobs();
    void _onPlayerUpdateSignal();
    void _onSystemInfoSignal(MwSignalMgr::SystemInfo info);
    void _privateStorageChanged();
    void _mediaDBUpdated();
    void _catalogueRead();
    bool _catchUp();
    void _catalogueShrank();
    void _forgetVanishedPlayPath();
    void _formatChanged();
    void _themeChanged();
    void _stopAndExit();
    void _earjackInserted();

    // Redraw. _update redraws everything from the model; with _reloadNeeded set list and empty view change places as
    // needed.
    void _update();
    void _setViewType(ViewType type);
    void _enterViewType(ViewType type);
    ViewType _restingViewType() const;
    void _loadTitle();
    void _enableDoneButton();
    void _focusList();

    // What the user does
    void _onSelectListItem(MwRecordingsListItem& item);
    void _playListItem(MwRecordingsListItem& item);
    void _recordingStarted();
    void _trimEnded(bool saved);
    void _titleRightButtonClicked();
    void _clickMoreKey();
    void _menuItemChosen(MwRecordingsMenu::Item item);
    void _clickBackKey();
    void _openBookmarks();
    void _openDetails();
    void _listenToKeys();
    bool _keyPressed(const std::string& key);
    void _deleteHighlighted();
    void _renameHighlighted();
    std::string _highlightedPath() const;

    // Deleting
    void _createDeletePopup(
        std::function<void()> confirmed, const char* question = "IDS_MW_POP_THIS_VOICE_RECORDING_WILL_BE_DELETED");
    void _startDeleting(const std::vector<std::string>& pathList, bool forGood);
    void _onDeleteFiles(const MwRecordingsFileJob::Deleted& deleted);
    void _askToDeleteForGood(const std::vector<std::string>& pathList);
    void _deletePlayingFile();

    // The private storage
    void _loadPrivateMoveView(ViewType type);
    void _openPrivateMoveView();
    void _showPrivateRecordings();
    void _clickMoveDoneButton(const std::vector<std::string>& pathList);
    void _moveStart(const std::vector<std::string>& pathList);
    void _onMoveFiles();

    ViewType _viewType = NORMAL;
    bool _reloadNeeded = false;
    MwRecordingsPlaying _playing;
    MwSaveToPopup _saveToPopup;
    MwPrivateStorage _privateStorage; // until the screen ends
    std::unique_ptr<MwRecordingsList> _list;
    std::unique_ptr<MwRecordingsDock> _dock;
    std::unique_ptr<MwRecordingsTitle> _title;
    std::unique_ptr<MwRecordingsFileJob> _fileJob;
    std::unique_ptr<MwRecordingsRenaming> _renaming; // before its job
    std::unique_ptr<MwRecordingsSharing> _sharing;
    std::unique_ptr<MwCatalogueFollower> _follower;
};
