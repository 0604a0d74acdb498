// The player panel: its buttons.
#include "MwPlayViewController.h"

#include <Elementary.h>

#include <libintl.h>

#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwFeatureChecker.h"
#include "MwModel.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"

struct MwPlayViewController::ButtonLook {
    const char* part;
    const char* style;
    const char* icon;
    const char* label; // null for none
    const char* accessibleName;
};

namespace {

constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto LABEL_PART = "elm.text";
constexpr auto LARGE = "mewlo/circle_button/large";
constexpr auto SMALL = "mewlo/circle_button/player_small";
constexpr auto COLOR = "AO024";
constexpr auto PRESSED_COLOR = "AO024P";
constexpr auto DISABLED_COLOR = "AO024D";
constexpr auto PLAY_PART = "play_pause_btn";
constexpr auto BOOKMARK_PART = "bookmark_btn";
constexpr auto TRIM_PART = "trim_btn";
constexpr auto PLAY_IMAGE = "mainView/full_player_button_play.png";
constexpr auto PAUSE_IMAGE = "mainView/full_player_button_pause.png";

void tint(Evas_Object* button, const char* color)
{
    if (Evas_Object* icon = elm_object_part_content_get(button, ICON_PART); icon)
        uxt_theme_object_set_color(icon, color);
}

// The extension with its dot, empty when the path has none.
std::string extensionOf(const std::string& path)
{
    const size_t dot = path.rfind('.');
    return dot != std::string::npos && path.find('/', dot) == std::string::npos ? path.substr(dot) : std::string();
}

std::string imageOf(Evas_Object* button)
{
    const char* image = nullptr;
    if (Evas_Object* icon = button ? elm_object_part_content_get(button, ICON_PART) : nullptr; icon)
        elm_image_file_get(icon, nullptr, &image);
    return image ? image : "";
}

}

Evas_Object* MwPlayViewController::_createButton(const ButtonLook& look)
{
    Evas_Object* button = uxt_button_add_with_style(getEvasObject(), look.style);
    if (!_setIcon(button, look.icon, COLOR)) {
        evas_object_del(button);
        return nullptr;
    }
    if (look.label)
        elm_object_domain_translatable_part_text_set(button, LABEL_PART, textdomain(nullptr), look.label);
    panekit::setAccessibleName(button, look.accessibleName);
    // Clicks leave the keyboard with the list.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    elm_object_part_content_set(getEvasObject(), look.part, button);
    evas_object_show(button);
    return button;
}

bool MwPlayViewController::_setIcon(Evas_Object* button, const char* image, const char* color)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return false;
    }
    Evas_Object* icon = elm_image_add(button);
    elm_image_file_set(icon, path.c_str(), image);
    uxt_theme_object_set_color(icon, color);
    elm_object_part_content_set(button, ICON_PART, icon);
    evas_object_show(icon);
    return true;
}

void MwPlayViewController::_loadButtons()
{
    if (!_model) {
        MW_LOGE("_model == nullptr");
        return;
    }
    _loadPlayButton();
    _loadSeekButtons();
    _loadBookmarkButton();
    _loadTrimButton();
}

// One button with two faces, so that the keyboard stays where it is.
void MwPlayViewController::_loadPlayButton()
{
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), PLAY_PART);
    const char* image = _isPlaying() ? PAUSE_IMAGE : PLAY_IMAGE;
    const char* name = _isPlaying() ? "IDS_MW_BODY_PAUSE" : "IDS_MW_BUTTON_PLAY";
    if (!button) {
        button = _createButton({PLAY_PART, LARGE, image, nullptr, name});
        if (button)
            evas_object_smart_callback_add(button, "clicked", _smartCb<&MwPlayViewController::togglePlay>, this);
        return;
    }
    if (imageOf(button) == image)
        return;
    _setIcon(button, image, COLOR);
    panekit::setAccessibleName(button, name);
}

void MwPlayViewController::_loadSeekButtons()
{
    using Self = MwPlayViewController;
    if (!elm_object_part_content_get(getEvasObject(), _rewind.part)
        && _createButton(
            {_rewind.part, LARGE, "mainView/full_player_button_prev.png", nullptr, "IDS_MW_BUTTON_PREVIOUS"}))
        _watchSeekButton(_rewind, _smartCb<&Self::_pressRewButton>, _smartCb<&Self::_unpressRewButton>,
            _smartCb<&Self::_clickRewButton>);
    if (!elm_object_part_content_get(getEvasObject(), _fastForward.part)
        && _createButton(
            {_fastForward.part, LARGE, "mainView/full_player_button_next.png", nullptr, "IDS_MW_BUTTON_NEXT"}))
        _watchSeekButton(_fastForward, _smartCb<&Self::_pressFFButton>, _smartCb<&Self::_unpressFFButton>,
            _smartCb<&Self::_clickFFButton>);
}

void MwPlayViewController::_watchSeekButton(
    SeekButton& held, Evas_Smart_Cb pressed, Evas_Smart_Cb unpressed, Evas_Smart_Cb clicked)
{
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), held.part);
    evas_object_smart_callback_add(button, "pressed", pressed, this);
    evas_object_smart_callback_add(button, "unpressed", unpressed, this);
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    evas_object_event_callback_add(button, EVAS_CALLBACK_MOUSE_MOVE, _heldMoveCb, &held);
}

void MwPlayViewController::_loadBookmarkButton()
{
    if (_model->isRequestMode() || elm_object_part_content_get(getEvasObject(), BOOKMARK_PART))
        return;
    Evas_Object* button = _createButton(
        {BOOKMARK_PART, SMALL, "mainView/voice_icon_bookmark.png", "IDS_MW_BODY_BOOKMARK", "IDS_MW_BODY_BOOKMARK"});
    if (!button)
        return;
    evas_object_smart_callback_add(button, "clicked", _smartCb<&MwPlayViewController::_clickBookmarkButton>, this);
    _tintWhilePressed(button);
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
    if (!button) {
        button = _createButton(
            {TRIM_PART, SMALL, "mainView/voice_icon_trim.png", "IDS_MW_HEADER_TRIM", "IDS_MW_HEADER_TRIM"});
        if (!button)
            return;
        evas_object_smart_callback_add(button, "clicked", _smartCb<&MwPlayViewController::_clickTrimButton>, this);
        _tintWhilePressed(button);
    }
    const bool isTrimmable = mwIsTrimmable(extension, _duration);
    elm_object_disabled_set(button, !isTrimmable);
    tint(button, isTrimmable ? COLOR : DISABLED_COLOR);
}

void MwPlayViewController::_tintWhilePressed(Evas_Object* button)
{
    evas_object_smart_callback_add(
        button, "pressed", [](void*, Evas_Object* pressed, void*) { tint(pressed, PRESSED_COLOR); }, nullptr);
    evas_object_smart_callback_add(
        button, "unpressed", [](void*, Evas_Object* released, void*) { tint(released, COLOR); }, nullptr);
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
    if (Evas_Object* widget = _bookmarkWidget(); widget)
        evas_object_hide(widget);
    _eventSignal.emit(TRIM_REQUESTED);
}
