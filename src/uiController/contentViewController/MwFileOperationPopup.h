#pragma once

#include <functional>
#include <string>

#include "MwFileOperator.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {
class WPopupController;
}

// The one popup that a file operation has on the screen: deleting, moving, or a question about a taken name. Showing
// another one closes the one before. Owned by the screen; its callbacks may close it or delete this object. Main loop
// only.
class MwFileOperationPopup {
public:
    using Callback = std::function<void()>;
    struct ClashCallbacks {
        std::function<void(MwClashAction action)> onAnswer;
        std::function<void(bool on)> onApplyToAll;
    };

    explicit MwFileOperationPopup(Evas_Object* window);
    ~MwFileOperationPopup();
    MwFileOperationPopup(const MwFileOperationPopup&) = delete;
    MwFileOperationPopup& operator=(const MwFileOperationPopup&) = delete;

    void showDeleting(Callback onBack);
    void showMoving(const MwFileOperator::Progress& progress, Callback onCancel);
    void showClash(const std::string& fileName, ClashCallbacks callbacks);
    void close();

    // Of the moving popup.
    void update(const MwFileOperator::Progress& progress);
    // Calls back once the full bar has been seen for a moment; at once when there is none.
    void complete(Callback onSeen);
    // Of the question: writes its text again, for another language.
    void setClashName(const std::string& fileName);

private:
    void _show(panekit::WPopupController* popup, const char* name);
    Evas_Object* _createDeletingContent(Evas_Object* parent);
    Evas_Object* _createMovingContent(Evas_Object* parent);
    Evas_Object* _createClashContent(Evas_Object* parent, const std::string& fileName);
    static void _applyToAllChangedCb(void* data, Evas_Object* check, void* info);
    static void _barSeenCb(void* data, Evas_Object* layout, const char* signal, const char* source);

    Evas_Object* _window; // borrowed
    panekit::WPopupController* _popup = nullptr; // deletes itself
    Evas_Object* _movingLayout = nullptr; // these belong to the popup
    Evas_Object* _progressBar = nullptr;
    Evas_Object* _clashLayout = nullptr;
    std::function<void(bool on)> _onApplyToAll;
    Callback _onSeen;
};
