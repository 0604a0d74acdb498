#include "MwPlayViewController.h"

#include <Elementary.h>

#include <cstdint>

#include "MwModel.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwPlayView.edj";
constexpr auto LAYOUT_GROUP = "play_view";
constexpr auto DOCK_PART = "elm.swallow.controller";

}

MwPlayViewController::MwPlayViewController(MwModel* model, MwAppController* appController)
    : _rewind{this, Direction::Rewind, "rew_btn"}
    , _fastForward{this, Direction::FastForward, "ff_btn"}
    , _model(model)
    , _appController(appController)
    , _bookmarkPart("bookmark_confine_rect")
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
    _lifeCycleListener = MwSignalMgr::getInstance()->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    // Goes with the view, or with the controller when that ends first.
    _appController->getPlayerUpdatedSignal().addListener([this] { _playerUpdated(); }, getEvasObject());
    _update();
}

void MwPlayViewController::onDestroy()
{
    _stopListening();
    _eventSignal.removeAll();
    _stopTimers();
    _removeBookmarkWidget();
}

void MwPlayViewController::_stopTimers()
{
    for (const WTimer::Weak& timer : {_playerTimer, _rewind.timer, _fastForward.timer, _sliderJob})
        WTimer::destroy(timer);
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
    _refreshSlider(Draw::Everything);
    _refreshTimes();
    _loadButtons();
    _loadBookmark();
    if (_isPlaying() && !_isSliding)
        _startPlayerTimer();
    else
        _stopPlayerTimer();
}

void MwPlayViewController::_startPlayerTimer()
{
    _stopPlayerTimer();
    const auto tick = [](void* userData) {
        auto* self = static_cast<MwPlayViewController*>(userData);
        if (!self) {
            MW_LOGE("userData is nullptr!!!");
            return false;
        }
        self->_refreshSlider(Draw::WhatMoved);
        self->_refreshTimes();
        return true;
    };
    _playerTimer = WTimer::addTimer(mwPlayRefreshPeriod(_duration), tick, this);
}

void MwPlayViewController::_stopPlayerTimer() { WTimer::destroy(_playerTimer); }

void MwPlayViewController::togglePlay() { _isPlaying() ? _clickPauseButton() : _clickPlayButton(); }
