// Writes a picture of every state of the screens: mewlo-screenshots <directory>. ELM_SCALE chooses the scale.
#include <Elementary.h>
#include <cstdio>
#include <string>

#include <panekit/WMenuPopupController.h>
#include <panekit/WPopupController.h>
#include <panekit/WTimer.h>
#include <storage.h>
#include <vconf.h>

#include "ListShots.h"
#include "MiniShots.h"
#include "MwRenamePopupController.h"
#include "MwSignalMgr.h"
#include "PanelShots.h"
#include "Picture.h"
#include "RecorderScreen.h"
#include "UiEnvironment.h"
#include "fakes/Fakes.h"
#include "support/RunUntil.h"
#include "support/Screen.h"

namespace {

struct Shot {
    const char* name;
    std::function<void(ui::RecorderScreen&)> arrange;
    bool requestMode = false;
    int format = MwModel::FORMAT_MP4;
};

void record(ui::RecorderScreen& screen, unsigned int seconds)
{
    screen.enter(REC_STATE_RECORDING);
    screen.model.setElapsedTime(seconds * 1000ULL);
    screen.model.setLevel(-12.0);
}

const std::vector<Shot>& shots()
{
    static const std::vector<Shot> all = {
        {"ready", [](auto&) {}},
        {"ready-named",
            [](auto& screen) {
                screen.model.setRenameString("A conversation about everything and nothing in the old harbour");
                screen.enter(REC_STATE_READY);
            }},
        {"recording",
            [](auto& screen) {
                record(screen, 83);
                support::runFor(1.5);
            }},
        {"recording-hours", [](auto& screen) { record(screen, 3 * 3600 + 754); }},
        {"paused",
            [](auto& screen) {
                record(screen, 83);
                screen.enter(REC_STATE_PAUSED);
            }},
        {"bookmark",
            [](auto& screen) {
                record(screen, 65);
                support::runFor(0.3);
                screen.press("bookmark_button");
                support::runFor(0.3);
            }},
        {"call-rejection",
            [](auto& screen) {
                record(screen, 5);
                screen.more();
                support::settle(screen.window);
                if (auto* menu = screen.naviframe->getTop(); menu)
                    support::key(screen.window, "Return");
                support::runFor(0.3);
            }},
        {"menu",
            [](auto& screen) {
                screen.more();
                support::runFor(0.6);
            }},
        {"save-to",
            [](auto& screen) {
                vconf_set_int("memory/sysman/mmc", 1);
                screen.more();
                support::runFor(0.3);
                support::key(screen.window, "Tab");
                support::key(screen.window, "Return");
                support::runFor(0.6);
            }},
        {"discard",
            [](auto& screen) {
                record(screen, 83);
                screen.back();
                support::runFor(0.6);
            }},
        {"count-down", [](auto& screen) { record(screen, 5); }, true, MwModel::FORMAT_AMR},
    };
    return all;
}

void take(const std::string& directory, const Shot& shot, const std::string& suffix, int width, int height)
{
    ui::RecorderScreen screen(
        shot.requestMode, shot.requestMode ? 100 : MwModel::NO_SIZE_LIMIT, shot.format, width, height);
    shot.arrange(screen);
    ui::savePicture(screen.window, directory + "/" + shot.name + suffix + ".png");
    vconf_set_int("memory/sysman/mmc", 0);
}

// The rename popup has a window of its own.
void takeRename(const std::string& directory, const std::string& suffix)
{
    ui::RecorderScreen screen;
    MwRenamePopupController popup("Voice 001");
    popup.create(screen.window, nullptr);
    support::runFor(0.3);
    ui::savePicture(popup.getWindow(), directory + "/rename" + suffix + ".png");
}

}

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fprintf(stderr, "usage: mewlo-screenshots <directory> [name]\n");
        return 2;
    }
    const std::string directory = argv[1];
    const ui::Environment environment(argc, argv);
    const int width = static_cast<int>(720 * elm_config_scale_get() / 2.6);
    const int height = static_cast<int>(1280 * elm_config_scale_get() / 2.6);
    for (const bool dark : {false, true}) {
        ui::useTheme(dark);
        for (const Shot& shot : shots()) {
            if (argc > 2 && std::string(argv[2]) != shot.name)
                continue;
            take(directory, shot, dark ? "-dark" : "-light", width, height);
        }
        ui::takeListShots(directory, dark ? "-dark" : "-light", argc > 2 ? argv[2] : "", width, height);
        ui::takePanelShots(directory, dark ? "-dark" : "-light", argc > 2 ? argv[2] : "", width, height);
        ui::takeMiniShots(directory, dark ? "-dark" : "-light", argc > 2 ? argv[2] : "");
        takeRename(directory, dark ? "-dark" : "-light");
        if (argc > 2 && std::string(argv[2]) != "wide")
            continue;
        take(directory, shots()[2], dark ? "-wide-dark" : "-wide-light", width * 3, height);
        ui::takeListShots(directory, dark ? "-wide-dark" : "-wide-light", "list-playing", width * 5 / 2, height);
        ui::takePanelShots(directory, dark ? "-wide-dark" : "-wide-light", "trim-range", width * 5 / 2, height / 2);
    }
    return 0;
}
