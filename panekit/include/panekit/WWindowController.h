#pragma once

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
    // type: an Elm_Win_Type; values that would not be an ordinary window of the desktop make an ordinary one.
    WWindowController(std::string name, int type);
    ~WWindowController();
    WWindowController(const WWindowController&) = delete;
    WWindowController& operator=(const WWindowController&) = delete;

    bool create();
    // Takes over the naviframe and builds it inside the window.
    bool attachBaseViewController(WNaviframeController* naviframe);
    [[nodiscard]] WNaviframeController* getBaseViewController() const { return _base; }
    [[nodiscard]] Evas_Object* getEvasObject() const { return _window; }
    void destroy();

private:
    struct Watch;
    std::string _name;
    int _type;
    Evas_Object* _window = nullptr;
    WNaviframeController* _base = nullptr;
    Watch* _watch = nullptr;
};

}
