#pragma once

#include <string>

#include "MwContentViewController.h"

// Lists the bookmarks of the recording that is loaded for playback: jumps to one, renames one, deletes several, with a
// player panel docked below. Owned by the naviframe. Main loop only.
class MwBookmarksContentViewController : public MwContentViewController {
public:
    MwBookmarksContentViewController(MwModel* model, MwAppController* appController, std::string mediaId);

    const char* getClassName() const override { return "MwBookmarksContentViewController"; }

protected:
    ~MwBookmarksContentViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;
    void onPushed(Evas_Object* item) override;

private:
    std::string _mediaId;
};
