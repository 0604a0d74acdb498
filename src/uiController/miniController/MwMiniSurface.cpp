#include "MwMiniSurface.h"

#include <Elementary.h>
#include <app.h>
#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include <utility>

#include "MwDisplayText.h"
#include "MwLog.h"
#include "MwPartImage.h"
#include "MwResourceMgr.h"
#include "MwText.h"

namespace {

// Null when it cannot be drawn (logged).
Evas_Object* addLayout(Evas_Object* parent, const MwMiniSurfaceLook& look)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(look.file, path)) {
        MW_LOGE("getEdjPath fail");
        return nullptr;
    }
    Evas_Object* layout = elm_layout_add(parent);
    if (layout && elm_layout_file_set(layout, path.c_str(), look.group) != EINA_FALSE)
        return layout;
    MW_LOGE("elm_layout_add fail");
    evas_object_del(layout);
    return nullptr;
}

Evas_Object* makeButton(Evas_Object* parent, const MwMiniButton& look)
{
    Evas_Object* button = uxt_button_add_with_style(parent, look.style);
    if (look.icon)
        mwSetPartImage(button, "elm.icon.normal", look.icon, look.color);
    if (look.background)
        mwSetPartImage(button, "elm.icon.bg", look.background, look.backgroundColor);
    return button;
}

// The label asks for all of its text's width; a grid gives it what there is.
Evas_Object* addLabel(Evas_Object* layout, const char* part)
{
    Evas_Object* grid = elm_grid_add(layout);
    Evas_Object* label = elm_label_add(grid);
    elm_object_style_set(label, "slide_roll");
    elm_grid_size_set(grid, 1, 1);
    elm_grid_pack(grid, label, 0, 0, 1, 1);
    evas_object_show(label);
    elm_object_part_content_set(layout, part, grid);
    evas_object_show(grid);
    return label;
}

}

void MwMiniSurface::preload(
    Evas_Object* window, const MwMiniSurfaceLook& look, std::initializer_list<const MwMiniButton*> buttons)
{
    Evas_Object* layout = addLayout(window, look);
    if (!layout)
        return;
    addLabel(layout, look.infoPart);
    for (const MwMiniButton* button : buttons)
        evas_object_del(makeButton(layout, *button));
    evas_object_del(layout);
}

MwMiniSurface::~MwMiniSurface()
{
    // The window is hidden as it goes; whoever was to be told of that is going, too.
    _seenChanged = nullptr;
    _label = nullptr;
    if (_window)
        evas_object_del(std::exchange(_window, nullptr));
}

bool MwMiniSurface::create(minicontrol_provider_event_cb callback, void (*seenChanged)(void* data), void* data)
{
    _window = minicontrol_create_window(_look.window, _look.viewer, callback);
    if (!_window) {
        MW_LOGE("_win is nullptr");
        return false;
    }
    elm_win_title_set(_window, mwTranslate("IDS_MW_APP_NAME").c_str());
    elm_win_alpha_set(_window, EINA_TRUE);
    _layout = addLayout(_window, _look);
    if (!_layout)
        return false;
    evas_object_name_set(_layout, _look.group);
    evas_object_size_hint_weight_set(_layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_show(_layout);
    elm_win_resize_object_add(_window, _layout);
    _seenChanged = seenChanged;
    _data = data;
    evas_object_smart_callback_add(
        _window, MINICONTROL_SEEN_CHANGED,
        [](void* surface, Evas_Object*, void*) {
            const auto* self = static_cast<MwMiniSurface*>(surface);
            self->_slide();
            if (self->_seenChanged && !self->_parts.empty()) // otherwise it is drawn next, seen or not
                self->_seenChanged(self->_data);
        },
        this);
    return true;
}

int MwMiniSurface::scaled(int units)
{
    return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get());
}

void MwMiniSurface::resize(int width, int height)
{
    if (_window)
        evas_object_resize(_window, width, height);
}

void MwMiniSurface::signal(const char* name) const
{
    if (_layout)
        elm_layout_signal_emit(_layout, name, _look.signalSource);
}

void MwMiniSurface::setInfo(const std::string& text, const char* colorCode, int size, bool centred)
{
    if (!_layout)
        return;
    int red = 0;
    int green = 0;
    int blue = 0;
    int alpha = 0;
    uxt_theme_get_color(colorCode, &red, &green, &blue, &alpha);
    const std::string line = mwDisplayMarkup(text);
    const char* format = centred ? "<font_size=%d><color=#%02x%02x%02x%02x><align=center>%s</align></color></font_size>"
                                 : "<font_size=%d><color=#%02x%02x%02x%02x>%s</color></font_size>";
    if (!_label)
        _label = addLabel(_layout, _look.infoPart);
    elm_object_text_set(_label, mwFormat(format, size, red, green, blue, alpha, line.c_str()).c_str());
    _slide();
}

void MwMiniSurface::_slide() const
{
    if (!_label)
        return;
    elm_label_slide_mode_set(_label, isSeen() ? ELM_LABEL_SLIDE_MODE_AUTO : ELM_LABEL_SLIDE_MODE_NONE);
    elm_label_slide_go(_label);
}

void MwMiniSurface::setTime(const std::string& text) const
{
    if (_layout)
        elm_object_part_text_set(_layout, _look.timePart, text.c_str());
}

void MwMiniSurface::addButton(const MwMiniButton& look, Clicked clicked, void* data)
{
    addFixedButton(look, clicked, data);
    if (_layout)
        _parts.push_back(look.part);
}

void MwMiniSurface::addFixedButton(const MwMiniButton& look, Clicked clicked, void* data)
{
    if (!_layout)
        return;
    Evas_Object* button = makeButton(_layout, look);
    panekit::setAccessibleName(button, look.accessibleName);
    // A click may take the window away, and the button with it.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_smart_callback_add(button, "clicked", clicked, data);
    elm_object_part_content_set(_layout, look.part, button);
    evas_object_show(button);
}

void MwMiniSurface::removeButtons()
{
    for (const char* part : std::exchange(_parts, {})) {
        Evas_Object* button = elm_object_part_content_unset(_layout, part);
        if (elm_object_focus_get(button) != EINA_FALSE)
            _focusedPart = part;
        evas_object_del(button);
    }
}

void MwMiniSurface::restoreFocus()
{
    const std::string part = std::exchange(_focusedPart, {});
    if (part.empty() || _parts.empty() || !isSeen())
        return;
    Evas_Object* button = elm_object_part_content_get(_layout, part.c_str());
    elm_object_focus_set(button ? button : elm_object_part_content_get(_layout, _parts.front()), EINA_TRUE);
}
