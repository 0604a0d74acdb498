// Prints, in milliseconds, pairs of: START_PLAYING of a recording until it plays, and the bare chain's own prepare and
// start, alternating in one run. A last line "seek LAST REACHED" says where a burst of 50 seeks ended.
#include <gst/gst.h>
#include <media_content.h>
#include <player.h>

#include <cstdio>
#include <string>

#include "bench/Engines.h"

namespace {

constexpr int ROUNDS = 25;
constexpr int SEEKS = 50;

void runPipeline(const std::string& description)
{
    GstElement* pipeline = gst_parse_launch(description.c_str(), nullptr);
    gst_element_set_state(pipeline, GST_STATE_PLAYING);
    GstBus* bus = gst_element_get_bus(pipeline);
    GstMessage* end = gst_bus_timed_pop_filtered(
        bus, GST_CLOCK_TIME_NONE, static_cast<GstMessageType>(GST_MESSAGE_EOS | GST_MESSAGE_ERROR));
    gst_message_unref(end);
    gst_object_unref(bus);
    gst_element_set_state(pipeline, GST_STATE_NULL);
    gst_object_unref(pipeline);
}

double bareStart(const std::string& file)
{
    const double begin = bench::milliseconds();
    const std::string description = "filesrc location=" + file
        + " ! qtdemux ! aacparse ! avdec_aac ! audioconvert ! audioresample ! pulsesink client-name=bare";
    GstElement* pipeline = gst_parse_launch(description.c_str(), nullptr);
    gst_element_set_state(pipeline, GST_STATE_PAUSED);
    gst_element_get_state(pipeline, nullptr, nullptr, 5 * GST_SECOND);
    gst_element_set_state(pipeline, GST_STATE_PLAYING);
    const double taken = bench::milliseconds() - begin;
    gst_element_set_state(pipeline, GST_STATE_NULL);
    gst_object_unref(pipeline);
    return taken;
}

double ownStart(bench::Engines& engines)
{
    const double begin = bench::milliseconds();
    if (!engines.controller.dispatchCommand(MwAppController::START_PLAYING))
        return -1;
    const double taken = bench::milliseconds() - begin;
    engines.controller.dispatchCommand(MwAppController::STOP_PLAYING);
    return taken;
}

void seekBurst(const std::string& file)
{
    player_h player = nullptr;
    player_create(&player);
    player_set_uri(player, file.c_str());
    player_prepare(player);
    player_start(player);
    player_pause(player);
    int target = 0;
    for (int i = 0; i < SEEKS; ++i) {
        target = (i * 7919) % 50000;
        player_set_play_position(player, target, false, nullptr, nullptr);
    }
    for (const double end = bench::milliseconds() + 500; bench::milliseconds() < end;)
        ecore_main_loop_iterate();
    int reached = -1;
    player_get_play_position(player, &reached);
    std::printf("seek %d %d\n", target, reached);
    player_destroy(player);
}

}

int main(int argc, char** argv)
{
    gst_init(&argc, &argv);
    bench::Engines engines;
    const std::string folder = engines.model.getRecordingsDirectory();
    const std::string file = folder + "/Bench.m4a";
    ecore_file_mkpath(folder.c_str());
    runPipeline("audiotestsrc num-buffers=2600 samplesperbuffer=1024 ! audio/x-raw,rate=44100,channels=2 ! voaacenc "
                "bitrate=288000 ! mp4mux ! filesink location="
        + file);
    media_info_h media = nullptr;
    if (media_info_insert_to_db(file.c_str(), &media) != 0)
        return 1;
    media_info_destroy(media);
    engines.model.setCurrentPlayPath(file);
    for (int i = 0; i < ROUNDS; ++i) {
        const double own = ownStart(engines);
        std::printf("%.2f %.2f\n", own, bareStart(file));
    }
    seekBurst(file);
    return 0;
}
