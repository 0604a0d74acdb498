#include "MwRecorderButtons.h"

#include <cstring>
#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwPartImage.h"

struct MwRecorderButtons::Look {
    const char* part;
    const char* style;
    const char* icon; // null for none
    const char* iconColor;
    const char* background; // null for none
    const char* backgroundColor;
    const char* label; // null for none
    const char* accessibleName;
};

namespace {

constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto BACKGROUND_PART = "elm.icon.bg";
constexpr auto LABEL_PART = "elm.text";
constexpr auto LARGE = "mewlo/circle_button/large";
constexpr auto SMALL = "mewlo/circle_button/small";
constexpr auto RECORD_ICON = "mainView/voice_btn_rec.png";
constexpr auto RECORD_BACKGROUND = "mainView/voice_btn_bg_rec.png";

}

const MwRecorderButtons::Look& MwRecorderButtons::_look(Button button)
{
    static const Look LOOKS[] = {
        {"record_button", LARGE, RECORD_ICON, "AO014", RECORD_BACKGROUND, "AO022", nullptr, "IDS_MW_BODY_RECORD"},
        {"recordings_button", SMALL, "mainView/voice_icon_recordings.png", "AO023", nullptr, nullptr,
            "IDS_MW_OPT_RECORDINGS_M_VOICE_ABB", "IDS_MW_OPT_RECORDINGS_M_VOICE_ABB"},
        {"stop_button", LARGE, "mainView/full_player_button_stop.png", "AO022", nullptr, nullptr, nullptr,
            "IDS_MW_BODY_STOP"},
        {"bookmark_button", SMALL, "mainView/voice_icon_bookmark.png", "AO023", nullptr, nullptr,
            "IDS_MW_BODY_BOOKMARK", "IDS_MW_BODY_BOOKMARK"},
        {"pause_button", SMALL, "mainView/voice_icon_pause.png", "AO023", nullptr, nullptr, "IDS_MW_BODY_PAUSE",
            "IDS_MW_BODY_PAUSE"},
        {"resume_button", SMALL, RECORD_ICON, "AO014", RECORD_BACKGROUND, "AO022", "IDS_MW_SK_RESUME",
            "IDS_MW_SK_RESUME"},
        // What the back key does, for those who have a mouse only.
        {"discard_button", "mewlo/title/discard", nullptr, nullptr, nullptr, nullptr, nullptr,
            "IDS_MW_BUTTON_DISCARD_ABB3"},
    };
    static_assert(std::size(LOOKS) == BUTTONS);
    return LOOKS[button];
}

MwRecorderButtons::MwRecorderButtons(Evas_Object* layout, Clicked clicked)
    : _layout(layout)
    , _clicked(std::move(clicked))
    , _slots()
{
    for (int each = 0; each < BUTTONS; ++each)
        _slots[each] = {this, static_cast<Button>(each)};
}

Evas_Object* MwRecorderButtons::_get(Button button) const
{
    return elm_object_part_content_get(_layout, _look(button).part);
}

void MwRecorderButtons::clear()
{
    for (const Slot& slot : _slots) {
        Evas_Object* button = _get(slot.button);
        if (!button)
            continue;
        elm_object_part_content_unset(_layout, _look(slot.button).part);
        evas_object_del(button);
    }
}

void MwRecorderButtons::add(std::initializer_list<Button> buttons)
{
    for (const Button button : buttons)
        _create(button);
}

void MwRecorderButtons::_create(Button button)
{
    const Look& look = _look(button);
    Evas_Object* object = uxt_button_add_with_style(_layout, look.style);
    elm_object_part_content_set(_layout, look.part, object);
    if (look.icon)
        mwSetPartImage(object, ICON_PART, look.icon, look.iconColor);
    if (look.background)
        mwSetPartImage(object, BACKGROUND_PART, look.background, look.backgroundColor);
    if (look.label)
        elm_object_domain_translatable_part_text_set(object, LABEL_PART, textdomain(nullptr), look.label);
    panekit::setAccessibleName(object, look.accessibleName);
    // A click or touch leaves the keyboard with the big button, so that Space and Return go on meaning what they do.
    elm_object_focus_move_policy_set(object, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_smart_callback_add(object, "clicked", _clickedCb, &_slots[button]);
    if (button == STOP) {
        evas_object_event_callback_priority_add(
            object, EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _stopKeyCb, this);
    }
    evas_object_show(object);
}

void MwRecorderButtons::focusMain()
{
    for (const Button button : {RECORD, STOP}) {
        if (Evas_Object* object = _get(button); object)
            elm_object_focus_set(object, EINA_TRUE);
    }
}

void MwRecorderButtons::ignoreFurtherClicks(Button button)
{
    if (Evas_Object* object = _get(button); object)
        evas_object_smart_callback_del_full(object, "clicked", _clickedCb, &_slots[button]);
}

void MwRecorderButtons::_clickedCb(void* data, Evas_Object*, void*)
{
    const auto* slot = static_cast<Slot*>(data);
    slot->buttons->_clicked(slot->button);
}

void MwRecorderButtons::_stopKeyCb(void* data, Evas*, Evas_Object*, void* info)
{
    const auto* self = static_cast<MwRecorderButtons*>(data);
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    const bool isSpace = std::strcmp(event->key, "space") == 0;
    if (!isSpace && std::strcmp(event->key, "b") != 0)
        return;
    for (const Button button : {PAUSE, RESUME, BOOKMARK}) {
        if ((button != BOOKMARK) != isSpace || !self->_get(button))
            continue;
        event->event_flags = EVAS_EVENT_FLAG_ON_HOLD;
        return self->_clicked(button);
    }
}
