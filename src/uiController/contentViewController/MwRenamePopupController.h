#pragma once

#include <functional>
#include <memory>
#include <string>

#include <panekit/WTimer.h>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// Asks for a name in a window of its own above the application: refuses what cannot be part of a file name, limits the
// length, and reports the outcome. Owned by whoever opened it, who closes it with destory() and then deletes it. It
// touches no file. Main loop only.
class MwRenamePopupController {
public:
    static constexpr int MAX_LENGTH = 50; // characters
    static constexpr int RESPONSE_CANCEL = 0, RESPONSE_RENAME = 1;
    // text: the entered name (UTF-8), null with a cancel.
    using ResponseCb = std::function<void(void* userData, const char* text, int response)>;

    explicit MwRenamePopupController(const char* initialName);
    ~MwRenamePopupController();
    MwRenamePopupController(const MwRenamePopupController&) = delete;
    MwRenamePopupController& operator=(const MwRenamePopupController&) = delete;

    bool create(Evas_Object* parentWindow, void* data);
    void setResponseCb(ResponseCb callback, void* userData);
    void destory();

    // The text up to the first character that no file name may have, which is then reported through found.
    static std::string withoutInvalidCharacters(const std::string& text, bool& found);

    // Borrowed, null while closed.
    [[nodiscard]] Evas_Object* getWindow() const { return _window; }
    [[nodiscard]] Evas_Object* getEntry() const { return _entry; }
    [[nodiscard]] Evas_Object* getRenameButton() const { return _renameButton; }
    [[nodiscard]] Evas_Object* getCancelButton() const { return _cancelButton; }

private:
    Evas_Object* _createWindowBaseLayout(Evas_Object* parentWindow);
    void _placeWindow(Evas_Object* parentWindow);
    Evas_Object* _createEntryLayout(Evas_Object* popup);
    void _installFilters();
    Evas_Object* _addButton(const char* part, const char* label, void (*callback)(void*, Evas_Object*, void*));
    void _renameButtonUpdate();
    [[nodiscard]] bool _entryStringCheck() const;
    [[nodiscard]] std::string _entryText() const;
    void _respond(const char* text, int response);

    void _keepSelected();
    static void _windowFocusedCb(void* data, Evas_Object* object, void* info);
    static void _windowDelCb(void* data, Eo* canvas, Evas_Object* window, void* info);
    static void _cancelButtonClicked(void* data, Evas_Object* object, void* info);
    static void _renameButtonClicked(void* data, Evas_Object* object, void* info);
    static void _entryMaxlengthReachedCb(void* data, Evas_Object* entry, void* info);
    static void _entryActivatedCb(void* data, Evas_Object* entry, void* info);
    static void _entryChangedCb(void* data, Evas_Object* entry, void* info);
    static void _entryPreeditChangedCb(void* data, Evas_Object* entry, void* info);
    static void _invalidCharacterFilter(void* data, Evas_Object* entry, char** text);

    Evas_Object* _window = nullptr;
    Evas_Object* _popup = nullptr;
    Evas_Object* _entry = nullptr;
    Evas_Object* _renameButton = nullptr;
    Evas_Object* _cancelButton = nullptr;
    std::string _initialText; // markup
    void* _userData = nullptr;
    ResponseCb _responseCb;
    panekit::WTimer::Weak _closedJob;
    panekit::WTimer::Weak _selectJob;
};
