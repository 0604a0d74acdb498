#include "media/RecorderPipeline.h"

#include "state/Log.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <cstdlib>

namespace media {

namespace {

    // Ten seconds bridge a storage that stalls.
    constexpr auto QUEUE = "queue name=queue max-size-time=10000000000 max-size-bytes=0 max-size-buffers=0";
    constexpr auto TEAR_DOWN = std::chrono::milliseconds(30);
    constexpr auto SOUND_SERVER
        = "pulsesrc name=microphone client-name=Mewlo stream-properties=props,media.role=production";
    constexpr auto CONVERTER = " ! audioconvert ! audioresample";
    constexpr auto SINK = "fakesink async=false sync=false";
    constexpr int AAC_MOST_BITS = 320000;

    std::string encoderOf(const RecorderFormat& format)
    {
        if (!format.isAac) {
            constexpr std::array MODES = {4750, 5150, 5900, 6700, 7400, 7950, 10200, 12200};
            const auto* above = std::upper_bound(MODES.begin() + 1, MODES.end(), format.bitRate);
            return "amrnbenc name=encoder band-mode=" + std::to_string(above - MODES.begin() - 1);
        }
        // The standard's own bound is 6 bits a sample and channel; the encoder drops far below when asked for more.
        const int most = std::min(AAC_MOST_BITS, 6 * format.sampleRate * format.channels);
        return "audioconvert ! audio/x-raw,channels=" + std::to_string(format.channels)
            + " ! voaacenc name=encoder bitrate=" + std::to_string(std::clamp(format.bitRate, 8000, most))
            + " ! audio/mpeg,stream-format=raw";
    }

    std::string description(const RecorderFormat& format)
    {
        const char* other = getenv("MEWLO_AUDIO_SOURCE");
        const bool isOther = other != nullptr && *other != '\0';
        return (isOther ? other + std::string(CONVERTER) : std::string(SOUND_SERVER))
            + " ! audio/x-raw,format=S16LE,layout=interleaved,channels=1,rate=" + std::to_string(format.sampleRate)
            + " ! " + QUEUE + " ! identity name=input silent=true ! " + encoderOf(format) + " ! " + SINK;
    }

    // Adds a probe to a pad of a named element.
    bool addProbe(GstElement* pipeline, const char* element, const char* padName, int type,
        GstPadProbeCallback callback, gpointer data)
    {
        GstElement* owner = gst_bin_get_by_name(GST_BIN(pipeline), element);
        GstPad* pad = owner != nullptr ? gst_element_get_static_pad(owner, padName) : nullptr;
        const bool added = pad != nullptr
            && gst_pad_add_probe(pad, static_cast<GstPadProbeType>(type), callback, data, nullptr) != 0;
        g_clear_object(&pad);
        g_clear_object(&owner);
        return added;
    }

