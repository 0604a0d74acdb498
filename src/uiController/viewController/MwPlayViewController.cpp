#include "MwPlayViewController.h"

#include <Elementary.h>

#include <cstdint>

#include "MwFeatureChecker.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwPlayButton.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwPlayView.edj";
constexpr auto LAYOUT_GROUP = "play_view";
constexpr auto DOCK_PART = "elm.swallow.controller";
constexpr auto PLAY_PART = "play_pause_btn";
constexpr auto TRIM_PART = "trim_btn";
constexpr auto PLAY_IMAGE = "mainView/full_player_button_play.png";
constexpr auto PAUSE_IMAGE = "mainView/full_player_button_pause.png";

// The extension with its dot, empty when the path has none.
std::string extensionOf(const std::string& path)
{
    const size_t dot = path.rfind('.');
    return dot != std::string::npos && path.find('/', dot) == std::string::npos ? path.substr(dot) : std::string();
}

}

MwPlayViewController::MwPlayViewController(MwModel* model, MwAppController* appController)
    : _model(model)
    , _appController(appController)
{
}

MwPlayViewController::~MwPlayViewController() = default;

bool MwPlayViewController::dock(Evas_Object* parent, ViewType type)
{
    return create(parent, reinterpret_cast<void*>(static_cast<intptr_t>(type)));
}

Evas_Object* MwPlayViewController::onCreateView(Evas_Object* parent, void* viewParam)
{
    if (!parent) {
        MW_LOGE("parent == nullptr");
        return nullptr;
    }
    if (reinterpret_cast<intptr_t>(viewParam) == REPORTS_FILE_CHANGES)
        _playViewType = REPORTS_FILE_CHANGES;
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return nullptr;
    }
    Evas_Object* layout = elm_layout_add(parent);
    elm_layout_file_set(layout, path.c_str(), LAYOUT_GROUP);
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_object_part_content_set(parent, DOCK_PART, layout);
    evas_object_show(layout);
    return layout;
}

void MwPlayViewController::onCreated()
{
    _createParts();
    _lifeCycleListener = MwSignalMgr::getInstance()->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    // Goes with the view, or with the controller when that ends first.
    _appController->getPlayerUpdatedSignal().addListener([this] { _playerUpdated(); }, getEvasObject());
    _update();
}

void MwPlayViewController::_createParts()
{
    using Seek = MwPlaySeekButton;
    const Seek::Panel seeking{.changeFile = [this](Seek::Direction direction) { _changeFile(direction); },
        .seek = [this](long long step) { return _seekWhileHeld(step); }};
    _rewind = std::make_unique<Seek>(getEvasObject(), Seek::Direction::Rewind, seeking);
    _fastForward = std::make_unique<Seek>(getEvasObject(), Seek::Direction::FastForward, seeking);
    _slider = std::make_unique<MwPlaySlider>(getEvasObject(), _model,
        MwPlaySlider::Panel{.pressed = [this] { _stopPlayerTimer(); },
            .released = [this] { _sliderReleased(); },
            .moved = [this](unsigned int position) { _seekTo(position); }});
    _bookmarks
        = std::make_unique<MwPlayBookmarks>(getEvasObject(), _model, [this] { _eventSignal.emit(BOOKMARK_ADDED); });
}

void MwPlayViewController::onDestroy()
{
    _stopListening();
    _eventSignal.removeAll();
    _stopTimers();
    if (_bookmarks)
        _bookmarks->_removeBookmarkWidget();
}

void MwPlayViewController::_stopTimers()
{
    _stopPlayerTimer();
    if (!_slider)
        return;
    _slider->stop();
    _rewind->stop();
    _fastForward->stop();
}

// On TERMINATE at the latest: afterwards signals, controller and model are gone, while the panel waits for its window.
void MwPlayViewController::_stopListening()
{
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals)
        mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
}

