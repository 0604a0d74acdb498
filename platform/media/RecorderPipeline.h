#pragma once

#include "media/StepThread.h"

#include <gst/gst.h>
#include <recorder.h>

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <utility>

namespace media {

// Hears what the pipeline captures and encodes. Called on threads of the pipeline; must neither wait nor call it.
class CaptureListener {
public:
    virtual ~CaptureListener() = default;
    // Sound from the microphone; answers how many of the samples are to be recorded (from the front).
    virtual size_t onCaptured(const int16_t* samples, size_t count) = 0;
    virtual void onFrame(const void* frame, size_t size) = 0;
    // Everything captured has been encoded.
    virtual void onDrained() = 0;
    virtual void onFailed(const char* reason) = 0;
};

struct RecorderFormat {
    bool isAac = true;
    int sampleRate = RECORDER_AAC_SAMPLE_RATE;
    int bitRate = RECORDER_AAC_BIT_RATE;
    int channels = 2; // of the encoded sound; the microphone is one channel

    // The encoder works ahead by that many samples.
    [[nodiscard]] uint64_t lookAhead() const { return isAac ? 1600 : 40; }
    [[nodiscard]] uint64_t frameSamples() const { return isAac ? 1024 : 160; }
};

// Microphone, queue and encoder. The sound is re-stamped to an unbroken time line at the queue, so a pause leaves no
// gap; encoded frames go to the listener and nowhere else. One caller at a time; nothing here waits for the main loop.
// What talks to the sound server runs in a thread of its own, step after step: a server that hangs holds that thread
// and nobody else, and what hangs at the end goes on by itself.
class RecorderPipeline {
public:
    // Opens the microphone's server; none when that fails or takes longer than the limit. MEWLO_AUDIO_SOURCE names
    // another source than the sound server, in the notation of gst-launch.
    static std::unique_ptr<RecorderPipeline> create(const RecorderFormat& format, std::chrono::milliseconds limit);
    ~RecorderPipeline();
    RecorderPipeline(const RecorderPipeline&) = delete;
    RecorderPipeline& operator=(const RecorderPipeline&) = delete;

    // Before the first play(). Kept until the pipeline's threads have ended, which may be after the pipeline.
    void setListener(std::shared_ptr<CaptureListener> listener);
    // Begins in a moment; the listener hears of a failure.
    void play();
    // Stops capturing, in a moment, and gives the microphone free for others; what is captured is still encoded.
    void pause();
    // Encodes the rest, in any state; onDrained() follows. Nothing is captured afterwards.
    void drain();
    // Seconds of sound waiting for the encoder: a storage that does not keep up, not a silent microphone.
    [[nodiscard]] double backlog() const;
    // The server's name of the microphone in use; empty when unknown.
    [[nodiscard]] std::string microphone() const;

private:
    class Chain;
    RecorderPipeline();

    const std::shared_ptr<StepThread> _steps;
    std::shared_ptr<Chain> _chain;
};

// The elements behind a pipeline.
class RecorderPipeline::Chain {
public:
    explicit Chain(const RecorderFormat& format);
    ~Chain();
    Chain(const Chain&) = delete;
    Chain& operator=(const Chain&) = delete;

    bool open();
    void change(GstState state);
    void drain();
    [[nodiscard]] double backlog() const;
    [[nodiscard]] std::string microphone() const;
    void setListener(std::shared_ptr<CaptureListener> listener) { _listener = std::move(listener); }

private:
    bool _build();
    void _watch();
    void _pushSilence(GstPad* pad);
    GstPadProbeReturn _capture(GstPadProbeInfo* info);

    static GstPadProbeReturn _captureCb(GstPad* pad, GstPadProbeInfo* info, gpointer self);
    static GstPadProbeReturn _encoderInputCb(GstPad* pad, GstPadProbeInfo* info, gpointer self);
    static GstPadProbeReturn _encoderOutputCb(GstPad* pad, GstPadProbeInfo* info, gpointer self);
    static GstBusSyncReply _messageCb(GstBus* bus, GstMessage* message, gpointer self);

    RecorderFormat _format;
    std::shared_ptr<CaptureListener> _listener;
    GstElement* _pipeline = nullptr;
    GstElement* _queue = nullptr;
    uint64_t _samples = 0; // on the time line; streaming thread
};

// Prepares GStreamer once per process; answers false when it cannot be used. Any thread.
bool isGStreamerReady();

}
