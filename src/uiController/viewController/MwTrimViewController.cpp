#include "MwTrimViewController.h"

#include <Elementary.h>

#include <libintl.h>
#include <utility>

#include <panekit/WAccessibility.h>
#include <panekit/WPopupController.h>
#include <uxt_theme.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwPartImage.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"
#include "MwSavedBookmarks.h"
#include "MwText.h"
#include "MwTrimBars.h"
#include "MwTrimBookmarkWidget.h"
#include "MwTrimSaving.h"
#include "MwTrimWaveform.h"

using panekit::WPopupController;
using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwTrimView.edj";
constexpr auto LAYOUT_GROUP = "trim_view";
constexpr auto DOCK_PART = "elm.swallow.controller";
constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto LABEL_PART = "elm.text";
constexpr auto LARGE = "mewlo/circle_button/large";
constexpr auto SMALL = "mewlo/circle_button/player_small";
constexpr auto COLOR = "AO024";
constexpr auto DISABLED_COLOR = "AO024D";
constexpr auto BOOKMARK_COLOR = "AO002";
constexpr auto PLAY_BUTTON = "play_button";
constexpr auto CANCEL_BUTTON = "cancel_button";
constexpr auto SAVE_BUTTON = "save_button";
constexpr auto WAVEFORM_PART = "waveform";
constexpr auto BOOKMARK_PART = "bookmark_confine_rect";
constexpr auto BEGIN_TEXT = "time_text_begin";
constexpr auto END_TEXT = "time_text_end";
constexpr auto PLAYING_TEXT = "time_text_playing";
constexpr auto PLAY_IMAGE = "mainView/full_player_button_play.png";
constexpr auto PAUSE_IMAGE = "mainView/full_player_button_pause.png";
constexpr auto CANCEL_IMAGE = "mainView/voice_icon_cancel.png";
constexpr auto SAVE_IMAGE = "mainView/voice_icon_save.png";
constexpr auto BOOKMARK_IMAGE = "mainView/voice_bookmark_icon.png";

std::string edjePath(const char* file)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(file, path) || path.empty())
        MW_LOGE("getEdjPath fail");
    return path;
}

std::string imageOf(Evas_Object* button)
{
    const char* image = nullptr;
    if (Evas_Object* icon = button ? elm_object_part_content_get(button, ICON_PART) : nullptr; icon)
        elm_image_file_get(icon, nullptr, &image);
    return image ? image : "";
}

void logBookmarkFailure(const char* call, int code) { MW_LOGE("%s failed : [%d]!!!", call, code); }

}

MwTrimViewController::MwTrimViewController(MwModel* model, MwAppController* appController)
    : _model(model)
    , _appController(appController)
{
}

MwTrimViewController::~MwTrimViewController() = default;

Evas_Object* MwTrimViewController::onCreateView(Evas_Object* parent, void*)
{
    _playPath = _model->getCurrentPlayPath();
    const std::string path = edjePath(LAYOUT_FILE);
    if (path.empty())
        return nullptr;
    Evas_Object* layout = elm_layout_add(parent);
    // Time goes from left to right, whatever direction texts have.
    elm_object_mirrored_automatic_set(layout, EINA_FALSE);
    elm_object_mirrored_set(layout, EINA_FALSE);
    elm_layout_file_set(layout, path.c_str(), LAYOUT_GROUP);
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_object_part_content_set(parent, DOCK_PART, layout);
    evas_object_show(layout);
    return layout;
}

void MwTrimViewController::onCreated()
{
    _range = MwTrimRange(_model->getCurrentPlayDuration());
    _saving = std::make_unique<MwTrimSaving>(getEvasObject(), _model, _appController,
        [this](bool saved) { _close(saved ? TRIM_VIEW_EVENT_SAVED : TRIM_VIEW_EVENT_CLOSE); });
    _createButtons();
    _createBookmarkUI();
    _createWaveform();
    _updateTimes();
    _updateSaveButton();
    _listen();
    _listenToKeys();
}

void MwTrimViewController::onDestroy()
{
    evas_event_callback_del_full(
        evas_object_evas_get(getEvasObject()), EVAS_CALLBACK_RENDER_FLUSH_POST, _waveformFulshPost, this);
    _stopListening();
    _stopPlayerTimer();
    if (_discardPopup)
        _discardPopup->destroy();
    _saving.reset();
    _bars.reset();
    _waveformData.reset();
    _eventSignal.removeAll();
}

void MwTrimViewController::_listen()
{
    MwSignalMgr* signals = MwSignalMgr::getInstance();
    _lifeCycleListener = signals->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    // These go with the view, or with their owner when that ends first.
    signals->getSystemInfoSignal().addListener(
        [this](MwSignalMgr::SystemInfo info) {
            if (info == MwSignalMgr::THEME_CHANGED)
                _waveformData->_updateWaveform();
        },
        getEvasObject());
    _appController->getPlayerUpdatedSignal().addListener([this] { _update(); }, getEvasObject());
}

