// How long the recordings list is held by so many files (10000): another program adds them all, all rows are read anew,
// all are deleted. Prints for each the longest time in milliseconds between two waits of the main loop. One file in ten
// does not tell its length.
#include <Elementary.h>
#include <media_content.h>
#include <panekit/WContentViewController.h>
#include <panekit/WNaviframeController.h>
#include <storage.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>

#include "MwRecordingsContentViewController.h"
#include "bench/Engines.h"
#include "bench/LoopHold.h"
#include "support/RunUntil.h"
#include "support/Screen.h"
#include "ui/UiEnvironment.h"

namespace {

constexpr double PATIENCE = 60; // seconds

template <typename Work, typename Done>
void measure(const char* what, const Work& work, const Done& isDone)
{
    support::runFor(1.5);
    bench::LoopHold::restart();
    work();
    const bool done = support::runUntil(isDone, PATIENCE);
    support::runFor(1.5);
    std::printf("%s %.1f ms, of it working %.1f ms%s\n", what, bench::LoopHold::longest(),
        bench::LoopHold::longestCpu(), done ? "" : " (not done)");
}

class BottomScreen : public panekit::WContentViewController {
    Evas_Object* onCreateView(Evas_Object* parent, void*) override
    {
        Evas_Object* box = elm_box_add(parent);
        evas_object_show(box);
        return box;
    }
};

class Place {
public:
    Place()
    {
        _engines.model.setRequestMode(false);
        MwSystemMgr::getInstance()->registerEvent();
        _window = elm_win_util_standard_add("bench", "bench");
        evas_object_resize(_window, 360, 640);
        auto* naviframe = new panekit::WNaviframeController;
        naviframe->create(_window);
        elm_win_resize_object_add(_window, naviframe->getEvasObject());
        evas_object_show(_window);
        naviframe->push(new BottomScreen);
        auto* screen = new MwRecordingsContentViewController(&_engines.model, &_engines.controller);
        naviframe->push(screen);
        _view = screen->getEvasObject();
        _navi = naviframe->getEvasObject();
        support::settle(_window);
    }
    ~Place()
    {
        MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::TERMINATE);
        evas_object_del(_window);
        support::runFor(0.05);
        MwSystemMgr::getInstance()->unregisterEvent();
    }
    Place(const Place&) = delete;
    Place& operator=(const Place&) = delete;

    [[nodiscard]] unsigned int rows() const
    {
        Evas_Object* list = elm_object_part_content_get(_view, "elm.swallow.list");
        const bool isList = list && evas_object_smart_type_check(list, "elm_genlist");
        return isList ? elm_genlist_items_count(list) : 0;
    }
    void selectAllForDeleting()
    {
        support::key(_window, "Menu");
        support::runFor(0.3);
        for (Evas_Object* button : support::menuButtons(_window)) {
            if (support::text(button) == "Delete") {
                support::click(button);
                break;
            }
        }
        support::runFor(0.5);
        Evas_Object* list = elm_object_part_content_get(_view, "elm.swallow.list");
        Evas_Object* all = elm_object_item_track(elm_genlist_first_item_get(list));
        support::click(all);
        elm_object_item_untrack(elm_genlist_first_item_get(list));
    }
    void pressDone() const
    {
        support::click(elm_object_item_part_content_get(elm_naviframe_top_item_get(_navi), "title_right_btn"));
    }

private:
    bench::Engines _engines;
    Evas_Object* _window = nullptr;
    Evas_Object* _view = nullptr;
    Evas_Object* _navi = nullptr;
};

void writeFiles(unsigned int count)
{
    const std::string folder = std::string(storage_device_root()) + "/Sounds/Mewlo/";
    std::filesystem::create_directories(folder);
    const std::string frames = "#!AMR\n" + std::string(32, '\x3c');
    for (unsigned int i = 0; i < count; ++i)
        std::ofstream(folder + "Voice " + std::to_string(i) + (i % 10 == 0 ? ".3ga" : ".amr"))
            << frames.substr(i % 10 == 0 ? 7 : 0);
}

}

int main(int argc, char** argv)
{
    const unsigned int count = argc > 1 ? static_cast<unsigned int>(std::atoi(argv[1])) : 10000;
    const ui::Environment environment(argc, argv);
    Place place;
    bench::LoopHold::install();
    std::thread other;
    measure(
        "files arrive", [&] { other = std::thread(writeFiles, count); }, [&] { return place.rows() == count; });
    other.join();
    measure(
        "refresh", [] { MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED); },
        [] { return true; });
    measure(
        "all are chosen", [&] { place.selectAllForDeleting(); }, [] { return true; });
    measure(
        "all are deleted", [&] { place.pressDone(); }, [&] { return place.rows() == 0; });
    return 0;
}
