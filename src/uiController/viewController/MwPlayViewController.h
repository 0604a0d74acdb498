#pragma once

#include <memory>
#include <string>

#include <Evas.h>

#include <panekit/WSignal.h>
#include <panekit/WTimer.h>
#include <panekit/WViewController.h>

#include "MwAppController.h"
#include "MwPlayBookmarks.h"
#include "MwPlaySeekButton.h"
#include "MwPlaySlider.h"
#include "MwSignalMgr.h"

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

    // What keys do while the list has the keyboard. Moves by milliseconds (negative: back) within the recording.
    void seekBy(int milliseconds);
    void togglePlay();
    // Left, Right and Space; answers whether it was one of them.
    bool takeKey(const std::string& key);

protected:
    ~MwPlayViewController() override;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;
    void onCreated() override;
    void onDestroy() override;

private:
    void _createParts();
    void _lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle);
    void _playerUpdated();
    void _stopListening();
    void _update();
    void _startPlayerTimer();
    void _stopPlayerTimer();
    void _stopTimers();
    [[nodiscard]] bool _isPlaying() const;
    // Answers whether the command succeeded and the panel is still there.
    bool _send(MwAppController::Command command, const char* failure);
    void _loadPlayButton();
    void _loadTrimButton();
    Evas_Object* _createTrimButton();
    void _clickPlayButton();
    void _clickPauseButton();
    void _clickTrimButton();
    void _seekTo(unsigned int position);
    bool _seekWhileHeld(long long step);
    void _sliderReleased();
    void _changeFile(MwPlaySeekButton::Direction direction);

    panekit::WSignal<void(eventType)> _eventSignal;
    panekit::WTimer::Weak _playerTimer;
    MwModel* _model;
    MwAppController* _appController;
    ViewType _playViewType = QUIET;
    std::unique_ptr<MwPlaySeekButton> _rewind;
    std::unique_ptr<MwPlaySeekButton> _fastForward;
    std::unique_ptr<MwPlaySlider> _slider;
    std::unique_ptr<MwPlayBookmarks> _bookmarks;
    unsigned int _duration = 0; // of the recording that is loaded, milliseconds
    unsigned int _lifeCycleListener = 0;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
