#include "MwRenamePopupController.h"

#include <cstdlib>
#include <cstring>
#include <libintl.h>
#include <utility>

#include <Ecore_X.h>
#include <Elementary.h>

#include <eext_event.h>
#include <notification.h>
#include <uxt_theme.h>

#include "MwLog.h"
#include "MwText.h"

using panekit::WTimer;

namespace {

constexpr auto WINDOW_NAME = "mewlo_rename_popup_win";
constexpr auto INVALID_CHARACTERS = "\\:/*?\"<>|";
constexpr int WINDOW_WIDTH = 680; // design units
constexpr int WINDOW_HEIGHT = 330;
constexpr double SELECT_INTERVAL = 0.1; // seconds
constexpr int SELECT_ROUNDS = 5;

int scaled(int units) { return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get()); }

bool hasVisibleCharacter(const std::string& text) { return text.find_first_not_of(' ') != std::string::npos; }

// A phone's compositor would otherwise move the window in.
void disableWindowEffect(Evas_Object* window)
{
    const Ecore_X_Window id = elm_win_xwindow_get(window);
    if (!id)
        return;
    const Ecore_X_Atom atom = ecore_x_atom_get("_NET_CM_WINDOW_EFFECT_ENABLE");
    unsigned int enable = 0;
    if (atom)
        ecore_x_window_prop_card32_set(id, atom, &enable, 1);
}

}

MwRenamePopupController::MwRenamePopupController(const char* initialName)
    : _initialText(initialName ? mwAdopt(elm_entry_utf8_to_markup(initialName)) : std::string())
{
}

MwRenamePopupController::~MwRenamePopupController() { destory(); }

void MwRenamePopupController::setResponseCb(ResponseCb callback, void* userData)
{
    _responseCb = std::move(callback);
    _userData = userData;
}

