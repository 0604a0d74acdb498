#include "PanelScreen.h"

#include <Elementary.h>

#include <filesystem>

#include <media_content.h>
#include <panekit/WContentViewController.h>

#include "MwContentViewController.h"
#include "MwResourceMgr.h"
#include "fakes/Fakes.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/Screen.h"

namespace ui {

namespace {

    // What lies below every screen.
    class EmptyScreen : public MwContentViewController {
    public:
        using MwContentViewController::MwContentViewController;

    protected:
        Evas_Object* onCreateView(Evas_Object* parent, void*) override
        {
            Evas_Object* layout = elm_layout_add(parent);
            elm_layout_theme_set(layout, "layout", "application", "default");
            return layout;
        }
    };

}

PanelScreen::PanelScreen(int width, int height)
    : ScreenWindow(width, height)
{
    ::setenv("MEWLO_MEDIA_DB", _directory.file("media.db").c_str(), 1);
    std::filesystem::remove_all(support::deviceRoot() + "/Sounds");
    media_content_connect();
    naviframe->push(new EmptyScreen(&model, controller()));
}

PanelScreen::~PanelScreen()
{
    close();
    media_content_disconnect();
    ::unsetenv("MEWLO_MEDIA_DB");
}

std::string PanelScreen::addRecording(const std::string& file, int duration, const std::string& content)
{
    const std::string path = support::recordingPath(file);
    support::writeFile(path, content);
    support::enterRows({{path, duration, static_cast<long long>(model.getRecordedFileList().size())}});
    model.createRecordedFileList();
    return path;
}

void PanelScreen::load(const std::string& file, MwPlayer::PlayState state, unsigned int position)
{
    model.setCurrentPlayPath(support::recordingPath(file));
    model.setPlayerState(state);
    model.setCurrentPlayPosition(position);
    announce();
}

void PanelScreen::announce() { controller()->getPlayerUpdatedSignal().emit(); }

std::vector<MwSavedBookmark> PanelScreen::bookmarksOf(const std::string& mediaId)
{
    return mwReadBookmarks(mediaId, [](const char*, int) {});
}

const std::string& PanelScreen::sound()
{
    static const std::string content = [] {
        const support::TempDir directory;
        const std::string file = directory.file("a.m4a");
        const std::string command
            = "ffmpeg -v error -f lavfi -i anoisesrc=d=10:r=44100 -af volume=t/10:eval=frame -ac 1 "
              "-c:a aac "
            + file;
        return std::system(command.c_str()) == 0 ? support::readFile(file) : std::string();
    }();
    return content;
}

Evas_Object* PanelScreen::_host()
{
    std::string path;
    MwResourceMgr::getInstance()->getEdjPath("edje/MwBookmarksContentView.edj", path);
    Evas_Object* host = elm_layout_add(window);
    elm_layout_file_set(host, path.c_str(), "bookmarks_content_view");
    evas_object_size_hint_weight_set(host, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_win_resize_object_add(window, host);
    evas_object_show(host);
    return host;
}

void PanelScreen::dockTrim()
{
    trimPanel = new MwTrimViewController(&model, controller());
    trimPanel->getEventSignal().addListener([this](auto event) { trimEvents.push_back(event); });
    trimPanel->dock(_host());
    panelView = trimPanel->getEvasObject();
    support::settle(window);
    support::runFor(0.05);
}

void PanelScreen::dock(MwPlayViewController::ViewType type)
{
    Evas_Object* host = _host();
    panel = new MwPlayViewController(&model, controller());
    panel->dock(host, type);
    panelView = panel->getEvasObject();
    panel->getEventSignal().addListener([this](auto event) { events.push_back(event); });
    support::settle(window);
}

std::string PanelScreen::text(const char* part) const { return support::text(panelView, part); }

Evas_Object* PanelScreen::content(const char* part) const { return elm_object_part_content_get(panelView, part); }

double PanelScreen::sliderValue() const { return elm_slider_value_get(content("slider")); }

void PanelScreen::press(const char* part)
{
    support::settle(window);
    if (Evas_Object* found = content(part); found)
        support::click(found);
}

std::vector<MwAppController::Command> PanelScreen::takeCommands()
{
    return std::exchange(fakes::controller.commands, {});
}

Evas_Object* PanelScreen::push(panekit::WContentViewController* screen)
{
    naviframe->push(screen);
    support::runFor(0.1);
    support::settle(window);
    return screen->getEvasObject();
}

bool PanelScreen::_play(const std::string& path)
{
    model.setCurrentPlayPath(path);
    model.setCurrentPlayPosition(0);
    model.setPlayerState(PLAY_STATE_PLAYING);
    announce();
    return true;
}

bool PanelScreen::execute(MwAppController::Command command)
{
    if (command == failing)
        return false;
    switch (command) {
    case MwAppController::START_PLAYING:
    case MwAppController::RESUME_PLAYING:
        model.setPlayerState(PLAY_STATE_PLAYING);
        announce();
        return true;
    case MwAppController::PAUSE_PLAYING:
        model.setPlayerState(PLAY_STATE_PAUSED);
        announce();
        return true;
    case MwAppController::PLAY_PREVIOUS:
        return _play(*model.getPreviousPlayPath());
    case MwAppController::PLAY_NEXT:
        return _play(*model.getNextPlayPath());
    case MwAppController::SET_PLAYER_POSITION:
        soughtTo.push_back(model.getCurrentPlayPosition());
        return true;
    default:
        return true;
    }
}

}
