#pragma once

#include <memory>
#include <string>
#include <vector>

#include <Evas.h>

#include <panekit/WTimer.h>

#include "MwBookmarkListItem.h"
#include "MwContentViewController.h"
#include "MwSignalMgr.h"

class MwPlayViewController;
class MwRenamePopupController;

// Lists the bookmarks of the recording that is loaded for playback: jumps to one, renames one, deletes several, with a
// player panel docked below. Its sources are split by concern: MwBookmarksContentViewController.cpp (life, signals,
// player panel), MwBookmarksList.cpp (rows, taps, rename, delete), MwBookmarksModes.cpp (modes, title, menu).
// Owned by the naviframe. Main loop only.
class MwBookmarksContentViewController : public MwContentViewController {
public:
    using Mode = MwBookmarkListItem::Mode;

    MwBookmarksContentViewController(MwModel* model, MwAppController* appController, std::string mediaId);

    const char* getClassName() const override { return "MwBookmarksContentViewController"; }

protected:
    ~MwBookmarksContentViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;
    void onPushed(Evas_Object* item) override;

private:
    void _systemInfoChanged(MwSignalMgr::SystemInfo info);
    void _mediaDBUpdated();
    void _createPlayView();
    void _destroyPlayView();
    void _playViewEvent(int event);
    void _backKeyClicked();

    // List
    void _createList();
    void _loadListItems();
    static void _listKeyCb(void* data, Evas* canvas, Evas_Object* list, void* info);
    void _reloadList();
    [[nodiscard]] std::vector<MwBookmarkListItem*> _rows() const;
    [[nodiscard]] int _checkedCount() const;
    void _itemListenerCb(MwBookmarkListItem& item);
    void _jumpTo(const MwBookmarkListItem& item);
    void _toggle(MwBookmarkListItem& item);
    void _toggleAll();
    void _openRenamePopup(MwBookmarkListItem& item);
    void _closeRenamePopup();
    void _renameResponseCb(const char* text, int response);
    bool _isNameTaken(const std::string& name) const;
    void _renameBookmark(const MwSavedBookmark& bookmark, const std::string& name);
    void _deleteSelected();

    // Modes
    void _enterMode(Mode mode);
    void _clearSelection();
    void _createRadioGroup();
    void _appendSelectAllItem();
    void _removeSelectAllItem();
    void _updateTitle();
    void _updateNaviButton();
    void _updateMoreButton();
    void _updateCount();
    void _moreKeyClicked();

    MwPlayViewController* _playView = nullptr; // deletes itself with its view
    std::string _mediaId;
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    int _renamedBookmark = 0; // identifier of the one whose name is being edited, 0 for none
    Evas_Object* _genlist = nullptr;
    Evas_Object* _radio = nullptr; // the group of the rename mode
    MwBookmarkListItem* _selectAllItem = nullptr; // in the delete mode
    Mode _mode = MwBookmarkListItem::NORMAL;
    panekit::WTimer::Weak _popJob;
};