void MwPlayViewController::_lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle)
{
    switch (lifeCycle) {
    case MwSignalMgr::RESUME:
        if (_isPlaying())
            _startPlayerTimer();
        return;
    case MwSignalMgr::PAUSE:
        return _stopPlayerTimer();
    case MwSignalMgr::TERMINATE:
        MW_LOGW("not used life cycle signal!");
        _stopTimers();
        return _stopListening();
    }
    MW_LOGW("not used life cycle signal!");
}

void MwPlayViewController::_playerUpdated()
{
    if (_model->getCurrentPlayPath().empty()) {
        MW_LOGW("current play path is empty!!!");
        return;
    }
    _update();
}

bool MwPlayViewController::_isPlaying() const { return _model->getPlayerState() == PLAY_STATE_PLAYING; }

bool MwPlayViewController::_send(MwAppController::Command command, const char* failure)
{
    // What the controller reports may end the panel.
    const std::weak_ptr<void> panel = _token;
    const bool done = _appController->dispatchCommand(command);
    if (!done)
        MW_LOGE("%s", failure);
    return done && !panel.expired();
}

void MwPlayViewController::_update()
{
    _duration = _model->getCurrentPlayDuration();
    _slider->setDuration(_duration);
    _slider->refresh(MwPlaySlider::Draw::Everything);
    _loadPlayButton();
    _rewind->load();
    _fastForward->load();
    _bookmarks->setDuration(_duration);
    _bookmarks->load();
    _loadTrimButton();
    if (_isPlaying() && !_slider->isHeld())
        _startPlayerTimer();
    else
        _stopPlayerTimer();
}

void MwPlayViewController::_startPlayerTimer()
{
    _stopPlayerTimer();
    _playerTimer = WTimer::addTimer(mwPlayRefreshPeriod(_duration), [this](void*) {
        _slider->refresh(MwPlaySlider::Draw::WhatMoved);
        return true;
    });
}

void MwPlayViewController::_stopPlayerTimer() { WTimer::destroy(_playerTimer); }

void MwPlayViewController::togglePlay() { _isPlaying() ? _clickPauseButton() : _clickPlayButton(); }

// One button with two faces, so that the keyboard stays where it is.
void MwPlayViewController::_loadPlayButton()
{
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), PLAY_PART);
    const char* image = _isPlaying() ? PAUSE_IMAGE : PLAY_IMAGE;
    const char* name = _isPlaying() ? "IDS_MW_BODY_PAUSE" : "IDS_MW_BUTTON_PLAY";
    if (button) {
        if (MwPlayButton::iconOf(button) != image)
            MwPlayButton::change(button, image, name);
        return;
    }
    button = MwPlayButton::create(getEvasObject(), {PLAY_PART, true, image, nullptr, name});
    const auto clicked
        = [](void* data, Evas_Object*, void*) { static_cast<MwPlayViewController*>(data)->togglePlay(); };
    if (button)
        evas_object_smart_callback_add(button, "clicked", clicked, this);
}

void MwPlayViewController::_loadTrimButton()
{
    if (!MwFeatureChecker::isEnable(MwFeatureChecker::MENU_TYPE_TRIM))
        return;
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), TRIM_PART);
    const std::string extension = extensionOf(_model->getCurrentPlayPath());
    if (extension.empty()) {
        MW_LOGE("file extension is nullptr!!!");
        evas_object_del(button);
        return;
    }
    if (!button && !(button = _createTrimButton()))
        return;
    const bool isTrimmable = mwIsTrimmable(extension, _duration);
    elm_object_disabled_set(button, !isTrimmable);
    MwPlayButton::tint(button, isTrimmable ? MwPlayButton::Tint::NORMAL : MwPlayButton::Tint::DISABLED);
}

