#pragma once

#include <panekit/WTimer.h>

#include <string>

#include "MwMiniController.h"
#include "MwMiniSurface.h"
#include "MwSignalMgr.h"

// The surface over the lock screen.
class MwLockscreenMiniController : public MwMiniController {
public:
    MwLockscreenMiniController(
        MwModel* model, MwAppController* appController, panekit::WWindowController* windowController);
    ~MwLockscreenMiniController() override;

    void create() override;
    void destroy() override;
    void update() override;

private:
    static void _minicontrolEventCb(minicontrol_provider_event_e event, bundle* arguments);
    static void _seenChangedCb(void* data);
    template <auto Operation>
    static constexpr auto _clickedCb = mwMiniClickedCb<Operation, MwLockscreenMiniController>;

    void _stopRecordButtonClicked() { stopRecord(); }
    void _pauseRecordButtonClicked() { pauseRecord(); }
    void _resumeRecordButtonClicked() { resumeRecord(); }
    void _playPlayButtonClicked() { resumePlay(); }
    void _pausePlayButtonClicked() { pausePlay(); }
    void _prePlayButtonClicked() { prevPlay(); }
    void _nextPlayButtonClicked() { nextPlay(); }
    void _showRecording(bool paused);
    void _showPlaying(bool paused);
    void _setInfoText(const std::string& text);
    void _setTimeText();
    void _watchTime();
    void _createUpdateTimeTimer();
    void _destroyUpdateTimeTimer();
    void _createPauseBlinkTimer();
    void _destroyPauseBlinkTimer();
    void _onSystemInfo(MwSignalMgr::SystemInfo info);

    MwMiniSurface _surface;
    bool _isTimeShown = true;
    panekit::WTimer::Weak _updateTimeTimer;
    panekit::WTimer::Weak _pauseBlinkTimer;
};
