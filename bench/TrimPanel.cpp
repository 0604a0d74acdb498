// bench-trim-panel FILE: opens the trim panel over a recording at twice the scale, and drags a bar. Prints "frame MS",
// the CPU time of a frame while dragging, and "held MS", the longest time that the main loop was held while the
// waveform was read. Drawn by the toolkit's buffer engine; nothing is played.
#include <Elementary.h>
#include <media_content.h>
#include <panekit/WTimer.h>

#include <algorithm>
#include <cstdio>
#include <string>
#include <time.h>

#include "MwTrimViewController.h"
#include "MwTrimWaveform.h"
#include "bench/Engines.h"
#include "bench/PanelWindow.h"

namespace {

constexpr int FRAMES = 300;

double cpuMilliseconds()
{
    timespec time{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) * 1000 + static_cast<double>(time.tv_nsec) / 1e6;
}

// Passes of the loop until the waveform is there; each is timed without its waiting.
double longestPass(const MwTrimWaveform& waveform)
{
    double longest = 0;
    while (!waveform.isComplete()) {
        const double begin = bench::milliseconds();
        ecore_main_loop_iterate();
        longest = std::max(longest, bench::milliseconds() - begin);
        ::usleep(500);
    }
    return longest;
}

double dragFrame(Evas_Object* window)
{
    Evas* canvas = evas_object_evas_get(window);
    int width = 0;
    int height = 0;
    evas_object_geometry_get(window, nullptr, nullptr, &width, &height);
    const int y = height - static_cast<int>(260 * elm_config_scale_get() / 2.6);
    const int bar = static_cast<int>(32 * elm_config_scale_get() / 2.6);
    unsigned int time = 1000;
    evas_event_feed_mouse_in(canvas, time, nullptr);
    evas_event_feed_mouse_move(canvas, bar, y, time, nullptr);
    evas_event_feed_mouse_down(canvas, 1, EVAS_BUTTON_NONE, time, nullptr);
    const double begin = cpuMilliseconds();
    for (int i = 0; i < FRAMES; ++i) {
        evas_event_feed_mouse_move(canvas, bar + (i * 3) % (width / 2), y, time += 16, nullptr);
        ecore_main_loop_iterate();
        evas_render(canvas);
    }
    return (cpuMilliseconds() - begin) / FRAMES;
}

}

int main(int argc, char** argv)
{
    if (argc < 2)
        return 2;
    bench::initToolkit(argc, argv, 5.2);
    bench::Engines engines;
    const std::string folder = engines.model.getRecordingsDirectory();
    const std::string file = folder + "/Trim.m4a";
    ecore_file_mkpath(folder.c_str());
    ecore_file_cp(argv[1], file.c_str());
    media_info_h media = nullptr;
    if (media_info_insert_to_db(file.c_str(), &media) != 0)
        return 1;
    media_info_destroy(media);
    engines.model.createRecordedFileList();
    engines.model.setCurrentPlayPath(file);
    engines.model.setPlayerState(PLAY_STATE_PAUSED);
    auto* panel = new MwTrimViewController(&engines.model, &engines.controller);
    Evas_Object* host = bench::openWindow(720, 1280);
    if (!panel->dock(host))
        return 1;
    for (int i = 0; i < 3; ++i)
        ecore_main_loop_iterate(); // the window's own first frame
    std::printf("held %.2f\n", longestPass(*panel->getWaveform()));
    for (const double end = bench::milliseconds() + 600; bench::milliseconds() < end;)
        ecore_main_loop_iterate();
    std::printf("frame %.2f\n", dragFrame(elm_object_top_widget_get(host)));
    if (!panel->getRange().isTrimmed())
        std::fprintf(stderr, "bench: no bar was dragged\n");
    panel->destroy();
    return 0;
}
