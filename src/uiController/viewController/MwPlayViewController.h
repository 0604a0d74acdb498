#pragma once

#include <memory>
#include <string>

#include <panekit/WTimer.h>
#include <panekit/WViewController.h>

#include "MwSignalMgr.h"
#include "WSignal.h"

class MwAppController;
class MwModel;

// The player panel docked below a list: slider with times, play or pause, previous and next (held: seeking), bookmark
// markers, the bookmark and trim buttons. Drives nothing itself: every action is a command to the controller, and every
// report of the controller redraws the panel from the model. Model and controller are borrowed. Main loop only.
class MwPlayViewController : public panekit::WViewController {
public:
    enum eventType : int { BOOKMARK_ADDED, FILE_CHANGED, TRIM_REQUESTED };
    // What create() is given as view parameter: whether previous and next are reported.
    enum ViewType : int { QUIET, REPORTS_FILE_CHANGES };

    MwPlayViewController(MwModel* model, MwAppController* appController);

    const char* getClassName() const override { return "MwPlayViewController"; }
    // Builds the panel and docks it in the parent layout's part "elm.swallow.controller".
    bool dock(Evas_Object* parent, ViewType type);
    panekit::WSignal<void(eventType)>& getEventSignal() { return _eventSignal; }

protected:
    ~MwPlayViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;

private:
    panekit::WSignal<void(eventType)> _eventSignal;
    MwModel* _model;
    MwAppController* _appController;
};
