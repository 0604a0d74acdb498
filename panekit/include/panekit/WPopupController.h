#pragma once

#include <functional>
#include <memory>
#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {

// A modal popup of a window: title, text or a content of its own, up to three buttons, the back key. Create with new;
// destroy() closes it and deletes the object, whoever calls it. Main loop only.
class WPopupController {
public:
    using Handler = std::function<void(WPopupController* popup)>;
    using ContentBuilder = std::function<Evas_Object*(Evas_Object* popup)>;

    enum class Text { Plain, Translatable };

    WPopupController();
    WPopupController(const WPopupController&) = delete;
    WPopupController& operator=(const WPopupController&) = delete;

    // To be called before create. Translatable texts are string identifiers that follow the language.
    void setTitle(std::string title, Text kind = Text::Translatable);
    void setContent(std::string text, Text kind = Text::Translatable);
    void setContent(ContentBuilder builder);
    void setStyle(std::string style);
    void addButton(std::string label, Handler handler, Text kind = Text::Translatable);
    // Without a handler the back key closes the popup.
    void setOnBack(Handler handler);
    // Called once while the popup goes away, however that happened; the object is deleted afterwards.
    void setOnDestroyed(std::function<void()> handler);

    bool create(Evas_Object* window);
    void destroy();
    [[nodiscard]] Evas_Object* getEvasObject() const;
    // Presses a button by its position, as a user would. For tests.
    void press(size_t button);

    // The popup opened last of those that are open, null when there is none. For tests.
    static WPopupController* topmost();

protected:
    virtual ~WPopupController();

private:
    friend class WContentViewController;
    void _setOnDetached(std::function<void()> handler);
    struct Impl;
    std::unique_ptr<Impl> _impl;
};

}
