#pragma once

#include <memory>
#include <string>

#include <Evas.h>

#include <panekit/WTimer.h>
#include <panekit/WViewController.h>

#include "MwAppController.h"
#include "MwSignalMgr.h"
#include "MwTrimRange.h"
#include <panekit/WSignal.h>

class MwModel;
class MwTrimBars;
class MwTrimSaving;
class MwTrimWaveform;

namespace panekit {
class WPopupController;
}

// The trim panel docked below the list of recordings: the waveform with its bars and bookmarks, the times, and the
// buttons. Plays within the chosen range only. Tells its owner once that it is done with. Model and controller are
// borrowed. Main loop only.
class MwTrimViewController : public panekit::WViewController {
public:
    enum eventType : int { TRIM_VIEW_EVENT_CLOSE = 0, TRIM_VIEW_EVENT_SAVED = 1 };

    MwTrimViewController(MwModel* model, MwAppController* appController);

    const char* getClassName() const override { return "MwTrimViewController"; }
    // Builds the panel and docks it in the parent layout's part "elm.swallow.controller".
    bool dock(Evas_Object* parent) { return create(parent); }
    panekit::WSignal<void(MwTrimViewController::eventType)>& getEventSignal() { return _eventSignal; }
    // What the back key does.
    void back();
    [[nodiscard]] const MwTrimRange& getRange() const { return _range; }
    // Null before the first picture.
    [[nodiscard]] const MwTrimWaveform* getWaveform() const { return _waveformData.get(); }

protected:
    ~MwTrimViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;

private:
    template <auto Operation>
    static void _smartCb(void* data, Evas_Object*, void*)
    {
        (static_cast<MwTrimViewController*>(data)->*Operation)();
    }

    void _createButtons();
    Evas_Object* _createButton(const char* part, const char* style, const char* icon, const char* label);
    void _createBookmarkUI();
    void _createWaveform();
    void _createBars();
    void _listen();
    void _stopListening();
    void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    void _listenToKeys();
    bool _keyPressed(const std::string& key);

    void _playButtonClicked();
    void _cancelButtonClicked();
    void _saveButtonClicked();
    void _discard();
    void _close(eventType event);
    void _update();
    void _updatePlayButton();
    void _updateSaveButton();
    void _updatePlayingTrimBar();
    void _updateTimes();
    void _showTime(const char* part, unsigned int time, bool isHeld);
    void _rangeMoved();
    void _moveInside();
    void _seekTo(unsigned int position);
    void _choosePosition(unsigned int position);
    void _startPlayerTimer();
    void _stopPlayerTimer();
    void _keepInside();
    [[nodiscard]] bool _isPlaying() const;
    bool _send(MwAppController::Command command, const char* failure);
    static void _waveformFulshPost(void* data, Evas* canvas, void* info);

    MwModel* _model;
    MwAppController* _appController;
    std::string _playPath;
    panekit::WSignal<void(MwTrimViewController::eventType)> _eventSignal;
    MwTrimRange _range;
    std::unique_ptr<MwTrimWaveform> _waveformData;
    std::unique_ptr<MwTrimBars> _bars; // after the first picture
    std::unique_ptr<MwTrimSaving> _saving;
    panekit::WPopupController* _discardPopup = nullptr; // deletes itself
    panekit::WTimer::Weak _playerTimer;
    unsigned int _lifeCycleListener = 0;
    bool _isClosed = false; // the owner was told
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
