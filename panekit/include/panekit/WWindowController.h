#pragma once

#include <memory>
#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {

class WNaviframeController;

// The application's window with its base view. The window itself is made by create(), which the application object
// calls when the controller is attached; a controller that is never attached has no window (programs without one use
// that). Main loop only.
class WWindowController {
public:
    // type: an Elm_Win_Type. Every value makes an ordinary window: the desktop would frame the other kinds alike.
    WWindowController(std::string name, int type);
    ~WWindowController();
    WWindowController(const WWindowController&) = delete;
    WWindowController& operator=(const WWindowController&) = delete;

    // What the window list of the desktop shows; the name when it is never set.
    void setTitle(const std::string& title);
    bool create();
    // Minimises the window: the way to the background on a desktop.
    void minimise();
    // The application's window, null when there is none.
    static WWindowController* getInstance();
    // Takes over the naviframe and builds it inside the window.
    bool attachBaseViewController(WNaviframeController* naviframe);
    [[nodiscard]] WNaviframeController* getBaseViewController() const { return _base; }
    [[nodiscard]] Evas_Object* getEvasObject() const { return _window; }
    void destroy();

private:
    struct Watch;
    void _watchVisibility();
    static void _closeCb(void* data, Evas_Object* object, void* info);
    std::string _name;
    std::string _title;
    Evas_Object* _window = nullptr;
    WNaviframeController* _base = nullptr;
    std::unique_ptr<Watch> _watch;
};

}