bool MwRenamePopupController::create(Evas_Object* parentWindow, void*)
{
    if (_window)
        return false;
    Evas_Object* layout = _createWindowBaseLayout(parentWindow);
    if (!layout)
        return false;
    _popup = elm_popup_add(layout);
    elm_object_style_set(_popup, "transparent");
    elm_popup_align_set(_popup, ELM_NOTIFY_ALIGN_FILL, 1.0);
    evas_object_size_hint_weight_set(_popup, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    const char* domain = textdomain(nullptr);
    elm_object_domain_translatable_part_text_set(_popup, "title,text", domain, "IDS_MUSIC_OPT_RENAME");
    _cancelButton = _addButton("button1", "IDS_MW_BUTTON_CANCEL", _cancelButtonClicked);
    _renameButton = _addButton("button2", "IDS_MUSIC_OPT_RENAME", _renameButtonClicked);
    elm_object_content_set(_popup, _createEntryLayout(_popup));
    evas_object_show(_popup);
    evas_object_show(_window);
    elm_object_focus_set(_entry, EINA_TRUE);
    _renameButtonUpdate();
    return true;
}

Evas_Object* MwRenamePopupController::_createWindowBaseLayout(Evas_Object* parentWindow)
{
    if (!parentWindow)
        return nullptr;
    // A dialog of the parent stays above it and takes the keyboard; without a frame it looks like any other popup.
    _window = elm_win_add(parentWindow, WINDOW_NAME, ELM_WIN_DIALOG_BASIC);
    if (!_window)
        return nullptr;
    elm_win_title_set(_window, mwTranslate("IDS_MUSIC_OPT_RENAME").c_str());
    elm_win_autodel_set(_window, EINA_TRUE);
    elm_win_borderless_set(_window, EINA_TRUE);
    elm_win_modal_set(_window, EINA_TRUE);
    evas_object_event_callback_add(_window, EVAS_CALLBACK_DEL, _windowDelCb, this);
    evas_object_smart_callback_add(_window, "focus,in", _windowFocusedCb, this);
    // Taken and without effect: the answer is given with the buttons.
    eext_object_event_callback_add(
        _window, EEXT_CALLBACK_BACK, [](void*, Evas_Object*, void*) {}, nullptr);
    disableWindowEffect(_window);
    _placeWindow(parentWindow);

    Evas_Object* background = elm_bg_add(_window);
    evas_object_size_hint_weight_set(background, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_win_resize_object_add(_window, background);
    evas_object_show(background);
    Evas_Object* conformant = elm_conformant_add(_window);
    evas_object_size_hint_weight_set(conformant, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_data_set(conformant, "overlap", reinterpret_cast<void*>(1));
    elm_object_signal_emit(conformant, "elm,state,indicator,overlap", "elm");
    elm_win_resize_object_add(_window, conformant);
    evas_object_show(conformant);
    Evas_Object* layout = elm_layout_add(conformant);
    elm_layout_theme_set(layout, "layout", "application", "default");
    elm_object_content_set(conformant, layout);
    evas_object_show(layout);
    return layout;
}

// In the middle of the application's window.
void MwRenamePopupController::_placeWindow(Evas_Object* parentWindow)
{
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
    elm_win_screen_position_get(parentWindow, &x, &y);
    evas_object_geometry_get(parentWindow, nullptr, nullptr, &width, &height);
    evas_object_resize(_window, scaled(WINDOW_WIDTH), scaled(WINDOW_HEIGHT));
    evas_object_move(_window, x + (width - scaled(WINDOW_WIDTH)) / 2, y + (height - scaled(WINDOW_HEIGHT)) / 2);
}

Evas_Object* MwRenamePopupController::_addButton(
    const char* part, const char* label, void (*callback)(void*, Evas_Object*, void*))
{
    Evas_Object* button = uxt_button_add_with_style(_popup, "popup");
    elm_object_domain_translatable_part_text_set(button, nullptr, textdomain(nullptr), label);
    evas_object_smart_callback_add(button, "clicked", callback, this);
    elm_object_part_content_set(_popup, part, button);
    return button;
}

Evas_Object* MwRenamePopupController::_createEntryLayout(Evas_Object* popup)
{
    Evas_Object* layout = uxt_edit_field_layout_add(popup, 2, &_entry);
    if (!layout) {
        MW_LOGE("uxt_edit_field_layout_add fail");
        return nullptr;
    }
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, 0.0);
    evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, 0.5);
    elm_entry_scrollable_set(_entry, EINA_TRUE);
    elm_scroller_policy_set(_entry, ELM_SCROLLER_POLICY_OFF, ELM_SCROLLER_POLICY_OFF);
    elm_object_signal_emit(layout, "elm,action,hide,search_icon", "");
    elm_object_part_text_set(_entry, "elm.guide", "");
    elm_entry_input_panel_layout_set(_entry, ELM_INPUT_PANEL_LAYOUT_NORMAL);
    elm_entry_input_panel_layout_variation_set(_entry, 1);
    constexpr auto PANEL_DATA = "action=disable_emoticons";
    elm_entry_input_panel_imdata_set(_entry, PANEL_DATA, static_cast<int>(std::strlen(PANEL_DATA)));
    elm_entry_prediction_allow_set(_entry, EINA_FALSE);
    elm_entry_input_panel_return_key_type_set(_entry, ELM_INPUT_PANEL_RETURN_KEY_TYPE_DONE);
    _installFilters();
    elm_entry_entry_insert(_entry, _initialText.c_str());
    elm_entry_select_all(_entry);
    evas_object_smart_callback_add(_entry, "maxlength,reached", _entryMaxlengthReachedCb, this);
    evas_object_smart_callback_add(_entry, "activated", _entryActivatedCb, this);
    evas_object_smart_callback_add(_entry, "changed", _entryChangedCb, this);
    evas_object_smart_callback_add(_entry, "preedit,changed", _entryPreeditChangedCb, this);
    evas_object_show(layout);
    return layout;
}

void MwRenamePopupController::_installFilters()
{
    // Read by the toolkit as long as the entry lives.
    static Elm_Entry_Filter_Limit_Size limit = {MAX_LENGTH, 0};
    elm_entry_markup_filter_append(_entry, elm_entry_filter_limit_size, &limit);
    elm_entry_markup_filter_append(_entry, _invalidCharacterFilter, this);
}

std::string MwRenamePopupController::withoutInvalidCharacters(const std::string& text, bool& found)
{
    const size_t invalid = text.find_first_of(INVALID_CHARACTERS);
    found = invalid != std::string::npos;
    return text.substr(0, invalid);
}

void MwRenamePopupController::_invalidCharacterFilter(void*, Evas_Object*, char** text)
{
    char* utf8 = text && *text ? elm_entry_markup_to_utf8(*text) : nullptr;
    if (!utf8) {
        MW_LOGE("text is nullptr!!!");
        return;
    }
    bool found = false;
    const std::string valid = withoutInvalidCharacters(mwAdopt(utf8), found);
    if (!found)
        return;
    std::free(*text);
    *text = valid.empty() ? nullptr : elm_entry_utf8_to_markup(valid.c_str());
    mwPost("IDS_IDLE_TPOP_INVALID_CHARACTER_ENTERED");
}

std::string MwRenamePopupController::_entryText() const
{
    const char* markup = _entry ? elm_entry_entry_get(_entry) : nullptr;
    return markup ? mwAdopt(elm_entry_markup_to_utf8(markup)) : std::string();
}

bool MwRenamePopupController::_entryStringCheck() const
{
    const char* markup = _entry ? elm_entry_entry_get(_entry) : nullptr;
    if (!markup) {
        MW_LOGE("inputStr is nullptr");
        return false;
    }
    const std::string text = _entryText();
    return text != mwAdopt(elm_entry_markup_to_utf8(_initialText.c_str())) && hasVisibleCharacter(text);
}

void MwRenamePopupController::_renameButtonUpdate()
{
    const bool valid = _entryStringCheck();
    elm_object_disabled_set(_renameButton, !valid);
    elm_entry_input_panel_return_key_disabled_set(_entry, !valid);
}

// The owner may close and delete the popup in its callback: nothing may follow.
void MwRenamePopupController::_respond(const char* text, int response)
{
    if (const ResponseCb callback = _responseCb; callback)
        callback(_userData, text, response);
}

void MwRenamePopupController::destory()
{
    WTimer::destroy(_closedJob);
    WTimer::destroy(_selectJob);
    Evas_Object* window = std::exchange(_window, nullptr);
    _popup = _entry = _renameButton = _cancelButton = nullptr;
    if (!window)
        return;
    evas_object_event_callback_del_full(window, EVAS_CALLBACK_DEL, _windowDelCb, this);
    evas_object_del(window);
}

// The window was closed by the window manager or with its parent. The owner hears a cancel, so that it does not wait
// for an answer that can no longer come.
void MwRenamePopupController::_windowDelCb(void* data, Evas*, Evas_Object*, void*)
{
    MW_LOGW("rename popup window is deleted");
    auto* self = static_cast<MwRenamePopupController*>(data);
    self->_window = self->_popup = self->_entry = self->_renameButton = self->_cancelButton = nullptr;
    self->_closedJob = WTimer::addJob([self](void*) { self->_respond(nullptr, RESPONSE_CANCEL); });
}

void MwRenamePopupController::_cancelButtonClicked(void* data, Evas_Object*, void*)
{
    static_cast<MwRenamePopupController*>(data)->_respond(nullptr, RESPONSE_CANCEL);
}

void MwRenamePopupController::_renameButtonClicked(void* data, Evas_Object*, void*)
{
    auto* self = static_cast<MwRenamePopupController*>(data);
    const std::string text = self->_entryText();
    elm_object_focus_set(self->_entry, EINA_TRUE);
    self->_respond(hasVisibleCharacter(text) ? text.c_str() : "", RESPONSE_RENAME);
}

void MwRenamePopupController::_entryActivatedCb(void* data, Evas_Object* entry, void*)
{
    auto* self = static_cast<MwRenamePopupController*>(data);
    elm_object_focus_set(entry, EINA_TRUE);
    // The name that it has already is no answer, as with the button; one that cannot be is refused with a message.
    const std::string text = self->_entryText();
    if (text != mwAdopt(elm_entry_markup_to_utf8(self->_initialText.c_str())))
        self->_respond(text.c_str(), RESPONSE_RENAME);
}

// Getting the keyboard drops the selection made before; typing must replace the name.
void MwRenamePopupController::_windowFocusedCb(void* data, Evas_Object* window, void*)
{
    evas_object_smart_callback_del_full(window, "focus,in", _windowFocusedCb, data);
    auto* self = static_cast<MwRenamePopupController*>(data);
    self->_keepSelected();
}

// The entry itself gets the keyboard some time after its window, and then drops its selection. Whoever types before
// that has begun a name already.
void MwRenamePopupController::_keepSelected()
{
    WTimer::destroy(_selectJob);
    _selectJob = WTimer::addTimer(SELECT_INTERVAL, [this, rounds = 0](void*) mutable {
        if (_initialText != elm_entry_entry_get(_entry))
            return false;
        elm_entry_select_none(_entry); // selecting what counts as selected already would do nothing
        elm_entry_select_all(_entry);
        return ++rounds < SELECT_ROUNDS;
    });
}

void MwRenamePopupController::_entryMaxlengthReachedCb(void*, Evas_Object*, void*)
{
    const std::string format = mwTranslate("IDS_MUSIC_TPOP_CANT_ENTER_MORE_THAN_PD_CHARACTERS");
    notification_status_message_post(mwFormat(format.c_str(), MAX_LENGTH).c_str());
}

void MwRenamePopupController::_entryChangedCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRenamePopupController*>(data)->_renameButtonUpdate();
}

void MwRenamePopupController::_entryPreeditChangedCb(void* data, Evas_Object*, void*)
{
    static_cast<MwRenamePopupController*>(data)->_renameButtonUpdate();
}