// On TERMINATE at the latest: afterwards the signals are gone, while the panel waits for its window.
void MwTrimViewController::_stopListening()
{
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals)
        mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
}

void MwTrimViewController::_lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle)
{
    switch (lifeCycle) {
    case MwSignalMgr::RESUME:
        if (_isPlaying())
            _startPlayerTimer();
        return;
    case MwSignalMgr::PAUSE:
        return _stopPlayerTimer();
    case MwSignalMgr::TERMINATE:
        _stopPlayerTimer();
        return _stopListening();
    }
}

void MwTrimViewController::_createButtons()
{
    Evas_Object* play = _createButton(PLAY_BUTTON, LARGE, PLAY_IMAGE, nullptr);
    evas_object_smart_callback_add(play, "clicked", _smartCb<&MwTrimViewController::_playButtonClicked>, this);
    Evas_Object* cancel = _createButton(CANCEL_BUTTON, SMALL, CANCEL_IMAGE, "IDS_MW_BUTTON_CANCEL");
    evas_object_smart_callback_add(cancel, "clicked", _smartCb<&MwTrimViewController::_cancelButtonClicked>, this);
    Evas_Object* save = _createButton(SAVE_BUTTON, SMALL, SAVE_IMAGE, "IDS_MW_OPT_SAVE");
    evas_object_smart_callback_add(save, "clicked", _smartCb<&MwTrimViewController::_saveButtonClicked>, this);
    _updatePlayButton();
}

Evas_Object* MwTrimViewController::_createButton(
    const char* part, const char* style, const char* icon, const char* label)
{
    Evas_Object* button = uxt_button_add_with_style(getEvasObject(), style);
    mwSetPartImage(button, ICON_PART, icon, COLOR);
    if (label) {
        elm_object_domain_translatable_part_text_set(button, LABEL_PART, textdomain(nullptr), label);
        panekit::setAccessibleName(button, label);
    }
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    elm_object_part_content_set(getEvasObject(), part, button);
    evas_object_show(button);
    return button;
}

void MwTrimViewController::_createBookmarkUI()
{
    if (_playPath.empty()) {
        MW_LOGE("_playPath is empty!!!");
        return;
    }
    const MwFileInfo* info = _model->getRecordedFileInfoByPath(_playPath);
    const auto bookmarks = info ? mwReadBookmarks(info->mediaId, logBookmarkFailure) : std::vector<MwSavedBookmark>();
    if (bookmarks.empty())
        return;
    Evas* canvas = evas_object_evas_get(getEvasObject());
    Evas_Object* widget = MwTrimBookmarkWidget::add(canvas, bookmarks, _range.getDuration());
    const std::string path = edjePath(IMAGE_FILE);
    for (size_t i = 0; i < bookmarks.size(); ++i) {
        Evas_Object* icon = elm_image_add(getEvasObject());
        elm_image_file_set(icon, path.c_str(), BOOKMARK_IMAGE);
        uxt_theme_object_set_color(icon, BOOKMARK_COLOR);
        Evas_Object* line = evas_object_rectangle_add(canvas);
        uxt_theme_object_set_color(line, BOOKMARK_COLOR);
        MwTrimBookmarkWidget::addMark(widget, icon, line);
    }
    elm_object_part_content_set(getEvasObject(), BOOKMARK_PART, widget);
    evas_object_show(widget);
}

void MwTrimViewController::_createWaveform()
{
    _waveformData = std::make_unique<MwTrimWaveform>(getEvasObject(), WAVEFORM_PART, _playPath);
    // Once everything has its place.
    evas_event_callback_add(
        evas_object_evas_get(getEvasObject()), EVAS_CALLBACK_RENDER_FLUSH_POST, _waveformFulshPost, this);
}

void MwTrimViewController::_waveformFulshPost(void* data, Evas* canvas, void*)
{
    auto* self = static_cast<MwTrimViewController*>(data);
    evas_event_callback_del_full(canvas, EVAS_CALLBACK_RENDER_FLUSH_POST, _waveformFulshPost, self);
    // Objects are not made while a frame is being finished.
    const std::weak_ptr<void> panel = self->_token;
    WTimer::addJob([self, panel](void*) {
        if (!panel.expired())
            self->_createBars();
    });
}

