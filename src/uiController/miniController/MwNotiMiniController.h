#pragma once

#include <panekit/WTimer.h>

#include <string>

#include "MwCancelQuestion.h"
#include "MwMiniController.h"
#include "MwMiniSurface.h"
#include "MwSignalMgr.h"

struct _Ecore_Event_Handler;

// The surface on the desktop's panel.
class MwNotiMiniController : public MwMiniController {
public:
    MwNotiMiniController(MwModel* model, MwAppController* appController, panekit::WWindowController* windowController);
    ~MwNotiMiniController() override;

    // See MwMiniSurface::preload.
    static void preload(Evas_Object* window);

    void create() override;
    void destroy() override;
    void update() override;

private:
    static void _minicontrolEventCb(minicontrol_provider_event_e event, bundle* arguments);
    static unsigned char _clientMessageCb(void* data, int type, void* event);
    static void _seenChangedCb(void* data);
    template <auto Operation>
    static constexpr auto _clickedCb = mwMiniClickedCb<Operation, MwNotiMiniController>;

    void _createMenuButton();
    void _createCloseButton();
    void _registerXEvent();
    void _menuButtonClicked();
    void _closeButtonClicked();
    void _stopRecordButtonClicked() { stopRecord(); }
    void _pauseRecordButtonClicked() { pauseRecord(); }
    void _resumeRecordButtonClicked() { resumeRecord(); }
    void _playButtonClicked() { resumePlay(); }
    void _pauseButtonClicked() { pausePlay(); }
    void _prevPlayButtonClicked() { prevPlay(); }
    void _nextPlayButtonClicked() { nextPlay(); }
    void _requestCancelPopup();
    void _resize();

    void _showRecording();
    void _showRecordPaused();
    void _showPlaying(bool paused);
    void _updateInfoText(const std::string& text);
    void _updateRecordingTime();
    void _watchTime();
    void _createRecordingStatusUpdateTimer();
    void _createRecordPauseBlinkTimer();
    void _destroyTimers();
    void _onSystemInfo(MwSignalMgr::SystemInfo info);

    MwMiniSurface _surface;
    MwCancelQuestion _cancelQuestion;
    int _rotation = 0; // degrees
    std::string _shownTime;
    bool _isTimeShown = true;
    bool _isClosed = false; // by the user, for as long as this playback rests
    panekit::WTimer::Weak _statusUpdateTimer;
    panekit::WTimer::Weak _pauseBlinkTimer;
    _Ecore_Event_Handler* _clientMessageHandler = nullptr;
};
