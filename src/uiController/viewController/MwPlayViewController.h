#pragma once

#include <memory>
#include <string>

#include <Evas.h>

#include <panekit/WTimer.h>
#include <panekit/WViewController.h>

#include "MwAppController.h"
#include "MwLog.h"
#include "MwSignalMgr.h"
#include <panekit/WSignal.h>

class MwModel;

// The player panel docked below a list: slider with times, play or pause, previous and next (held: seeking), bookmark
// markers, the bookmark and trim buttons. Drives nothing itself: every action is a command to the controller, and every
// report of the controller redraws the panel from the model. Its sources are split by concern:
// MwPlayViewController.cpp (life and refresh), MwPlayButtons.cpp, MwPlaySlider.cpp, MwPlaySeeking.cpp (held buttons,
// keys), MwPlayBookmarks.cpp. Model and controller are borrowed. Main loop only.
class MwPlayViewController : public panekit::WViewController {
public:
    enum eventType : int { BOOKMARK_ADDED, FILE_CHANGED, TRIM_REQUESTED };
    // What create() is given as view parameter: whether previous and next are reported.
    enum ViewType : int { QUIET, REPORTS_FILE_CHANGES };
    // What a key moves by, milliseconds.
    static constexpr int KEY_STEP = 5000;

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
    enum class Direction { Rewind, FastForward };
    enum class Draw { Everything, WhatMoved };

    // Previous or next: a short press changes the file, a long one seeks.
    struct SeekButton {
        MwPlayViewController* panel;
        Direction direction;
        const char* part;
        panekit::WTimer::Weak timer{}; // runs while the button is held
        double releaseTime = 0; // seconds of the loop
    };

    // Toolkit callbacks of an operation.
    template <auto Operation>
    static void _smartCb(void* data, Evas_Object*, void*)
    {
        _call<Operation>(data);
    }
    template <auto Operation>
    static void _eventCb(void* data, Evas*, Evas_Object*, void*)
    {
        _call<Operation>(data);
    }
    template <auto Operation>
    static void _call(void* data)
    {
        if (auto* self = static_cast<MwPlayViewController*>(data); self)
            return (self->*Operation)();
        MW_LOGE("data is nullptr");
    }

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

    // Buttons
    struct ButtonLook;
    Evas_Object* _createButton(const ButtonLook& look);
    bool _setIcon(Evas_Object* button, const char* image, const char* color);
    void _loadButtons();
    void _loadPlayButton();
    void _loadSeekButtons();
    void _watchSeekButton(SeekButton& held, Evas_Smart_Cb pressed, Evas_Smart_Cb unpressed, Evas_Smart_Cb clicked);
    void _loadBookmarkButton();
    void _loadTrimButton();
    void _tintWhilePressed(Evas_Object* button);
    void _clickPlayButton();
    void _clickPauseButton();
    void _clickTrimButton();

    // Slider, seeking
    void _refreshSlider(Draw draw);
    void _refreshTimes();
    void _refreshPosition();
    void _createSlider();
    void _adaptSlider(Evas_Object* slider) const;
    void _takeSliderPosition();
    void _sliderChanged();
    void _sliderPressed();
    void _sliderReleased();
    void _pressRewButton();
    void _unpressRewButton();
    void _clickRewButton();
    void _pressFFButton();
    void _unpressFFButton();
    void _clickFFButton();
    void _press(SeekButton& held);
    void _release(SeekButton& held);
    void _click(const SeekButton& held);
    // Ends a hold; answers whether it was a short one.
    bool _endHold(SeekButton& held);
    bool _seekTick(SeekButton& held);
    void _changeFile(Direction direction);
    void _seekTo(unsigned int position);
    static void _heldMoveCb(void* data, Evas* canvas, Evas_Object* button, void* info);

    // Bookmarks
    void _clickBookmarkButton();
    void _loadBookmark();
    [[nodiscard]] Evas_Object* _bookmarkWidget() const;
    void _removeBookmarkWidget();
    void _addMarkers(Evas_Object* widget);

    panekit::WSignal<void(eventType)> _eventSignal;
    panekit::WTimer::Weak _playerTimer;
    SeekButton _rewind;
    SeekButton _fastForward;
    panekit::WTimer::Weak _sliderJob;
    MwModel* _model;
    MwAppController* _appController;
    unsigned int _seekStep = 0; // milliseconds, grows while a button is held
    ViewType _playViewType = QUIET;
    std::string _bookmarkPart;
    // Of the recording that is loaded, milliseconds: asking the database with every tick would cost more than drawing.
    unsigned int _duration = 0;
    bool _isSliding = false; // the user holds the knob: nothing else may move it
    unsigned int _lifeCycleListener = 0;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