Evas_Object* MwPlayViewController::_createTrimButton()
{
    Evas_Object* button = MwPlayButton::create(getEvasObject(),
        {TRIM_PART, false, "mainView/voice_icon_trim.png", "IDS_MW_HEADER_TRIM", "IDS_MW_HEADER_TRIM"});
    if (!button)
        return nullptr;
    const auto clicked
        = [](void* data, Evas_Object*, void*) { static_cast<MwPlayViewController*>(data)->_clickTrimButton(); };
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    MwPlayButton::tintWhilePressed(button);
    return button;
}

void MwPlayViewController::_clickPlayButton()
{
    if (_model->getPlayerState() == PLAY_STATE_PAUSED) {
        if (_send(MwAppController::RESUME_PLAYING, "play start failed!"))
            _update();
        return;
    }
    // What the user chose while nothing played.
    const unsigned int position = _model->getCurrentPlayPosition();
    if (!_send(MwAppController::START_PLAYING, "play start failed!"))
        return;
    if (position > 0) {
        _model->setCurrentPlayPosition(position);
        if (!_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!"))
            return;
    }
    _update();
}

void MwPlayViewController::_clickPauseButton()
{
    if (_send(MwAppController::PAUSE_PLAYING, "play start failed!"))
        _update();
}

void MwPlayViewController::_clickTrimButton()
{
    const std::weak_ptr<void> panel = _token;
    if (_isPlaying())
        (void)_send(MwAppController::PAUSE_PLAYING, "play pause failed!");
    if (panel.expired())
        return;
    _model->setTrimMode(true);
    _bookmarks->hide();
    _eventSignal.emit(TRIM_REQUESTED);
}

// While nothing is loaded into the player, the position waits for the play button.
void MwPlayViewController::_seekTo(unsigned int position)
{
    const std::weak_ptr<void> panel = _token;
    _model->setCurrentPlayPosition(position);
    if (_model->getPlayerState() != PLAY_STATE_NONE)
        (void)_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!");
    if (panel.expired())
        return;
    _slider->refresh(MwPlaySlider::Draw::Everything);
}

// False when the panel has gone over it.
bool MwPlayViewController::_seekWhileHeld(long long step)
{
    _model->setCurrentPlayPosition(mwSoughtPosition(_model->getCurrentPlayPosition(), step, _duration));
    const std::weak_ptr<void> panel = _token;
    (void)_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!");
    if (panel.expired())
        return false;
    _slider->refresh(MwPlaySlider::Draw::Everything);
    return true;
}

void MwPlayViewController::_sliderReleased()
{
    const std::weak_ptr<void> panel = _token;
    (void)_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!");
    if (!panel.expired())
        _update();
}

void MwPlayViewController::seekBy(int milliseconds)
{
    if (!_model->getCurrentPlayPath().empty() && _duration > 0 && !_slider->isHeld())
        _seekTo(mwSoughtPosition(_model->getCurrentPlayPosition(), milliseconds, _duration));
}

bool MwPlayViewController::takeKey(const std::string& key)
{
    if (key == "Left" || key == "Right")
        seekBy(key == "Left" ? -MwPlaySlider::KEY_STEP : MwPlaySlider::KEY_STEP);
    else if (key == "space")
        togglePlay();
    else
        return false;
    return true;
}

void MwPlayViewController::_changeFile(MwPlaySeekButton::Direction direction)
{
    // A redraw puts the markers of the new file in place of these.
    const Evas_Object* widget = _bookmarks->_bookmarkWidget();
    if (direction == MwPlaySeekButton::Direction::Rewind) {
        if (!_model->getPreviousPlayPath()) {
            MW_LOGE("getPreviousPlayPath failed!!!");
            return;
        }
        if (!_send(MwAppController::PLAY_PREVIOUS, "play previous failed!"))
            return;
    } else if (!_send(MwAppController::PLAY_NEXT, "play next failed!")) {
        return;
    }
    if (widget && widget == _bookmarks->_bookmarkWidget())
        _bookmarks->hide();
    if (_playViewType == REPORTS_FILE_CHANGES)
        _eventSignal.emit(FILE_CHANGED);
}
