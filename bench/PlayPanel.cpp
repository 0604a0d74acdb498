// Prints what the player panel costs, in percent of a core: "paused PERCENT" and "playing PERCENT", the latter with the
// position of a short recording moving as fast as the player reports it. Drawn by the toolkit's buffer engine; nothing
// is played.
#include <Elementary.h>
#include <gst/gst.h>
#include <media_content.h>
#include <panekit/WTimer.h>

#include <cstdio>
#include <string>
#include <sys/resource.h>

#include "MwPlayViewController.h"
#include "bench/Engines.h"
#include "bench/PanelWindow.h"

namespace {

constexpr double SECONDS = 5.0;
constexpr double REPORT_PERIOD = 0.02; // seconds
constexpr unsigned int LENGTH = 10000; // milliseconds

double usedSeconds()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    const auto seconds = [](const timeval& time) { return static_cast<double>(time.tv_sec) + time.tv_usec / 1e6; };
    return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

void runFor(double seconds)
{
    Ecore_Timer* timer = ecore_timer_add(
        seconds,
        [](void*) -> Eina_Bool {
            ecore_main_loop_quit();
            return ECORE_CALLBACK_RENEW;
        },
        nullptr);
    ecore_main_loop_begin();
    ecore_timer_del(timer);
}

double percentOfACore()
{
    const double used = usedSeconds();
    const double begin = bench::milliseconds();
    runFor(SECONDS);
    return (usedSeconds() - used) * 100000.0 / (bench::milliseconds() - begin);
}

// A silent file as long as the panel needs it.
std::string makeRecording(const std::string& folder)
{
    std::string file = folder + "/Panel.m4a";
    ecore_file_mkpath(folder.c_str());
    const std::string description = "audiotestsrc wave=silence num-buffers=" + std::to_string(LENGTH * 441 / 10240)
        + " samplesperbuffer=1024 ! audio/x-raw,rate=44100,channels=2 ! voaacenc ! mp4mux ! filesink location=" + file;
    GstElement* pipeline = gst_parse_launch(description.c_str(), nullptr);
    gst_element_set_state(pipeline, GST_STATE_PLAYING);
    GstBus* bus = gst_element_get_bus(pipeline);
    gst_message_unref(gst_bus_timed_pop_filtered(
        bus, GST_CLOCK_TIME_NONE, static_cast<GstMessageType>(GST_MESSAGE_EOS | GST_MESSAGE_ERROR)));
    gst_object_unref(bus);
    gst_element_set_state(pipeline, GST_STATE_NULL);
    gst_object_unref(pipeline);
    return file;
}

}

int main(int argc, char** argv)
{
    gst_init(&argc, &argv);
    bench::initToolkit(argc, argv, 1.3);
    bench::Engines engines;
    const std::string file = makeRecording(engines.model.getRecordingsDirectory());
    media_info_h media = nullptr;
    if (media_info_insert_to_db(file.c_str(), &media) != 0)
        return 1;
    media_info_destroy(media);
    engines.model.createRecordedFileList();
    engines.model.setCurrentPlayPath(file);
    engines.model.setPlayerState(PLAY_STATE_PAUSED);
    auto* panel = new MwPlayViewController(&engines.model, &engines.controller);
    if (!panel->dock(bench::openWindow(360, 640), MwPlayViewController::QUIET))
        return 1;
    runFor(1.0);
    std::printf("paused %.2f\n", percentOfACore());
    engines.model.setPlayerState(PLAY_STATE_PLAYING);
    engines.controller.getPlayerUpdatedSignal().emit();
    const double begin = bench::milliseconds();
    const auto report = panekit::WTimer::addTimer(REPORT_PERIOD, [&](void*) {
        engines.model.setCurrentPlayPosition(static_cast<unsigned int>(bench::milliseconds() - begin) % LENGTH);
        return true;
    });
    std::printf("playing %.2f\n", percentOfACore());
    panekit::WTimer::destroy(report);
    engines.model.setPlayerState(PLAY_STATE_NONE);
    panel->destroy();
    return 0;
}