void MwTrimViewController::_createBars()
{
    _bars = std::make_unique<MwTrimBars>(getEvasObject(), _range,
        MwTrimBars::Callbacks{[this] { return _model->getCurrentPlayPosition(); }, [this] { _rangeMoved(); },
            [this](unsigned int position) {
                _model->setCurrentPlayPosition(position);
                _bars->update();
                _updateTimes();
            },
            [this](unsigned int position) { _choosePosition(position); },
            [this](MwTrimRange::Press bar) {
                if (bar == MwTrimRange::PLAY_POSITION_BAR_PRESSED)
                    _stopPlayerTimer();
                _updateTimes();
                if (bar == MwTrimRange::NONE)
                    _update();
            }});
    if (!WPopupController::topmost())
        _bars->focus();
    _update();
}

void MwTrimViewController::_listenToKeys()
{
    const auto pressed = [](void* data, Evas_Object*, Evas_Object*, Evas_Callback_Type type, void* info) -> Eina_Bool {
        auto* event = static_cast<Evas_Event_Key_Down*>(info);
        if (type != EVAS_CALLBACK_KEY_DOWN || (event->event_flags & EVAS_EVENT_FLAG_ON_HOLD))
            return EINA_FALSE;
        if (!static_cast<MwTrimViewController*>(data)->_keyPressed(event->key))
            return EINA_FALSE;
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
        return EINA_TRUE;
    };
    elm_object_event_callback_add(getEvasObject(), pressed, this);
}

// What the focused part of the panel has not taken for itself.
bool MwTrimViewController::_keyPressed(const std::string& key)
{
    if (key == "space")
        _playButtonClicked();
    else if (key == "Return" || key == "KP_Enter")
        _saveButtonClicked();
    else if (key == "Escape")
        back();
    else
        return false;
    return true;
}

bool MwTrimViewController::_isPlaying() const { return _model->getPlayerState() == PLAY_STATE_PLAYING; }

bool MwTrimViewController::_send(MwAppController::Command command, const char* failure)
{
    // What the controller reports may end the panel.
    const std::weak_ptr<void> panel = _token;
    const bool done = _appController->dispatchCommand(command);
    if (!done)
        MW_LOGE("%s", failure);
    return done && !panel.expired();
}

void MwTrimViewController::_playButtonClicked()
{
    switch (_model->getPlayerState()) {
    case PLAY_STATE_PLAYING:
        _send(MwAppController::PAUSE_PLAYING, "pause failed!");
        return;
    case PLAY_STATE_PAUSED:
        _send(MwAppController::RESUME_PLAYING, "resume failed!");
        return;
    case PLAY_STATE_NONE:
        break;
    default:
        MW_LOGE("invalid state - [%d]", mwNumber(_model->getPlayerState()));
        return;
    }
    if (_playPath.empty()) {
        MW_LOGE("_playPath is empty!!!");
        return;
    }
    const unsigned int position = _range.confine(_model->getCurrentPlayPosition());
    _model->setCurrentPlayPath(_playPath);
    if (!_send(MwAppController::START_PLAYING, "START_PLAYING failed"))
        return;
    _model->setCurrentPlayPosition(position);
    _send(MwAppController::SET_PLAYER_POSITION, "SET_PLAYER_POSITION failed");
}

void MwTrimViewController::_cancelButtonClicked() { back(); }

void MwTrimViewController::back()
{
    if (_saving->isUnderWay() || _discardPopup)
        return;
    if (!_range.isTrimmed())
        return _discard();
    _discardPopup = new WPopupController();
    _discardPopup->setTitle("IDS_VDOE_HEADER_DISCARD_CHANGES_ABB3");
    _discardPopup->setContent("IDS_VDOE_POP_ALL_CHANGES_WILL_BE_DISCARDED");
    _discardPopup->addButton("IDS_MW_BUTTON_CANCEL", [](WPopupController* self) { self->destroy(); });
    _discardPopup->addButton("IDS_MW_BUTTON_DISCARD_ABB3", [this](WPopupController* self) {
        self->destroy();
        _discard();
    });
    _discardPopup->setOnDestroyed([this] { _discardPopup = nullptr; });
    _discardPopup->create(elm_object_top_widget_get(getEvasObject()));
}

void MwTrimViewController::_discard()
{
    const std::weak_ptr<void> panel = _token;
    if (_isPlaying())
        _send(MwAppController::PAUSE_PLAYING, "pause failed!");
    if (!panel.expired())
        _close(TRIM_VIEW_EVENT_CLOSE);
}

void MwTrimViewController::_close(eventType event)
{
    if (!std::exchange(_isClosed, true))
        _eventSignal.emit(event);
}

void MwTrimViewController::_saveButtonClicked()
{
    if (_range.isTrimmed() && !_discardPopup)
        _saving->ask({_playPath, _range.getBegin(), _range.getEnd(), _range.getDuration()});
}

