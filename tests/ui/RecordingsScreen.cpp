#include "RecordingsScreen.h"

#include <Elementary.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include <media_content.h>
#include <panekit/WContentViewController.h>

#include "MwRecordingsContentViewController.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/Screen.h"

namespace ui {

namespace {

    constexpr long long NEWEST = 1700000000; // 14 November 2023

    // What lies below the list.
    class BottomScreen : public panekit::WContentViewController {
        Evas_Object* onCreateView(Evas_Object* parent, void*) override
        {
            Evas_Object* box = elm_box_add(parent);
            evas_object_show(box);
            return box;
        }
    };

}

RecordingsScreen::RecordingsScreen(Mode mode, int width, int height)
    : ScreenWindow(width, height)
{
    model.setRequestMode(mode == Mode::Request);
    media_content_connect();
    naviframe->push(new BottomScreen);
}

RecordingsScreen::~RecordingsScreen()
{
    close();
    media_content_disconnect();
}

void RecordingsScreen::open()
{
    auto* screen = new MwRecordingsContentViewController(&model, controller());
    naviframe->push(screen);
    view = screen->getEvasObject();
    evas_object_event_callback_add(
        view, EVAS_CALLBACK_DEL,
        [](void* data, Evas*, Evas_Object*, void*) { *static_cast<Evas_Object**>(data) = nullptr; }, &view);
    support::settle(window);
}

bool RecordingsScreen::execute(MwAppController::Command command)
{
    switch (command) {
    case MwAppController::START_PLAYING:
    case MwAppController::RESTART_PLAYING:
    case MwAppController::RESUME_PLAYING:
        model.setPlayerState(PLAY_STATE_PLAYING);
        break;
    case MwAppController::PAUSE_PLAYING:
        model.setPlayerState(PLAY_STATE_PAUSED);
        break;
    case MwAppController::STOP_PLAYING:
        model.setPlayerState(PLAY_STATE_NONE);
        break;
    default:
        return true;
    }
    playerChanged();
    return true;
}

void RecordingsScreen::playerChanged() { controller()->getPlayerUpdatedSignal().emit(); }

void RecordingsScreen::announce(MwSignalMgr::SystemInfo info)
{
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(info);
    support::settle(window);
}

Evas_Object* RecordingsScreen::list() const
{
    Evas_Object* content = elm_object_part_content_get(view, "elm.swallow.list");
    return content && evas_object_smart_type_check(content, "elm_genlist") ? content : nullptr;
}

std::vector<std::string> RecordingsScreen::names() const
{
    std::vector<std::string> names;
    for (Elm_Object_Item* item = list() ? elm_genlist_first_item_get(list()) : nullptr; item;
         item = elm_genlist_item_next_get(item)) {
        const auto* row = MwRecordingsListItem::from(item);
        names.push_back(row->isSelectAll() ? "all" : row->getFileInfo()->displayName);
    }
    return names;
}

Evas_Object* RecordingsScreen::row(const std::string& name) const
{
    for (Elm_Object_Item* item = elm_genlist_first_item_get(list()); item; item = elm_genlist_item_next_get(item)) {
        const auto* row = MwRecordingsListItem::from(item);
        if (row->isSelectAll() ? name == "all" : row->getFileInfo()->displayName == name)
            return item;
    }
    return nullptr;
}

std::string RecordingsScreen::text(const std::string& name, const char* part) const
{
    const char* text = row(name) ? elm_object_item_part_text_get(row(name), part) : nullptr;
    return text ? text : "";
}

Evas_Object* RecordingsScreen::choice(const std::string& name) const
{
    Evas_Object* layout = row(name) ? elm_object_item_part_content_get(row(name), "elm.icon.2") : nullptr;
    return layout ? elm_object_part_content_get(layout, "elm.swallow.content") : nullptr;
}

std::string RecordingsScreen::topRow() const
{
    int x = 0;
    int y = 0;
    int where = 0;
    evas_object_geometry_get(list(), &x, &y, nullptr, nullptr);
    const auto* row = MwRecordingsListItem::from(elm_genlist_at_xy_item_get(list(), x + 20, y + 1, &where));
    return row ? (row->isSelectAll() ? "all" : row->getFileInfo()->displayName) : "";
}

void RecordingsScreen::tap(const std::string& name)
{
    support::settle(window);
    Evas_Object* rectangle = row(name) ? elm_object_item_track(row(name)) : nullptr;
    if (!rectangle)
        return;
    support::click(rectangle);
    elm_object_item_untrack(row(name));
    support::settle(window);
}

Evas_Object* RecordingsScreen::_item() const { return elm_naviframe_top_item_get(naviframe->getEvasObject()); }

std::string RecordingsScreen::title() const
{
    const char* text = elm_object_item_text_get(_item());
    return text ? text : "";
}

Evas_Object* RecordingsScreen::titleButton(const char* part) const
{
    return elm_object_item_part_content_get(_item(), part);
}

void RecordingsScreen::pressTitle(const char* part)
{
    support::settle(window);
    if (Evas_Object* button = titleButton(part); button)
        support::click(button);
    support::settle(window);
}

bool RecordingsScreen::hasRecordButton() const
{
    Evas_Object* docked = elm_object_part_content_get(view, "elm.swallow.controller");
    return docked && elm_object_part_content_get(docked, "record_button");
}

bool RecordingsScreen::hasPlayer() const
{
    return elm_object_part_content_get(view, "elm.swallow.controller") && !hasRecordButton();
}

void RecordingsScreen::back() { key("Escape"); }

void RecordingsScreen::key(const char* name)
{
    support::key(window, name);
    support::settle(window);
}

std::vector<std::string> RecordingsScreen::menu()
{
    key("Menu");
    std::vector<std::string> entries;
    for (Evas_Object* button : support::menuButtons(window))
        entries.push_back(support::text(button));
    return entries;
}

void RecordingsScreen::chooseMenu(const std::string& entry)
{
    menu();
    support::runFor(0.3);
    for (Evas_Object* button : support::menuButtons(window)) {
        if (support::text(button) != entry)
            continue;
        support::click(button);
        break;
    }
    support::runFor(0.2);
    support::settle(window);
}

std::string recordingPath(const std::string& file) { return support::recordingPath(file); }

std::string enterRecordings(const std::vector<std::string>& files)
{
    std::vector<support::DatabaseRow> rows;
    for (size_t i = 0; i < files.size(); ++i)
        rows.push_back({recordingPath(files[i]), 60000, NEWEST - static_cast<long long>(i) * 86400});
    media_content_connect();
    support::enterRows(rows);
    media_content_disconnect();
    return rows.empty() ? std::string() : rows.front().path;
}

void forgetRecordings()
{
    for (const char* suffix : {"", "-wal", "-shm", ".good"})
        std::filesystem::remove(support::databasePath() + suffix);
    for (const std::string& root : {support::deviceRoot(), std::string(std::getenv("MEWLO_PRIVATE_ROOT"))}) {
        for (const auto& entry : std::filesystem::directory_iterator(root))
            std::filesystem::remove_all(entry.path());
    }
}

}
