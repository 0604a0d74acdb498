#pragma once

#include <memory>
#include <string>

#include <panekit/WTimer.h>

#include "MwBookmarkListItem.h"
#include "MwContentViewController.h"
#include "MwSignalMgr.h"

class MwBookmarksList;
class MwPlayViewController;
class MwRenamePopupController;

// Lists the bookmarks of the recording that is loaded for playback: jumps to one, renames one, deletes several, with a
// player panel docked below. Owned by the naviframe. Main loop only.
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

    // Modes
    void _enterMode(Mode mode);
    void _updateTitle();
    void _updateNaviButton();
    void _updateMoreButton();
    void _updateCount();
    void _moreKeyClicked();

    // Rows
    void _itemListenerCb(MwBookmarkListItem& item);
    void _jumpTo(const MwBookmarkListItem& item);
    void _openRenamePopup(MwBookmarkListItem& item);
    void _closeRenamePopup();
    void _renameResponseCb(const char* text, int response);
    void _deleteSelected();

    MwPlayViewController* _playView = nullptr; // deletes itself with its view
    std::string _mediaId;
    std::unique_ptr<MwBookmarksList> _list;
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    int _renamedBookmark = 0; // identifier of the one whose name is being edited, 0 for none
    Mode _mode = MwBookmarkListItem::NORMAL;
    panekit::WTimer::Weak _popJob;
};
