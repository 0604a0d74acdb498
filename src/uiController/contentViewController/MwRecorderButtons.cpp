// The recorder screen: its buttons, rebuilt by every redraw.
#include "MwRecorderContentViewController.h"

#include <cstring>
#include <libintl.h>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <panekit/WPopupController.h>
#include <uxt_theme.h>

#include "MwLog.h"
#include "MwModel.h"
#include "MwResourceMgr.h"

struct MwRecorderContentViewController::ButtonLook {
    const char* part;
    const char* style;
    const char* icon;
    const char* iconColor;
    const char* background; // null for none
    const char* backgroundColor;
    const char* label; // null for none
    const char* accessibleName;
};

namespace {

constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto BACKGROUND_PART = "elm.icon.bg";
constexpr auto LABEL_PART = "elm.text";
constexpr auto LARGE = "mewlo/circle_button/large";
constexpr auto SMALL = "mewlo/circle_button/small";
constexpr auto DISCARD = "mewlo/title/discard";
constexpr auto DISCARD_PART = "discard_button";

}

void MwRecorderContentViewController::_createButton(const ButtonLook& look, Evas_Smart_Cb clicked)
{
    Evas_Object* button = uxt_button_add_with_style(getEvasObject(), look.style);
    elm_object_part_content_set(getEvasObject(), look.part, button);
    if (look.icon)
        _setButtonIcon(button, ICON_PART, look.icon, look.iconColor);
    if (look.background)
        _setButtonIcon(button, BACKGROUND_PART, look.background, look.backgroundColor);
    if (look.label)
        elm_object_domain_translatable_part_text_set(button, LABEL_PART, textdomain(nullptr), look.label);
    panekit::setAccessibleName(button, look.accessibleName);
    // A click or touch leaves the keyboard with the big button, so that Space and Return go on meaning what they do.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    evas_object_show(button);
}

void MwRecorderContentViewController::_setButtonIcon(
    Evas_Object* button, const char* part, const char* image, const char* color)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return;
    }
    Evas_Object* icon = elm_image_add(button);
    elm_image_file_set(icon, path.c_str(), image);
    uxt_theme_object_set_color(icon, color);
    elm_object_part_content_set(button, part, icon);
    evas_object_show(icon);
}

void MwRecorderContentViewController::_destroyButton(const char* part)
{
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), part);
    if (!button)
        return;
    elm_object_part_content_unset(getEvasObject(), part);
    evas_object_del(button);
}

void MwRecorderContentViewController::_createRecordButton()
{
    _createButton({"record_button", LARGE, "mainView/voice_btn_rec.png", "AO014", "mainView/voice_btn_bg_rec.png",
                      "AO022", nullptr, "IDS_MW_BODY_RECORD"},
        _recordButtonCb);
    _focusMainButton("record_button");
}

void MwRecorderContentViewController::_createStopButton()
{
    _createButton({"stop_button", LARGE, "mainView/full_player_button_stop.png", "AO022", nullptr, nullptr, nullptr,
                      "IDS_MW_BODY_STOP"},
        _stopButtonCb);
    Evas_Object* button = elm_object_part_content_get(getEvasObject(), "stop_button");
    evas_object_event_callback_priority_add(
        button, EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _stopButtonKeyCb, this);
    _focusMainButton("stop_button");
}

void MwRecorderContentViewController::_createBookmarkButton()
{
    _createButton({"bookmark_button", SMALL, "mainView/voice_icon_bookmark.png", "AO023", nullptr, nullptr,
                      "IDS_MW_BODY_BOOKMARK", "IDS_MW_BODY_BOOKMARK"},
        _bookmarkButtonCb);
}

void MwRecorderContentViewController::_createRecordingsButton()
{
    _createButton({"recordings_button", SMALL, "mainView/voice_icon_recordings.png", "AO023", nullptr, nullptr,
                      "IDS_MW_OPT_RECORDINGS_M_VOICE_ABB", "IDS_MW_OPT_RECORDINGS_M_VOICE_ABB"},
        _recordingsButtonCb);
}

