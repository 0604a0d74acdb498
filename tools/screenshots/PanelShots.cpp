#include "PanelShots.h"

#include <Elementary.h>

#include <functional>

#include <media_content.h>

#include "MwBookmarksContentViewController.h"
#include "MwDetailsContentViewController.h"
#include "MwTrimWaveform.h"
#include "PanelScreen.h"
#include "Picture.h"
#include "support/Recordings.h"
#include "support/Screen.h"

namespace ui {

namespace {

    constexpr int MINUTE = 60000;

    struct Shot {
        const char* name;
        std::function<void(PanelScreen&)> arrange;
    };

    void addBookmarks(const std::string& mediaId, int count, int seconds)
    {
        for (int i = 1; i <= count; ++i)
            media_bookmark_insert_to_db(mediaId.c_str(), static_cast<unsigned int>(seconds * i / (count + 1)),
                mwFormat("Bookmark%03d", i).c_str());
    }

    void panel(PanelScreen& screen, int duration, int bookmarks, MwPlayer::PlayState state, double share)
    {
        addBookmarks(screen.addRecording("Voice 001.m4a", duration), bookmarks, duration / 1000);
        screen.load("Voice 001.m4a", state, static_cast<unsigned int>(duration * share));
        screen.dock();
    }

    // Noise that rises and falls three times; the duration is what the catalogue says.
    void trim(PanelScreen& screen, int duration, const std::string& content)
    {
        const std::string path = screen.addRecording("Voice 001.m4a", duration, content);
        addBookmarks(path, 3, duration / 1000);
        screen.load("Voice 001.m4a", PLAY_STATE_PAUSED, static_cast<unsigned int>(duration) / 3);
        screen.dockTrim();
        support::runUntil([&] { return screen.trimPanel->getWaveform()->isComplete(); }, 5);
        support::runFor(0.4);
    }

    void dragBar(PanelScreen& screen, double from, double to, bool release)
    {
        const auto* view = elm_layout_edje_get(screen.panelView);
        int x = 0;
        int y = 0;
        int left = 0;
        int width = 0;
        int top = 0;
        int height = 0;
        evas_object_geometry_get(view, &x, &y, nullptr, nullptr);
        edje_object_part_geometry_get(view, "waveform", &left, &top, &width, &height);
        Evas* canvas = evas_object_evas_get(screen.window);
        const auto at = [&](double share) { return x + left + static_cast<int>(width * share); };
        evas_event_feed_mouse_in(canvas, support::nextTime(), nullptr);
        evas_event_feed_mouse_move(canvas, at(from), y + top + height / 2, support::nextTime(), nullptr);
        evas_event_feed_mouse_down(canvas, 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        evas_event_feed_mouse_move(canvas, at(to), y + top + height / 2, support::nextTime(), nullptr);
        if (release)
            evas_event_feed_mouse_up(canvas, 1, EVAS_BUTTON_NONE, support::nextTime(), nullptr);
        support::runFor(0.1);
    }

    void trimRange(PanelScreen& screen, int duration)
    {
        trim(screen, duration, PanelScreen::sound());
        dragBar(screen, 0.0, 0.25, true);
        dragBar(screen, 1.0, 0.7, true);
    }

    void trimAsk(PanelScreen& screen, const char* key)
    {
        trimRange(screen, 10000);
        support::key(screen.window, key);
        support::runFor(0.5);
    }

    void bookmarks(PanelScreen& screen, int count)
    {
        const std::string id = screen.addRecording("Voice 001.m4a", 4 * MINUTE);
        addBookmarks(id, count, 240);
        if (count > 2)
            media_bookmark_insert_to_db(
                id.c_str(), 200, "What the harbour master said about the storm & the two lost boats");
        screen.load("Voice 001.m4a", PLAY_STATE_PAUSED, 83000);
        screen.push(new MwBookmarksContentViewController(&screen.model, screen.controller(), id));
    }

    void chooseMode(PanelScreen& screen, int steps)
    {
        screen.more();
        support::runFor(0.4);
        for (int i = 0; i < steps; ++i)
            support::key(screen.window, "Tab");
        support::key(screen.window, "Return");
        support::runFor(0.5);
    }

    void details(PanelScreen& screen)
    {
        const std::string name = "A very long conversation about everything and nothing in the old harbour.m4a";
        screen.addRecording(name, 3 * MINUTE + 7000, std::string(3 << 20, 'x'));
        screen.load(name, PLAY_STATE_PAUSED);
        screen.push(new MwDetailsContentViewController(
            &screen.model, screen.controller(), screen.model.getRecordedFileList().front()));
    }

    const std::vector<Shot>& shots()
    {
        static const std::vector<Shot> all = {
            {"panel-playing", [](auto& s) { panel(s, 4 * MINUTE, 1, PLAY_STATE_PLAYING, 0.4); }},
            {"panel-paused", [](auto& s) { panel(s, 4 * MINUTE, 0, PLAY_STATE_PAUSED, 0.0); }},
            {"panel-full", [](auto& s) { panel(s, 10 * MINUTE, 50, PLAY_STATE_PAUSED, 1.0); }},
            {"panel-hours", [](auto& s) { panel(s, 61 * MINUTE, 5, PLAY_STATE_PLAYING, 0.2); }},
            {"panel-short", [](auto& s) { panel(s, 1000, 0, PLAY_STATE_NONE, 0.0); }},
            {"trim", [](auto& s) { trim(s, 10000, PanelScreen::sound()); }},
            {"trim-range", [](auto& s) { trimRange(s, 10000); }},
            {"trim-hours", [](auto& s) { trimRange(s, 100 * MINUTE); }},
            {"trim-narrow",
                [](auto& s) {
                    trimRange(s, 10000);
                    dragBar(s, 0.25, 0.9, true);
                }},
            {"trim-drag",
                [](auto& s) {
                    trim(s, 100 * MINUTE, PanelScreen::sound());
                    dragBar(s, 0.0, 0.3, false);
                }},
            {"trim-damaged", [](auto& s) { trim(s, 10000, "no sound"); }},
            {"trim-save", [](auto& s) { trimAsk(s, "Return"); }},
            {"trim-saving",
                [](auto& s) {
                    trimAsk(s, "Return");
                    support::key(s.window, "Down");
                    support::key(s.window, "Return");
                    support::runFor(0.2);
                }},
            {"trim-discard",
                [](auto& s) {
                    trimRange(s, 10000);
                    s.trimPanel->back();
                    support::runFor(0.5);
                }},
            {"bookmarks", [](auto& s) { bookmarks(s, 12); }},
            {"bookmarks-empty", [](auto& s) { bookmarks(s, 0); }},
            {"bookmarks-rename",
                [](auto& s) {
                    bookmarks(s, 3);
                    chooseMode(s, 0);
                }},
            {"bookmarks-delete",
                [](auto& s) {
                    bookmarks(s, 3);
                    chooseMode(s, 1);
                }},
            {"details", details},
        };
        return all;
    }

}

void takePanelShots(
    const std::string& directory, const std::string& suffix, const std::string& name, int width, int height)
{
    for (const Shot& shot : shots()) {
        if (!name.empty() && name != shot.name)
            continue;
        PanelScreen screen(width, height);
        shot.arrange(screen);
        savePicture(screen.window, directory + "/" + shot.name + suffix + ".png");
    }
}

}
