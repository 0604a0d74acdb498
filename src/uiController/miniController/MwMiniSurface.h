#pragma once

#include <minicontrol.h>

#include <initializer_list>
#include <string>
#include <vector>

#include "MwLog.h"

// What tells one surface from another.
struct MwMiniSurfaceLook {
    const char* window;
    minicontrol_viewer_e viewer;
    const char* file;
    const char* group;
    const char* infoPart;
    const char* timePart;
    const char* signalSource;
};

struct MwMiniButton {
    const char* part;
    const char* style;
    const char* icon;
    const char* color;
    const char* background; // null for none
    const char* backgroundColor;
    const char* accessibleName;
};

// A button's callback that calls an operation of its data.
template <auto Operation, typename Self>
void mwMiniClickedCb(void* data, Evas_Object*, void*)
{
    auto* self = static_cast<Self*>(data);
    if (!self) {
        MW_LOGE("self is nullptr");
        return;
    }
    (self->*Operation)();
}

// The window of a mini controller and what is in it. Owns the window. Main loop only.
class MwMiniSurface {
public:
    explicit MwMiniSurface(const MwMiniSurfaceLook& look)
        : _look(look)
    {
    }
    ~MwMiniSurface();
    MwMiniSurface(const MwMiniSurface&) = delete;
    MwMiniSurface& operator=(const MwMiniSurface&) = delete;

    // Has the toolkit load what such a surface is made of, so that the first one need not wait for it. The window is
    // any of the program's.
    static void preload(
        Evas_Object* window, const MwMiniSurfaceLook& look, std::initializer_list<const MwMiniButton*> buttons);

    // False when there is nothing to draw on (logged); everything else is without effect then. The second callback
    // comes with the data when somebody can see what has been drawn, or nobody any more.
    bool create(minicontrol_provider_event_cb callback, void (*seenChanged)(void* data), void* data);
    [[nodiscard]] Evas_Object* getWindow() const { return _window; }
    [[nodiscard]] Evas_Object* getLayout() const { return _layout; }
    [[nodiscard]] bool isSeen() const { return minicontrol_is_seen(_window); }
    // Design units, 720 to the width of a phone.
    void resize(int width, int height);
    static int scaled(int units);

    void signal(const char* name) const;
    // A line that slides when it is too long, while somebody sees it. Size: design units.
    void setInfo(const std::string& text, const char* colorCode, int size, bool centred);
    void setTime(const std::string& text) const;
    using Clicked = void (*)(void* data, Evas_Object* button, void* info);
    void addButton(const MwMiniButton& look, Clicked clicked, void* data);
    // One that removeButtons leaves where it is.
    void addFixedButton(const MwMiniButton& look, Clicked clicked, void* data);
    // The keyboard comes back to the part that it was on, once it has a button again.
    void removeButtons();
    void restoreFocus();

private:
    void _slide() const;

    const MwMiniSurfaceLook& _look;
    Evas_Object* _window = nullptr;
    Evas_Object* _layout = nullptr;
    Evas_Object* _label = nullptr; // the info text
    void (*_seenChanged)(void* data) = nullptr;
    void* _data = nullptr;
    std::vector<const char*> _parts; // that hold a button of the state
    std::string _focusedPart;
};