void MwRecorderContentViewController::_createPauseButton()
{
    _createButton({"pause_button", SMALL, "mainView/voice_icon_pause.png", "AO023", nullptr, nullptr,
                      "IDS_MW_BODY_PAUSE", "IDS_MW_BODY_PAUSE"},
        _pauseButtonCb);
}

void MwRecorderContentViewController::_createResumeButton()
{
    _createButton({"resume_button", SMALL, "mainView/voice_btn_rec.png", "AO014", "mainView/voice_btn_bg_rec.png",
                      "AO022", "IDS_MW_SK_RESUME", "IDS_MW_SK_RESUME"},
        _resumeButtonCb);
}

// What the back key does, for those who have a mouse only.
void MwRecorderContentViewController::_createDiscardButton()
{
    _createButton({DISCARD_PART, DISCARD, nullptr, nullptr, nullptr, nullptr, nullptr, "IDS_MW_BUTTON_DISCARD_ABB3"},
        _discardButtonCb);
}

void MwRecorderContentViewController::_destroyRecordButton() { _destroyButton("record_button"); }

void MwRecorderContentViewController::_destroyStopButton() { _destroyButton("stop_button"); }

void MwRecorderContentViewController::_destroyBookmarkButton() { _destroyButton("bookmark_button"); }

void MwRecorderContentViewController::_destroyRecordingsButton() { _destroyButton("recordings_button"); }

void MwRecorderContentViewController::_destroyPauseButton() { _destroyButton("pause_button"); }

void MwRecorderContentViewController::_destroyResumeButton() { _destroyButton("resume_button"); }

void MwRecorderContentViewController::_destroyAllButtons()
{
    _destroyRecordButton();
    _destroyRecordingsButton();
    _destroyStopButton();
    _destroyBookmarkButton();
    _destroyPauseButton();
    _destroyResumeButton();
    _destroyButton(DISCARD_PART);
}

// Return and Space act on the big button unless the user has moved on, or a popup has the keyboard.
void MwRecorderContentViewController::_focusMainButton(const char* part)
{
    if (hasAttachedPopup() || panekit::WPopupController::topmost())
        return;
    elm_object_focus_set(elm_object_part_content_get(getEvasObject(), part), EINA_TRUE);
}

// A second tap must not send the command again; the next redraw builds a fresh button.
void MwRecorderContentViewController::_ignoreFurtherClicks(const char* part, Evas_Smart_Cb clicked)
{
    if (Evas_Object* button = elm_object_part_content_get(getEvasObject(), part); button)
        evas_object_smart_callback_del_full(button, "clicked", clicked, this);
}

void MwRecorderContentViewController::_recordButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_recordButtonClicked();
}

void MwRecorderContentViewController::_stopButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_stopButtonClicked();
}

void MwRecorderContentViewController::_bookmarkButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_bookmarkButtonClicked();
}

void MwRecorderContentViewController::_recordingsButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_recordingsButtonClicked();
}

void MwRecorderContentViewController::_pauseButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_pauseButtonClicked();
}

void MwRecorderContentViewController::_resumeButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_resumeButtonClicked();
}

void MwRecorderContentViewController::_discardButtonCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRecorderContentViewController*>(data)->_backKeyClicked();
}

// The stop button has the keyboard while recording: Return stops, Space pauses and resumes, B drops a bookmark.
void MwRecorderContentViewController::_stopButtonKeyCb(void* data, Evas*, Evas_Object*, void* info)
{
    auto* self = static_cast<MwRecorderContentViewController*>(data);
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    const bool isPaused = self->getModel()->getRecorderState() == REC_STATE_PAUSED;
    if (std::strcmp(event->key, "space") == 0) {
        event->event_flags = EVAS_EVENT_FLAG_ON_HOLD;
        return isPaused ? self->_resumeButtonClicked() : self->_pauseButtonClicked();
    }
    if (std::strcmp(event->key, "b") == 0 && !self->getModel()->isRequestMode()) {
        event->event_flags = EVAS_EVENT_FLAG_ON_HOLD;
        self->_bookmarkButtonClicked();
    }
}
