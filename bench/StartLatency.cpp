// Prints, in milliseconds, pairs of: START_RECORDING to the first captured sample, and the bare pipeline's own start to
// its first sample, alternating in one run.
#include <gst/gst.h>

#include <atomic>
#include <cstdio>
#include <thread>

#include "bench/Engines.h"

namespace {

constexpr int ROUNDS = 25;

GstPadProbeReturn firstSampleCb(GstPad*, GstPadProbeInfo*, gpointer arrived)
{
    static_cast<std::atomic<bool>*>(arrived)->store(true);
    return GST_PAD_PROBE_OK;
}

double bareStart(const char* file)
{
    std::atomic<bool> arrived = false;
    const double begin = bench::milliseconds();
    gchar* description = g_strdup_printf(
        "pulsesrc ! audio/x-raw,format=S16LE,rate=44100,channels=1,layout=interleaved ! level name=level "
        "interval=20000000 ! queue "
        "! audioconvert ! audio/x-raw,channels=2 ! voaacenc bitrate=288000 ! aacparse ! mp4mux ! filesink location=%s "
        "buffer-mode=unbuffered async=false",
        file);
    GstElement* pipeline = gst_parse_launch(description, nullptr);
    g_free(description);
    GstElement* level = gst_bin_get_by_name(GST_BIN(pipeline), "level");
    GstPad* pad = gst_element_get_static_pad(level, "sink");
    gst_pad_add_probe(pad, GST_PAD_PROBE_TYPE_BUFFER, firstSampleCb, &arrived, nullptr);
    gst_element_set_state(pipeline, GST_STATE_PLAYING);
    while (!arrived && bench::milliseconds() - begin < 5000)
        std::this_thread::sleep_for(std::chrono::microseconds(100));
    const double taken = bench::milliseconds() - begin;
    gst_object_unref(pad);
    gst_object_unref(level);
    gst_element_set_state(pipeline, GST_STATE_NULL);
    gst_object_unref(pipeline);
    return taken;
}

double ownStart(bench::Engines& engines)
{
    const double begin = bench::milliseconds();
    if (!engines.controller.dispatchCommand(MwAppController::START_RECORDING))
        return -1;
    const double taken = bench::milliseconds() - begin;
    engines.controller.dispatchCommand(MwAppController::CANCEL_RECORDING);
    return taken;
}

}

int main(int argc, char** argv)
{
    gst_init(&argc, &argv);
    if (argc < 2)
        return 2;
    bench::Engines engines;
    for (int i = 0; i < ROUNDS; ++i) {
        const double own = ownStart(engines);
        std::printf("%.2f %.2f\n", own, bareStart(argv[1]));
    }
    return 0;
}
