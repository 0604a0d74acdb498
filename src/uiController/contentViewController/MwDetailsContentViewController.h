#pragma once

#include "MwContentViewController.h"
#include "MwModel.h"

// Shows name, date, location, length and size of the recording that is loaded for playback. Owned by the naviframe.
// Main loop only.
class MwDetailsContentViewController : public MwContentViewController {
public:
    MwDetailsContentViewController(MwModel* model, MwAppController* appController, MwFileInfo fileInfo);

    const char* getClassName() const override { return "MwDetailsContentViewController"; }

protected:
    ~MwDetailsContentViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onPushed(Evas_Object* item) override;

private:
    void _createDetailsList();
    void _loadListItem();
    void _updateNaviButton();
    void _systemInfoChanged(MwSignalMgr::SystemInfo info);
    void _mediaDBUpdated();

    MwFileInfo _fileInfo;
    Evas_Object* _genlist = nullptr;
};
