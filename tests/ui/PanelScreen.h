#pragma once

#include <vector>

#include "MwPlayViewController.h"
#include "MwPlayer.h"
#include "MwSavedBookmarks.h"
#include "MwTrimViewController.h"
#include "ScreenWindow.h"
#include "support/TempDir.h"

namespace ui {

// A window for the player panel and the screens beside it, over a media database of its own. The controller plays
// nothing: it moves the model's state and position as the real one does.
class PanelScreen : public ScreenWindow {
public:
    explicit PanelScreen(int width = 360, int height = 640);
    ~PanelScreen() override;

    MwPlayViewController* panel = nullptr; // one of the two
    MwTrimViewController* trimPanel = nullptr;
    Evas_Object* panelView = nullptr;
    std::vector<MwPlayViewController::eventType> events; // of the panel
    std::vector<MwTrimViewController::eventType> trimEvents;
    std::vector<unsigned int> soughtTo; // milliseconds
    MwAppController::Command failing = MwAppController::START_RECORDING; // which command fails; none of playback

    // A file with its row and its duration (milliseconds); answers the media id. Later ones come first in the list.
    std::string addRecording(const std::string& file, int duration, const std::string& content = "x");
    // Makes a recording the loaded one and announces it.
    void load(const std::string& file, MwPlayer::PlayState state, unsigned int position = 0);
    void announce();
    // A sound file of some seconds, as a content: noise that grows.
    static const std::string& sound();
    static std::vector<MwSavedBookmark> bookmarksOf(const std::string& mediaId);

    // The panel alone at the lower edge of the window.
    void dock(MwPlayViewController::ViewType type = MwPlayViewController::QUIET);
    void dockTrim();
    [[nodiscard]] std::string text(const char* part) const;
    // What is in a part of the panel, null for none.
    [[nodiscard]] Evas_Object* content(const char* part) const;
    [[nodiscard]] double sliderValue() const;
    void press(const char* part);
    // The last commands, forgotten afterwards.
    std::vector<MwAppController::Command> takeCommands();

    // Puts a screen on top and waits until it is drawn; answers its view.
    Evas_Object* push(panekit::WContentViewController* screen);

protected:
    bool execute(MwAppController::Command command) override;

private:
    Evas_Object* _host();
    bool _play(const std::string& path);

    support::TempDir _directory;
};

}
