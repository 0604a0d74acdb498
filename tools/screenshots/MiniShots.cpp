#include "MiniShots.h"

#include <panekit/WLanguage.h>
#include <vconf.h>

#include "MwLockscreenMiniController.h"
#include "MwNotiMiniController.h"
#include "Picture.h"
#include "ScreenWindow.h"
#include "fakes/Fakes.h"

namespace ui {

namespace {

    class Program : public ScreenWindow {
    public:
        Program()
            : ScreenWindow(360, 640)
        {
        }

    protected:
        bool execute(MwAppController::Command) override { return true; }
    };

    struct Shot {
        const char* name;
        MwRecorderState recorder;
        MwPlayerState player;
        unsigned int seconds;
        bool rejects;
        const char* playing;
        const char* language;
        bool isMirrored = false;
    };

    constexpr auto READY = REC_STATE_READY;
    constexpr auto SILENT = PLAY_STATE_NONE;
    constexpr Shot SHOTS[] = {
        {"recording", REC_STATE_RECORDING, SILENT, 83, false, "", "en_US"},
        {"recording-hours", REC_STATE_RECORDING, SILENT, 36061, true, "", "de_DE"},
        {"recording-paused", REC_STATE_PAUSED, SILENT, 754, false, "", "en_US"},
        {"playing", READY, PLAY_STATE_PLAYING, 0, false, "Voice 001.m4a", "en_US"},
        {"playing-long", READY, PLAY_STATE_PLAYING, 0, false,
            "A very long conversation about everything and nothing in the old harbour.m4a", "en_US"},
        {"play-paused", READY, PLAY_STATE_PAUSED, 0, false, "Voice 001.m4a", "en_US"},
        {"recording-mirrored", REC_STATE_RECORDING, SILENT, 83, false, "", "en_US", true},
        {"playing-mirrored", READY, PLAY_STATE_PLAYING, 0, false, "Voice 001.m4a", "en_US", true},
    };

    template <typename Surface>
    void take(Program& program, minicontrol_viewer_e viewer, const std::string& file)
    {
        panekit::WWindowController* none = nullptr;
        auto* surface = new Surface(&program.model, program.controller(), none);
        surface->create();
        surface->update();
        support::runFor(0.4);
        savePicture(fakes::controlWindows.at(viewer).window, file);
        surface->destroy();
        support::runFor(0.05);
    }

}

void takeMiniShots(const std::string& directory, const std::string& suffix, const std::string& name)
{
    for (const Shot& shot : SHOTS) {
        if (!name.empty() && name != std::string("mini-") + shot.name)
            continue;
        Program program;
        panekit::WLanguage::use(shot.language);
        elm_config_mirrored_set(shot.isMirrored);
        program.model.setRecorderState(shot.recorder);
        program.model.setPlayerState(shot.player);
        program.model.setElapsedTime(shot.seconds * 1000ULL);
        program.model.setCurrentPlayPath(std::string("/somewhere/") + shot.playing);
        vconf_set_int(VCONFKEY_CALL_RECORDING_REJECT, shot.rejects ? 1 : 0);
        take<MwNotiMiniController>(
            program, MINICONTROL_VIEWER_PANEL, directory + "/mini-" + shot.name + "-panel" + suffix + ".png");
        take<MwLockscreenMiniController>(
            program, MINICONTROL_VIEWER_LOCKSCREEN, directory + "/mini-" + shot.name + "-lock" + suffix + ".png");
        panekit::WLanguage::use("en_US");
        elm_config_mirrored_set(EINA_FALSE);
        vconf_set_int(VCONFKEY_CALL_RECORDING_REJECT, 0);
    }
}

}