void MwTrimViewController::_update()
{
    _updatePlayButton();
    if (_bars && _bars->getPressed() == MwTrimRange::PLAY_POSITION_BAR_PRESSED) {
        MW_LOGI("playing bar is pressed");
        return;
    }
    if (_model->getCurrentPlayPosition() < _range.getBegin())
        _model->setCurrentPlayPosition(_range.getBegin());
    _updatePlayingTrimBar();
    _updateTimes();
    if (_isPlaying())
        _startPlayerTimer();
    else
        _stopPlayerTimer();
}

// One button with two faces, so that the keyboard stays where it is.
void MwTrimViewController::_updatePlayButton()
{
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), PLAY_BUTTON);
    const char* image = _isPlaying() ? PAUSE_IMAGE : PLAY_IMAGE;
    if (imageOf(button) != image)
        mwSetPartImage(button, ICON_PART, image, COLOR);
    panekit::setAccessibleName(button, _isPlaying() ? "IDS_MW_BODY_PAUSE" : "IDS_MW_BUTTON_PLAY");
}

void MwTrimViewController::_updateSaveButton()
{
    MW_LOGI("_trimBegin %u, _trimEnd %u, duration %u", _range.getBegin(), _range.getEnd(), _range.getDuration());
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), SAVE_BUTTON);
    const bool isPossible = _range.isTrimmed();
    if (isPossible == (elm_object_disabled_get(button) == EINA_FALSE))
        return;
    elm_object_disabled_set(button, !isPossible);
    uxt_theme_object_set_color(elm_object_part_content_get(button, ICON_PART), isPossible ? COLOR : DISABLED_COLOR);
}

void MwTrimViewController::_updatePlayingTrimBar()
{
    if (_bars)
        _bars->update();
}

void MwTrimViewController::_updateTimes()
{
    const MwTrimRange::Press pressed = _bars ? _bars->getPressed() : MwTrimRange::NONE;
    _showTime(BEGIN_TEXT, _range.getBegin(), pressed == MwTrimRange::START_TRIM_BAR_PRESSED);
    _showTime(END_TEXT, _range.getEnd(), pressed == MwTrimRange::END_TRIM_BAR_PRESSED);
    _showTime(PLAYING_TEXT, _model->getCurrentPlayPosition(), pressed == MwTrimRange::PLAY_POSITION_BAR_PRESSED);
}

// To a tenth of a second while a finger holds its bar.
void MwTrimViewController::_showTime(const char* part, unsigned int time, bool isHeld)
{
    std::string text = MwModel::getDurationText(time, false);
    if (isHeld)
        text += mwFormat(".%u", time % 1000 / 100);
    const char* shown = elm_object_part_text_get(getEvasObject(), part);
    if (shown && text == shown)
        return;
    elm_object_part_text_set(getEvasObject(), part, text.c_str());
    elm_object_signal_emit(getEvasObject(), (std::string(part) + (isHeld ? ",held" : ",free")).c_str(), "mewlo");
}

void MwTrimViewController::_rangeMoved()
{
    _moveInside();
    _bars->update();
    _updateTimes();
    _updateSaveButton();
}

// The play bar goes along with a bar that pushes it.
void MwTrimViewController::_moveInside()
{
    const unsigned int position = _model->getCurrentPlayPosition();
    if (const unsigned int inside = _range.confine(position); inside != position)
        _seekTo(inside);
}

void MwTrimViewController::_seekTo(unsigned int position)
{
    _model->setCurrentPlayPosition(position);
    if (_model->getPlayerState() != PLAY_STATE_NONE)
        _send(MwAppController::SET_PLAYER_POSITION, "SET_PLAYER_POSITION failed");
}

void MwTrimViewController::_choosePosition(unsigned int position)
{
    const std::weak_ptr<void> panel = _token;
    _seekTo(position);
    if (!panel.expired())
        _update();
}

void MwTrimViewController::_startPlayerTimer()
{
    _stopPlayerTimer();
    _playerTimer = WTimer::addTimer(mwPlayRefreshPeriod(_range.getDuration()), [this](void*) {
        const std::weak_ptr<void> panel = _token;
        _keepInside();
        if (panel.expired())
            return false;
        _updatePlayingTrimBar();
        _updateTimes();
        return true;
    });
}

void MwTrimViewController::_stopPlayerTimer() { WTimer::destroy(_playerTimer); }

// At the end of the range it pauses at the beginning of it.
void MwTrimViewController::_keepInside()
{
    const unsigned int position = _model->getCurrentPlayPosition();
    if (position >= _range.getBegin() && position <= _range.getEnd())
        return;
    const std::weak_ptr<void> panel = _token;
    if (position > _range.getEnd() && _isPlaying())
        _send(MwAppController::PAUSE_PLAYING, "pause failed!");
    if (!panel.expired())
        _seekTo(_range.getBegin());
}