    bool isEnd(GstPadProbeInfo* info)
    {
        return (GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM) != 0
            && GST_EVENT_TYPE(GST_PAD_PROBE_INFO_EVENT(info)) == GST_EVENT_EOS;
    }

}

bool isGStreamerReady()
{
    static const bool ready = gst_init_check(nullptr, nullptr, nullptr) == TRUE;
    return ready;
}

RecorderPipeline::RecorderPipeline()
    : _steps(StepThread::create())
{
}

std::unique_ptr<RecorderPipeline> RecorderPipeline::create(
    const RecorderFormat& format, std::chrono::milliseconds limit)
{
    if (!isGStreamerReady())
        return nullptr;
    std::unique_ptr<RecorderPipeline> self(new RecorderPipeline);
    self->_chain = std::make_shared<Chain>(format);
    const auto isOpen = std::make_shared<std::atomic<bool>>(false);
    self->_steps->add([chain = self->_chain, isOpen] { *isOpen = chain->open(); });
    if (!self->_steps->wait(limit))
        PLATFORM_LOGE("the sound server does not answer");
    return *isOpen ? std::move(self) : nullptr;
}

// In the ordinary case the microphone is free when this returns.
RecorderPipeline::~RecorderPipeline()
{
    _steps->add([chain = std::exchange(_chain, nullptr)] { chain->change(GST_STATE_NULL); });
    _steps->finish();
    (void)_steps->wait(TEAR_DOWN);
}

void RecorderPipeline::setListener(std::shared_ptr<CaptureListener> listener)
{
    _chain->setListener(std::move(listener));
}

void RecorderPipeline::play()
{
    _steps->add([chain = _chain] { chain->change(GST_STATE_PLAYING); });
}

void RecorderPipeline::pause()
{
    _steps->add([chain = _chain] { chain->change(GST_STATE_PAUSED); });
}

void RecorderPipeline::drain() { _chain->drain(); }

double RecorderPipeline::backlog() const { return _chain->backlog(); }

std::string RecorderPipeline::microphone() const { return _chain->microphone(); }

RecorderPipeline::Chain::Chain(const RecorderFormat& format)
    : _format(format)
{
}

bool RecorderPipeline::Chain::open()
{
    return _build() && gst_element_set_state(_pipeline, GST_STATE_READY) != GST_STATE_CHANGE_FAILURE;
}

void RecorderPipeline::Chain::change(GstState state)
{
    if (_pipeline != nullptr && gst_element_set_state(_pipeline, state) == GST_STATE_CHANGE_FAILURE && _listener)
        _listener->onFailed("the state cannot be changed");
}

bool RecorderPipeline::Chain::_build()
{
    GError* error = nullptr;
    _pipeline = gst_parse_launch_full(description(_format).c_str(), nullptr, GST_PARSE_FLAG_FATAL_ERRORS, &error);
    if (_pipeline == nullptr) {
        PLATFORM_LOGE("no recording pipeline: %s", error != nullptr ? error->message : "unknown");
        g_clear_error(&error);
        return false;
    }
    _queue = gst_bin_get_by_name(GST_BIN(_pipeline), "queue");
    _watch();
    return addProbe(_pipeline, "queue", "sink", GST_PAD_PROBE_TYPE_BUFFER, _captureCb, this)
        && addProbe(_pipeline, "input", "sink", GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM, _encoderInputCb, this)
        && addProbe(_pipeline, "encoder", "src", GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM,
            _encoderOutputCb, this);
}

// Messages are taken where they arise: nobody has to empty a queue of them.
void RecorderPipeline::Chain::_watch()
{
    GstBus* bus = gst_element_get_bus(_pipeline);
    gst_bus_set_sync_handler(bus, _messageCb, this, nullptr);
    gst_object_unref(bus);
}

RecorderPipeline::Chain::~Chain()
{
    if (_pipeline == nullptr)
        return;
    gst_element_set_state(_pipeline, GST_STATE_NULL);
    GstBus* bus = gst_element_get_bus(_pipeline);
    gst_bus_set_sync_handler(bus, nullptr, nullptr, nullptr);
    gst_object_unref(bus);
    g_clear_object(&_queue);
    g_clear_object(&_pipeline);
}

void RecorderPipeline::Chain::drain()
{
    // Sent into the queue rather than to the source: works while paused, and its lock puts it behind the last buffer.
    GstPad* pad = gst_element_get_static_pad(_queue, "sink");
    gst_pad_send_event(pad, gst_event_new_eos());
    gst_object_unref(pad);
}

std::string RecorderPipeline::Chain::microphone() const
{
    GstElement* source = gst_bin_get_by_name(GST_BIN(_pipeline), "microphone");
    if (source == nullptr)
        return {};
    gchar* device = nullptr;
    g_object_get(source, "current-device", &device, nullptr);
    gst_object_unref(source);
    std::string name = device != nullptr ? device : "";
    g_free(device);
    return name;
}

double RecorderPipeline::Chain::backlog() const
{
    guint64 waiting = 0;
    g_object_get(_queue, "current-level-time", &waiting, nullptr);
    return static_cast<double>(waiting) / GST_SECOND;
}

GstPadProbeReturn RecorderPipeline::Chain::_capture(GstPadProbeInfo* info)
{
    GstBuffer* buffer = gst_buffer_make_writable(GST_PAD_PROBE_INFO_BUFFER(info));
    GST_PAD_PROBE_INFO_DATA(info) = buffer;
    GstMapInfo map;
    if (!_listener || !gst_buffer_map(buffer, &map, GST_MAP_READ))
        return GST_PAD_PROBE_DROP;
    const size_t count = map.size / sizeof(int16_t);
    const size_t taken = _listener->onCaptured(reinterpret_cast<const int16_t*>(map.data), count);
    gst_buffer_unmap(buffer, &map);
    if (taken == 0)
        return GST_PAD_PROBE_DROP;
    if (taken < count)
        gst_buffer_resize(buffer, 0, static_cast<gssize>(taken * sizeof(int16_t)));
    GST_BUFFER_PTS(buffer) = gst_util_uint64_scale(_samples, GST_SECOND, static_cast<guint64>(_format.sampleRate));
    GST_BUFFER_DURATION(buffer) = gst_util_uint64_scale(taken, GST_SECOND, static_cast<guint64>(_format.sampleRate));
    GST_BUFFER_OFFSET(buffer) = _samples;
    GST_BUFFER_OFFSET_END(buffer) = _samples + taken;
    if (_samples > 0)
        GST_BUFFER_FLAG_UNSET(buffer, GST_BUFFER_FLAG_DISCONT);
    _samples += taken;
    return GST_PAD_PROBE_OK;
}

// The encoder forgets what it looked ahead at when the stream ends; silence pushes the last sound out.
void RecorderPipeline::Chain::_pushSilence(GstPad* pad)
{
    if (_samples == 0)
        return;
    const size_t samples = _format.lookAhead() + 2 * _format.frameSamples();
    GstBuffer* silence = gst_buffer_new_allocate(nullptr, samples * sizeof(int16_t), nullptr);
    gst_buffer_memset(silence, 0, 0, samples * sizeof(int16_t));
    const auto rate = static_cast<guint64>(_format.sampleRate);
    GST_BUFFER_PTS(silence) = gst_util_uint64_scale(_samples, GST_SECOND, rate);
    GST_BUFFER_DURATION(silence) = gst_util_uint64_scale(samples, GST_SECOND, rate);
    (void)gst_pad_chain(pad, silence);
}

GstPadProbeReturn RecorderPipeline::Chain::_captureCb(GstPad*, GstPadProbeInfo* info, gpointer self)
{
    return static_cast<Chain*>(self)->_capture(info);
}

GstPadProbeReturn RecorderPipeline::Chain::_encoderInputCb(GstPad* pad, GstPadProbeInfo* info, gpointer self)
{
    if (isEnd(info))
        static_cast<Chain*>(self)->_pushSilence(pad);
    return GST_PAD_PROBE_OK;
}

// Takes every frame and the end away from the sink, which would wait for the playing state.
GstPadProbeReturn RecorderPipeline::Chain::_encoderOutputCb(GstPad*, GstPadProbeInfo* info, gpointer self)
{
    const auto& listener = static_cast<Chain*>(self)->_listener;
    if (!listener)
        return GST_PAD_PROBE_DROP;
    if (isEnd(info)) {
        listener->onDrained();
        return GST_PAD_PROBE_DROP;
    }
    if ((GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) == 0)
        return GST_PAD_PROBE_OK;
    GstMapInfo map;
    if (gst_buffer_map(GST_PAD_PROBE_INFO_BUFFER(info), &map, GST_MAP_READ)) {
        listener->onFrame(map.data, map.size);
        gst_buffer_unmap(GST_PAD_PROBE_INFO_BUFFER(info), &map);
    }
    return GST_PAD_PROBE_DROP;
}

GstBusSyncReply RecorderPipeline::Chain::_messageCb(GstBus*, GstMessage* message, gpointer self)
{
    if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_ERROR) {
        GError* error = nullptr;
        gst_message_parse_error(message, &error, nullptr);
        if (const auto& listener = static_cast<Chain*>(self)->_listener; listener)
            listener->onFailed(error->message);
        else
            PLATFORM_LOGE("no microphone: %s", error->message);
        g_error_free(error);
    }
    gst_message_unref(message);
    return GST_BUS_DROP;
}

}
