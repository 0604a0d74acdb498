// Opens the recordings list with so many rows (10000) and prints what it costs beside the bare reading of the same rows
// and the opening of an empty list, in milliseconds, then memory a row and CPU time a frame while scrolling.
#include <Ecore_Evas.h>
#include <Elementary.h>
#include <media_content.h>
#include <panekit/WContentViewController.h>
#include <panekit/WNaviframeController.h>
#include <sqlite3.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <string>
#include <sys/resource.h>
#include <vector>

#include "MwAppController.h"
#include "MwModel.h"
#include "MwRecordingsContentViewController.h"
#include "bench/Engines.h"
#include "support/DatabaseRows.h"
#include "support/RunUntil.h"
#include "ui/UiEnvironment.h"

namespace {

constexpr int ROUNDS = 9;
constexpr int FRAMES = 600;
constexpr int SCROLL_STEP = 40; // pixels a frame: a fast fling

double median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

double share(std::vector<double> values, double part)
{
    std::sort(values.begin(), values.end());
    return values[static_cast<size_t>(static_cast<double>(values.size() - 1) * part)];
}

double residentKilobytes()
{
    std::ifstream status("/proc/self/statm");
    long long total = 0;
    long long resident = 0;
    status >> total >> resident;
    return static_cast<double>(resident) * 4;
}

double cpuMilliseconds()
{
    timespec time{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) * 1000 + static_cast<double>(time.tv_nsec) / 1e6;
}

void useDatabase(const std::string& home, bool full)
{
    ::setenv("XDG_DATA_HOME", (home + (full ? "/full" : "/empty")).c_str(), 1);
}

// Steps through the rows and looks at their texts, keeping nothing.
double bareRead()
{
    sqlite3* database = nullptr;
    sqlite3_stmt* statement = nullptr;
    sqlite3_open(support::databasePath().c_str(), &database);
    size_t bytes = 0;
    const double begin = bench::milliseconds();
    sqlite3_prepare_v2(database,
        "SELECT MEDIA_ID, MEDIA_PATH, MEDIA_DISPLAY_NAME, MEDIA_MODIFIED_TIME, MEDIA_DURATION FROM media WHERE "
        "MEDIA_MIME_TYPE=\"audio/AMR\" OR MEDIA_MIME_TYPE=\"audio/3gpp\" OR (MEDIA_MIME_TYPE=\"audio/mp4\" AND "
        "MEDIA_MODE=10) ORDER BY MEDIA_TIMELINE DESC",
        -1, &statement, nullptr);
    while (sqlite3_step(statement) == SQLITE_ROW) {
        for (int column = 0; column < 3; ++column) {
            if (sqlite3_column_text(statement, column) != nullptr)
                bytes += static_cast<size_t>(sqlite3_column_bytes(statement, column));
        }
        bytes += static_cast<size_t>(sqlite3_column_int64(statement, 3) + sqlite3_column_int64(statement, 4));
    }
    const double taken = bench::milliseconds() - begin;
    sqlite3_finalize(statement);
    sqlite3_close(database);
    return bytes > 0 ? taken : -1;
}

class BottomScreen : public panekit::WContentViewController {
    Evas_Object* onCreateView(Evas_Object* parent, void*) override
    {
        Evas_Object* box = elm_box_add(parent);
        evas_object_show(box);
        return box;
    }
};

// A window with a screen below the list.
class Place {
public:
    Place()
    {
        media_content_connect();
        int count = 0;
        media_info_get_bookmark_count_from_db("none", nullptr, &count); // the database is open
        _window = elm_win_util_standard_add("bench", "bench");
        evas_object_resize(_window, 360, 640);
        _naviframe = new panekit::WNaviframeController;
        _naviframe->create(_window);
        elm_win_resize_object_add(_window, _naviframe->getEvasObject());
        evas_object_show(_window);
        _naviframe->push(new BottomScreen);
        drawFrame();
        support::runFor(0.05);
    }
    ~Place()
    {
        MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::TERMINATE);
        evas_object_del(_window);
        support::runFor(0.05);
        media_content_disconnect();
    }
    Place(const Place&) = delete;
    Place& operator=(const Place&) = delete;

