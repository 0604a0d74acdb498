#pragma once

#include <functional>
#include <memory>
#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwAppController;
class MwModel;
class MwPlayViewController;
class MwTrimViewController;
struct MwRecordingsMode;

// What is docked below the list of recordings: the player of what is loaded, the trim panel or the record button, and
// nothing while rows are selected. Layout, model and controller are borrowed. Main loop only.
class MwRecordingsDock {
public:
    struct Screen {
        std::function<void()> recordingStarted;
        std::function<void()> bookmarkAdded;
        std::function<void()> fileChanged;
        // After the panel's own callback, for a redraw may delete the panel. Not once this object has gone.
        std::function<void()> trimRequested;
        std::function<void(bool saved)> trimEnded;
    };

    MwRecordingsDock(Evas_Object* layout, MwModel* model, MwAppController* appController, Screen screen);

    void update(const MwRecordingsMode& mode);
    void createRecordController();
    // Takes down whatever is there.
    void clear();
    // The layout goes, and what is docked with it.
    void forget();

    [[nodiscard]] bool isEmpty() const;
    [[nodiscard]] bool hasPanel() const { return _playView || _trimView; }
    // The player's keys.
    bool takeKey(const std::string& key);
    // While the trim panel is docked, leaving it is its own business.
    bool takeBack();

private:
    void _createPlayViewController();
    void _createTrimViewController();
    void _announcePlayViewClosed();
    void _playViewEvent(int event);
    void _trimViewEvent(int event);
    void _later(const std::function<void()>& call);
    void _clickRecordButton();

    Evas_Object* _layout;
    MwModel* _model;
    MwAppController* _appController;
    Screen _screen;
    MwPlayViewController* _playView = nullptr; // at most one of these two; deletes itself with its view
    MwTrimViewController* _trimView = nullptr;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
