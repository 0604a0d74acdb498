#pragma once

#include <functional>
#include <memory>
#include <string>

#include <Evas.h>

#include <panekit/WTimer.h>

#include "MwTrim.h"

class MwAppController;
class MwModel;

namespace panekit {
class WPopupController;
}

// Saving from the trim panel: the question how, the look at the free space, the popup that waits, and the engine's
// outcome. Belongs to the panel; model and controller are borrowed. Main loop only.
class MwTrimSaving {
public:
    struct Request {
        std::string path;
        unsigned int begin; // milliseconds
        unsigned int end;
        unsigned int duration;
    };
    // Whether it was saved; the panel may go in it.
    using Done = std::function<void(bool saved)>;

    MwTrimSaving(Evas_Object* panel, MwModel* model, MwAppController* appController, Done done);
    // Cancels what runs and waits for its end.
    ~MwTrimSaving();
    MwTrimSaving(const MwTrimSaving&) = delete;
    MwTrimSaving& operator=(const MwTrimSaving&) = delete;

    void ask(Request request);
    [[nodiscard]] bool isUnderWay() const { return _savePopup || _loadingPopup; }

private:
    void _createSavePopup();
    // Up and Down mark a choice, Return takes it.
    bool _takeListKey(const std::string& key);
    void _mark(int index);
    void _choose(int index);
    void _startTrim(bool asNewFile);
    [[nodiscard]] bool _hasRoom(int storage) const;
    void _createLoadingPopupController(const char* text);
    void _runTrim(bool asNewFile);
    void _showProgress();
    void _backPressed();
    void _ended(MwTrim::eventType type);
    void _closePopups();
    static void _listKeyCb(void* data, Evas* canvas, Evas_Object* list, void* info);
    static const char* _messageOf(MwTrim::Failure failure);

    Evas_Object* _panel;
    MwModel* _model;
    MwAppController* _appController;
    Done _done;
    Request _request{};
    panekit::WPopupController* _savePopup = nullptr; // these delete themselves
    panekit::WPopupController* _loadingPopup = nullptr;
    Evas_Object* _choices = nullptr; // of the save popup
    int _marked = -1;
    Evas_Object* _loadingLayout = nullptr;
    panekit::WTimer::Weak _startTimer;
    panekit::WTimer::Weak _progressTimer;
    std::unique_ptr<MwTrim> _trim;
};
