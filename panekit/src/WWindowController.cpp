#include <panekit/WWindowController.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <utility>

#include <Ecore_X.h>
#include <Elementary.h>

#include <app.h>
#include <dlog.h>
#include <eext_event.h>
#include <panekit/WNaviframeController.h>

namespace panekit {

namespace {

    // The screens are designed on 720 x 1280 units; on a fresh desktop one unit is half a pixel.
    constexpr int DESIGN_WIDTH = 720;
    constexpr int DESIGN_HEIGHT = 1280;
    constexpr double DESKTOP_SCALE = 1.3;
    constexpr double FRAME_TIME = 1.0 / 60; // seconds
    constexpr double HIDDEN_FRAME_TIME = 0.1; // of all windows of the program

    WWindowController* instance = nullptr;

    int scaled(int units) { return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get()); }

    // A file of the application's resources, empty when it has none of that name.
    std::string resource(const char* name)
    {
        const std::unique_ptr<char, decltype(&std::free)> resources(app_get_resource_path(), &std::free);
        const std::string path = std::string(resources ? resources.get() : "") + name;
        return std::filesystem::exists(path) ? path : "";
    }

    // The look that replaces the toolkit's own.
    void applyTheme()
    {
        if (const std::string theme = resource("edje/MwTheme.edj"); !theme.empty())
            elm_theme_overlay_add(nullptr, theme.c_str());
    }

    // For task bars and window switchers.
    void applyIcon(Evas_Object* window)
    {
        const std::string file = resource("icon.png");
        if (file.empty())
            return;
        Evas_Object* icon = evas_object_image_add(evas_object_evas_get(window));
        evas_object_image_file_set(icon, file.c_str(), nullptr);
        elm_win_icon_object_set(window, icon);
    }

    // Never larger than the screen, with some room for title bar and panel: at twice the scale the design would not fit
    // on many. False where the screen is not known yet: a Wayland compositor tells it after the first words.
    bool applySize(Evas_Object* window)
    {
        int width = scaled(DESIGN_WIDTH);
        int height = scaled(DESIGN_HEIGHT);
        int screenWidth = 0;
        int screenHeight = 0;
        elm_win_screen_size_get(window, nullptr, nullptr, &screenWidth, &screenHeight);
        const bool isKnown = screenWidth > 0 && screenHeight > 0;
        if (isKnown) {
            width = std::min(width, screenWidth);
            height = std::min(height, screenHeight * 9 / 10);
        }
        evas_object_resize(window, width, height);
        return isKnown;
    }

    // A line for whoever measures the start; then what nobody waits for.
    void firstFrameCb(void* window, Evas* canvas, void*)
    {
        evas_event_callback_del(canvas, EVAS_CALLBACK_RENDER_POST, firstFrameCb);
        __dlog_print(LOG_ID_MAIN, DLOG_INFO, "PANEKIT", "first frame");
        applyIcon(static_cast<Evas_Object*>(window));
    }

    void firstFrameOfUnknownScreenCb(void* data, Evas* canvas, void*)
    {
        evas_event_callback_del(canvas, EVAS_CALLBACK_RENDER_POST, firstFrameOfUnknownScreenCb);
        auto* window = static_cast<Evas_Object*>(data);
        if (!elm_win_maximized_get(window) && !elm_win_fullscreen_get(window))
            applySize(window);
    }

    void applyDesktopScale()
    {
        if (!std::getenv("ELM_SCALE"))
            elm_config_scale_set(DESKTOP_SCALE);
        elm_config_scroll_thumbscroll_enabled_set(EINA_TRUE);
    }

}

// Follows the window manager's word on whether the window is minimised.
struct WWindowController::Watch {
    explicit Watch(Evas_Object* watched)
        : object(watched)
        , window(elm_win_xwindow_get(watched))
        , handler(ecore_event_handler_add(ECORE_X_EVENT_WINDOW_PROPERTY, propertyCb, this))
    {
    }
    ~Watch() { ecore_event_handler_del(handler); }
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

    static Eina_Bool propertyCb(void* data, int, void* event)
    {
        auto* self = static_cast<Watch*>(data);
        const auto* property = static_cast<Ecore_X_Event_Window_Property*>(event);
        if (property->win == self->window && property->atom == ECORE_X_ATOM_NET_WM_STATE)
            self->apply(self->isHidden());
        return ECORE_CALLBACK_PASS_ON;
    }
    // The toolkit does not draw a minimised window, yet it wakes for every frame for as long as there is something to
    // draw; what was to be drawn when it went away is never struck off.
    void apply(bool hidden)
    {
        if (std::exchange(isUndrawn, hidden) != hidden) {
            hidden ? elm_win_norender_push(object) : elm_win_norender_pop(object);
            ecore_animator_frametime_set(hidden ? HIDDEN_FRAME_TIME : FRAME_TIME);
        }
        ui_app_set_window_visible(!hidden);
    }
    [[nodiscard]] bool isHidden() const
    {
        unsigned int count = 0;
        Ecore_X_Window_State* states = nullptr;
        ecore_x_netwm_window_state_get(window, &states, &count);
        const bool hidden = states && std::find(states, states + count, ECORE_X_WINDOW_STATE_HIDDEN) != states + count;
        std::free(states);
        return hidden;
    }

    Evas_Object* object;
    bool isUndrawn = false;
    Ecore_X_Window window;
    Ecore_Event_Handler* handler;
};

WWindowController::WWindowController(std::string name, int)
    : _name(std::move(name))
{
}

WWindowController::~WWindowController() { destroy(); }

WWindowController* WWindowController::getInstance() { return instance; }

void WWindowController::setTitle(const std::string& title)
{
    _title = title;
    if (_window)
        elm_win_title_set(_window, _title.c_str());
}

bool WWindowController::create()
{
    if (_window)
        return true;
    applyDesktopScale();
    applyTheme();
    _window = elm_win_util_standard_add(_name.c_str(), (_title.empty() ? _name : _title).c_str());
    if (!_window)
        return false;
    instance = this;
    elm_win_icon_name_set(_window, _name.c_str());
    evas_object_smart_callback_add(_window, "delete,request", _closeCb, this);
    eext_window_arm(_window);
    const bool isSized = applySize(_window);
    _watchVisibility();
    ui_app_set_window(_window);
    Evas* canvas = evas_object_evas_get(_window);
    evas_event_callback_add(canvas, EVAS_CALLBACK_RENDER_POST, firstFrameCb, _window);
    if (!isSized)
        evas_event_callback_add(canvas, EVAS_CALLBACK_RENDER_POST, firstFrameOfUnknownScreenCb, _window);
    evas_object_show(_window);
    return true;
}

void WWindowController::_watchVisibility()
{
    if (elm_win_xwindow_get(_window) != 0)
        _watch = std::make_unique<Watch>(_window);
}

bool WWindowController::attachBaseViewController(WNaviframeController* naviframe)
{
    if (!naviframe)
        return false;
    if (!_window || _base || !naviframe->create(_window)) {
        naviframe->destroy();
        return false;
    }
    _base = naviframe;
    elm_win_resize_object_add(_window, _base->getEvasObject());
    return true;
}

void WWindowController::minimise()
{
    if (_window)
        elm_win_iconified_set(_window, EINA_TRUE);
}

void WWindowController::destroy()
{
    if (!_window)
        return;
    _watch.reset();
    ui_app_set_window(nullptr);
    if (instance == this)
        instance = nullptr;
    _base = nullptr;
    evas_object_del(std::exchange(_window, nullptr));
}

void WWindowController::_closeCb(void*, Evas_Object*, void*) { ui_app_close(); }

}
