#include "ListShots.h"

#include <Ecore_Input.h>
#include <Elementary.h>

#include <cstdlib>
#include <functional>
#include <vector>

#include <media_content.h>
#include <vconf.h>

#include "PanelScreen.h"
#include "Picture.h"
#include "RecordingsScreen.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/Screen.h"

namespace ui {

namespace {

    constexpr long long NEWEST = 1700000000;

    struct Shot {
        const char* name;
        std::function<void()> enter;
        std::function<void(RecordingsScreen&)> arrange;
        RecordingsScreen::Mode mode = RecordingsScreen::Mode::Normal;
    };

    std::string privatePath(const char* file)
    {
        return std::string(std::getenv("MEWLO_PRIVATE_ROOT")) + "/Sounds/Mewlo/" + file;
    }

    void enter(const std::vector<support::DatabaseRow>& rows)
    {
        media_content_connect();
        support::enterRows(rows);
        for (const auto& row : rows) {
            if (row.path.find("Voice 00") != std::string::npos && row.duration > 100000)
                media_bookmark_insert_to_db(row.path.c_str(), 3, "here");
        }
        media_content_disconnect();
    }

    void some()
    {
        const auto at = [](const char* file, int duration, int days) {
            return support::DatabaseRow{recordingPath(file), duration, NEWEST - days * 86400LL};
        };
        enter({at("Voice 006.m4a", 83000, 0), at("Interview with the harbour master.m4a", 3723000, 1),
            at("Voice 005.amr", 4000, 2), at("Voice 004.m4a", 754000, 5),
            {privatePath("Voice 003.m4a"), 181000, NEWEST - 6 * 86400}, at("Voice 002.m4a", 400, 9),
            at("Voice 001.m4a", 65000, 40)});
    }

    void names()
    {
        const std::vector<std::string> texts
            = {"A conversation about everything and nothing in the old harbour, part one",
                "محادثة طويلة جدا عن كل شيء ولا شيء في المرفأ القديم مع صديق", "שיחה קצרה",
                "Birthday 🎂🎉 with 👨‍👩‍👧 at the lake", "<b>50%</b> & \"quotes\" \xff\xfe",
                "two\nlines", std::string(240, 'W'), "日本語の録音"};
        std::vector<support::DatabaseRow> rows;
        for (size_t i = 0; i < texts.size(); ++i)
            rows.push_back(
                {(i % 3 == 0 ? privatePath("") : recordingPath("")) + texts[i] + (i % 2 == 0 ? ".amr" : ".m4a"),
                    static_cast<int>(i) * 500000, NEWEST - static_cast<long long>(i) * 86400});
        enter(rows);
    }

    void thousands()
    {
        std::vector<std::string> files;
        for (int i = 4000; i > 0; --i)
            files.push_back("Voice " + std::to_string(i) + ".m4a");
        enterRecordings(files);
    }

    void mode(RecordingsScreen& screen, const char* entry, const std::vector<std::string>& rows)
    {
        vconf_set_int("db/setting/personal_unlock_method", 1);
        screen.chooseMenu(entry);
        for (const std::string& row : rows)
            screen.tap(row);
    }

    // As the window system reports a key, besides what the window gets of it.
    void pressOnTheDevice(const char* key)
    {
        auto* event = static_cast<Ecore_Event_Key*>(std::calloc(1, sizeof(Ecore_Event_Key)));
        event->keyname = event->key = key;
        ecore_event_add(ECORE_EVENT_KEY_DOWN, event, nullptr, nullptr);
        support::runFor(0.05);
    }

    void play(RecordingsScreen& screen)
    {
        screen.tap("Voice 004.m4a");
        screen.model.setCurrentPlayPosition(183000);
        screen.playerChanged();
    }

    // The focused bar of the trim panel, by seconds.
    void moveBar(RecordingsScreen& screen, const char* key, int seconds)
    {
        Evas* canvas = evas_object_evas_get(screen.window);
        evas_key_modifier_on(canvas, "Shift");
        for (int i = 0; i < seconds; ++i)
            support::key(screen.window, key);
        evas_key_modifier_off(canvas, "Shift");
    }

    const std::vector<Shot>& shots()
    {
        static const std::vector<Shot> all = {
            {"list", some, [](auto&) {}},
            {"list-empty", [] {}, [](auto&) {}},
            {"list-one", [] { enterRecordings({"Voice 001.m4a"}); }, [](auto&) {}},
            {"list-thousands", thousands,
                [](auto& screen) {
                    support::runFor(0.5);
                    elm_scroller_region_show(screen.list(), 0, 100000, 1, 500);
                }},
            {"list-names", names, [](auto&) {}},
            {"list-playing", some, play},
            {"list-paused", some,
                [](auto& screen) {
                    play(screen);
                    screen.tap("Voice 004.m4a");
                }},
            {"list-trimming", some,
                [](auto& screen) {
                    support::writeFile(recordingPath("Voice 004.m4a"), PanelScreen::sound());
                    play(screen);
                    screen.tap("Voice 004.m4a");
                    screen.model.setTrimMode(true);
                    screen.playerChanged();
                    support::runFor(1.0);
                    moveBar(screen, "Right", 160);
                    support::key(screen.window, "Tab");
                    moveBar(screen, "Left", 180);
                    support::runFor(0.2);
                }},
            {"list-keyboard", some,
                [](auto& screen) {
                    pressOnTheDevice("Down"); // shows the mark
                    screen.key("Down");
                    screen.key("Down");
                }},
            {"list-menu", some,
                [](auto& screen) {
                    play(screen);
                    screen.menu();
                }},
            {"list-pick", some, [](auto& screen) { screen.tap("Voice 005.amr"); }, RecordingsScreen::Mode::Request},
            {"list-pick-empty", [] {}, [](auto&) {}, RecordingsScreen::Mode::Request},
            {"list-delete", some,
                [](auto& screen) {
                    mode(screen, "Delete", {"Voice 006.m4a", "Voice 004.m4a"});
                }},
            {"list-share", some, [](auto& screen) { mode(screen, "Share", {"all"}); }},
            {"list-rename", some, [](auto& screen) { mode(screen, "Rename", {}); }},
            {"list-to-private", some, [](auto& screen) { mode(screen, "Move to private", {}); }},
            {"list-from-private", some, [](auto& screen) { mode(screen, "Remove from private", {}); }},
        };
        return all;
    }

}

void takeListShots(
    const std::string& directory, const std::string& suffix, const std::string& name, int width, int height)
{
    for (const Shot& shot : shots()) {
        if (!name.empty() && name != shot.name)
            continue;
        forgetRecordings();
        shot.enter();
        RecordingsScreen screen(shot.mode, width, height);
        screen.open();
        shot.arrange(screen);
        support::runFor(0.2);
        savePicture(screen.window, directory + "/" + shot.name + suffix + ".png");
        vconf_set_int("db/setting/personal_unlock_method", 0);
    }
    forgetRecordings();
}

}
