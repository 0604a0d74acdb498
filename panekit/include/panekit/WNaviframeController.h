#pragma once

#include <functional>

#include <panekit/WViewController.h>

namespace panekit {

class WContentViewController;

// The stack of screens. Main loop only.
class WNaviframeController : public WViewController {
public:
    const char* getClassName() const override;
    // Takes over the screen, creates its view and puts it on top. False (and the screen destroyed) when that fails.
    bool push(WContentViewController* screen);
    // Asked when the back key would pop the last screen: true lets it pop, false keeps it (the window is then
    // minimised).
    void setOnLastItemPop(std::function<bool()> handler);
    // The screen on top, null when there is none. Borrowed.
    [[nodiscard]] WContentViewController* getTop() const;
    // What popping the top screen means for the stack: asks the last-item handler when it is the last one.
    void pop(WContentViewController* screen);

protected:
    ~WNaviframeController() override = default;
    Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) override;

private:
    [[nodiscard]] bool _isBottom(const WContentViewController* screen) const;
    void _popBottom(WContentViewController* screen);
    std::function<bool()> _onLastItemPop;
};

}
