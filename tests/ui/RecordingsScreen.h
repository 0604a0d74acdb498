#pragma once

#include <string>
#include <vector>

#include "ScreenWindow.h"

namespace ui {

// The recordings list above another screen, in a window of its own, over the real model and media database and a
// controller that plays nothing. Recordings are put into the database before it opens.
class RecordingsScreen : public ScreenWindow {
public:
    enum class Mode { Normal, Request };

    explicit RecordingsScreen(Mode mode = Mode::Normal, int width = 360, int height = 640);
    ~RecordingsScreen() override;

    Evas_Object* view = nullptr; // null once the screen has been left

    void open();
    using ScreenWindow::close;
    // Announces what the system manager would.
    void announce(MwSignalMgr::SystemInfo info);
    void playerChanged();

    [[nodiscard]] Evas_Object* list() const;
    [[nodiscard]] std::vector<std::string> names() const; // of all rows, as written
    [[nodiscard]] Evas_Object* row(const std::string& name) const; // null when there is none
    [[nodiscard]] std::string text(const std::string& name, const char* part) const;
    // The check or radio of a row on screen, null for none.
    [[nodiscard]] Evas_Object* choice(const std::string& name) const;
    [[nodiscard]] std::string topRow() const;
    void tap(const std::string& name);

    [[nodiscard]] std::string title() const;
    [[nodiscard]] Evas_Object* titleButton(const char* part) const;
    void pressTitle(const char* part);
    [[nodiscard]] bool hasRecordButton() const;
    [[nodiscard]] bool hasPlayer() const;
    void back();
    void key(const char* name);
    // Opens the menu; answers its entries, empty when none opened.
    std::vector<std::string> menu();
    void chooseMenu(const std::string& entry);

protected:
    bool execute(MwAppController::Command command) override;

private:
    [[nodiscard]] Evas_Object* _item() const;
};

// Enters recordings of one minute each, the first is the newest; answers the first's path.
std::string enterRecordings(const std::vector<std::string>& files);
std::string recordingPath(const std::string& file);
// An empty database without a single recording or file.
void forgetRecordings();

}
