#pragma once

#include <array>
#include <memory>
#include <string>
#include <vector>

#include <app_control.h>

#include <panekit/WTimer.h>

#include "MwContentViewController.h"
#include "MwHandle.h"
#include "MwModel.h"
#include "MwSignalMgr.h"

class MwFileOperator;
class MwPlayViewController;
class MwRecordingsListItem;
class MwRenamePopupController;

namespace panekit {
class WMenuPopupController;
class WPopupController;
}

// The list of recordings and the hub for all that is done with them: plays the tapped one in a panel docked below,
// selects several for deleting, sharing and moving, opens bookmarks and details, and in request mode hands one back to
// the caller. Its sources are split by concern: ...ContentViewController.cpp (life and signals), MwRecordingsList.cpp
// (contents and redraw), MwRecordingsSelection.cpp (modes, title, taps), MwRecordingsMenu.cpp (menu, keys),
// MwRecordingsFileOperations.cpp (delete, move), MwRecordingsSharing.cpp (share, private storage, rename).
// Owned by the naviframe. Main loop only.
class MwRecordingsContentViewController : public MwContentViewController {
public:
    enum ViewType : int { NORMAL, PICK, DELETE, SHARE, RENAME, MOVE_TO_PRIVATE, REMOVE_FROM_PRIVATE };
    enum ListType : int { NO_CHOICE, SINGLE_CHOICE, MULTIPLE_CHOICE };

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
    // File operations (MwRecordingsFileOperations.cpp). At most one runs at a time; while it runs, a change of the
    // media database does not rebuild the list.
    void _clickDeleteButton(const std::vector<std::string>& pathList);
    void _clickMoveDoneButton(const std::vector<std::string>& pathList);
    void _deletePlayingFile();
    void _deleteFileOperator();
    // Rewrites the texts of a clash popup after a change of language or region.
    void _updateDuplicationPopup();

    // Sharing, private storage and rename (MwRecordingsSharing.cpp)
    bool _clickShareDoneButton(const std::vector<std::string>& pathList);
    void _destroyShareRequest(bool terminate);
    void _destroyPrivateModeRequest(bool terminate);
    void _openRenamePopup(const std::string& path);
    void _closeRenamePopup();
    void _renameResponseCb(const char* text, int response);

    using Request = MwHandle<app_control_h, app_control_destroy>;

    ViewType _viewType = NORMAL;
    bool _reloadNeeded = false;
    Evas_Object* _genlist = nullptr; // at most one of these two
    Evas_Object* _noContents = nullptr;
    MwPlayViewController* _playView = nullptr; // deletes itself with its view
    std::unique_ptr<MwFileOperator> _fileOperator;
    panekit::WPopupController* _fileOperationPopup = nullptr; // progress, deleting or clash; deletes itself
    Request _shareRequest;
    Request _privateModeRequest;
    panekit::WPopupController* _saveToPopup = nullptr; // deletes itself
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    std::string _renameTarget; // path
    unsigned int _systemInfoListener = 0;
};
