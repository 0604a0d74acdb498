#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {

// The more menu: a short list of entries at the bottom of the window. Closes on a choice, the back or more key, and a
// tap outside. Create with new; deletes itself when it closes. Main loop only.
class WMenuPopupController {
public:
    WMenuPopupController();
    WMenuPopupController(const WMenuPopupController&) = delete;
    WMenuPopupController& operator=(const WMenuPopupController&) = delete;

    // label: a string identifier.
    void addItem(std::string label, std::function<void()> action);
    void setOnDestroyed(std::function<void()> handler);
    bool create(Evas_Object* window, Evas_Object* naviframe);
    void destroy();
    [[nodiscard]] Evas_Object* getEvasObject() const;
    // Labels in order and choosing by position, as a user would. For tests.
    [[nodiscard]] std::vector<std::string> labels() const;
    void choose(size_t position);

private:
    ~WMenuPopupController();
    friend class WContentViewController;
    void _setOnDetached(std::function<void()> handler);
    struct Impl;
    std::unique_ptr<Impl> _impl;
};

}