    // Answers the milliseconds until the first frame with the list.
    double open()
    {
        const double begin = bench::milliseconds();
        auto* screen = new MwRecordingsContentViewController(&_model, &_controller);
        _naviframe->push(screen);
        drawFrame();
        const double taken = bench::milliseconds() - begin;
        _view = screen->getEvasObject();
        return taken;
    }
    [[nodiscard]] Evas_Object* list() const { return elm_object_part_content_get(_view, "elm.swallow.list"); }
    void waitForRows(unsigned int count) const
    {
        support::runUntil([&] { return elm_genlist_items_count(list()) >= count; }, 30);
    }
    void drawFrame()
    {
        bool drawn = false;
        Evas* canvas = evas_object_evas_get(_window);
        const auto mark = [](void* data, Evas*, void*) { *static_cast<bool*>(data) = true; };
        evas_event_callback_add(canvas, EVAS_CALLBACK_RENDER_POST, mark, &drawn);
        evas_damage_rectangle_add(canvas, 0, 0, 1, 1);
        while (!drawn)
            ecore_main_loop_iterate();
        evas_event_callback_del_full(canvas, EVAS_CALLBACK_RENDER_POST, mark, &drawn);
    }

private:
    MwModel _model;
    MwAppController _controller;
    Evas_Object* _window = nullptr;
    Evas_Object* _view = nullptr;
    panekit::WNaviframeController* _naviframe = nullptr;
};

double openOnce()
{
    Place place;
    return place.open();
}

void measureMemory(const std::string& home, unsigned int rows)
{
    useDatabase(home, false);
    openOnce();
    useDatabase(home, true);
    Place place;
    const double before = residentKilobytes();
    place.open();
    place.waitForRows(rows);
    support::runFor(0.5);
    std::printf("memory a row %.2f KB\n", (residentKilobytes() - before) / rows);
}

double readCatalogue()
{
    media_content_connect();
    int count = 0;
    media_info_get_bookmark_count_from_db("none", nullptr, &count); // the database is open
    MwModel model;
    const double begin = bench::milliseconds();
    model.createRecordedFileList();
    const double taken = bench::milliseconds() - begin;
    media_content_disconnect();
    return taken;
}

void measureOpening(const std::string& home)
{
    std::vector<double> bare;
    std::vector<double> catalogue;
    std::vector<double> empty;
    std::vector<double> full;
    for (int i = 0; i < ROUNDS; ++i) {
        useDatabase(home, false);
        empty.push_back(openOnce());
        useDatabase(home, true);
        bare.push_back(bareRead());
        catalogue.push_back(readCatalogue());
        full.push_back(openOnce());
    }
    std::printf("bare read %.1f ms\ncatalogue %.1f ms\nempty list %.1f ms\nfull list %.1f ms\n", median(bare),
        median(catalogue), median(empty), median(full));
    std::printf("full without empty, against bare read %.2f\n", (median(full) - median(empty)) / median(bare));
}

void measureScrolling(const std::string& home, unsigned int rows)
{
    useDatabase(home, true);
    Place place;
    place.open();
    place.waitForRows(rows);
    support::runFor(0.5);
    std::vector<double> frames;
    for (int i = 0; i < FRAMES; ++i) {
        const double begin = cpuMilliseconds();
        elm_scroller_region_show(place.list(), 0, i * SCROLL_STEP, 1, 640);
        place.drawFrame();
        frames.push_back(cpuMilliseconds() - begin);
    }
    std::printf("scrolling, CPU a frame %.2f ms median, %.2f ms at 99 %%\n", median(frames), share(frames, 0.99));
}

}

int main(int argc, char** argv)
{
    const unsigned int rows = argc > 1 ? static_cast<unsigned int>(std::atoi(argv[1])) : 10000;
    const ui::Environment environment(argc, argv);
    const std::string home = std::getenv("HOME");
    useDatabase(home, true);
    std::vector<support::DatabaseRow> entries;
    for (unsigned int i = 0; i < rows; ++i)
        entries.push_back({home + "/Sounds/Mewlo/Voice " + std::to_string(i) + ".m4a", 60000, 1700000000LL - i * 7919});
    media_content_connect();
    support::enterRows(entries);
    media_content_disconnect();
    measureMemory(home, rows);
    measureOpening(home);
    measureScrolling(home, rows);
    return 0;
}
