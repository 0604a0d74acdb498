#include "media/PlayerPipeline.h"

#include "media/FileDescriptor.h"
#include "media/FileDuration.h"
#include "media/RecorderPipeline.h"
#include "state/Log.h"

#include <fcntl.h>

#include <chrono>
#include <utility>
#include <vector>

namespace media {

namespace {

    constexpr auto FILE_SOURCE = "filesrc name=file ! ";
    // The sink follows the system's clock: its own stands still for good when a stream is paused soon after its start.
    constexpr auto SPEAKER
        = " ! audioconvert ! audioresample ! "
          "pulsesink name=speaker client-name=Mewlo provide-clock=false stream-properties=props,media.role=music";
    constexpr auto AAC_CHAIN = "qtdemux ! aacparse ! avdec_aac";
    constexpr auto ANY_DECODER = "decodebin";
    constexpr GstClockTime PREROLL = 40 * GST_MSECOND; // that somebody waits for
    constexpr double PATIENCE = 3; // seconds for what goes on by itself
    constexpr auto STEP = std::chrono::milliseconds(20);
    constexpr auto TEAR_DOWN = std::chrono::milliseconds(30);

    // The explicit chain steps over a damaged stretch and is there in a fraction of the time.
    std::vector<std::string> chainsFor(const std::string& path)
    {
        const FileDescriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
        switch (file ? kindOf(file.get()) : FileKind::UNKNOWN) {
        case FileKind::MP4:
            // Other codecs in a sound file may still play; the decoder's choice takes seconds to give up on a damaged
            // one.
            if (!durationOf(file.get()))
                return {AAC_CHAIN};
            return {AAC_CHAIN, ANY_DECODER};
        case FileKind::AMR:
            return {"amrparse ! amrnbdec"};
        case FileKind::AMR_WIDE:
        case FileKind::ADTS:
        case FileKind::UNKNOWN:
            break;
        }
        return {ANY_DECODER};
    }

    int milliseconds(gint64 value) { return static_cast<int>(value / GST_MSECOND); }

    std::string textOf(GstMessage* message)
    {
        GError* error = nullptr;
        gst_message_parse_error(message, &error, nullptr);
        const std::string text = error->message;
        g_error_free(error);
        return text;
    }

}

// Not at once to the end: a decoder may still be asking the sink, which then has lost its connection.
struct PlayerPipeline::Elements {
    Elements() = default;
    ~Elements()
    {
        if (pipeline != nullptr) {
            gst_element_set_state(pipeline, GST_STATE_READY);
            gst_element_set_state(pipeline, GST_STATE_NULL);
        }
        g_clear_object(&bus);
        g_clear_object(&sink);
        g_clear_object(&pipeline);
    }
    Elements(const Elements&) = delete;
    Elements& operator=(const Elements&) = delete;

    GstElement* pipeline = nullptr;
    GstElement* sink = nullptr;
    GstBus* bus = nullptr;
};

PlayerPipeline::PlayerPipeline()
    : _steps(StepThread::create())
    , _elements(std::make_shared<Elements>())
{
}

std::unique_ptr<PlayerPipeline> PlayerPipeline::open(const std::string& path, const Events& events, Opened& opened)
{
    opened = Opened::UNREADABLE;
    if (!isGStreamerReady())
        return nullptr;
    for (const auto& chain : chainsFor(path)) {
        std::unique_ptr<PlayerPipeline> self(new PlayerPipeline);
        self->_events = std::make_shared<const Events>(events);
        opened = self->_build(FILE_SOURCE + chain + SPEAKER, path) ? self->_preroll() : Opened::UNREADABLE;
        if (opened == Opened::OK) {
            self->_listen();
            return self;
        }
        if (opened == Opened::NO_SOUND)
            break;
    }
    return nullptr;
}

bool PlayerPipeline::_build(const std::string& description, const std::string& path)
{
    GstElement* pipeline = gst_parse_launch_full(description.c_str(), nullptr, GST_PARSE_FLAG_FATAL_ERRORS, nullptr);
    if (pipeline == nullptr)
        return false;
    _elements->pipeline = pipeline;
    _elements->bus = gst_element_get_bus(pipeline);
    _elements->sink = gst_bin_get_by_name(GST_BIN(pipeline), "speaker");
    GstElement* file = gst_bin_get_by_name(GST_BIN(pipeline), "file");
    g_object_set(file, "location", path.c_str(), nullptr);
    gst_object_unref(file);
    return true;
}

PlayerPipeline::Opened PlayerPipeline::_preroll()
{
    _steps->add([elements = _elements] { gst_element_set_state(elements->pipeline, GST_STATE_PAUSED); });
    constexpr auto WANTED = static_cast<GstMessageType>(GST_MESSAGE_ERROR | GST_MESSAGE_ASYNC_DONE | GST_MESSAGE_EOS);
    GstMessage* message = gst_bus_timed_pop_filtered(_elements->bus, PREROLL, WANTED);
    if (message == nullptr) {
        _patience = ecore_timer_add(PATIENCE, _patienceCb, this);
        return Opened::OK;
    }
    Opened opened = Opened::OK;
    if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_ERROR) {
        PLATFORM_LOGW("cannot play: %s", textOf(message).c_str());
        opened = _isFromSink(message) ? Opened::NO_SOUND : Opened::UNREADABLE;
    } else if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_EOS) {
        opened = Opened::UNREADABLE; // not one sample in it
    }
    gst_message_unref(message);
    return opened;
}

void PlayerPipeline::_listen()
{
    GPollFD poll;
    gst_bus_get_pollfd(_elements->bus, &poll);
    _handler = ecore_main_fd_handler_add(poll.fd, ECORE_FD_READ, _busCb, this, nullptr, nullptr);
}

PlayerPipeline::~PlayerPipeline()
{
    *_isAlive = false;
    if (_handler != nullptr)
        ecore_main_fd_handler_del(_handler);
    if (_patience != nullptr)
        ecore_timer_del(_patience);
    _steps->add([elements = std::move(_elements)]() mutable { elements.reset(); });
    _steps->finish();
    (void)_steps->wait(TEAR_DOWN);
}

void PlayerPipeline::_change(GstState state)
{
    _steps->add([elements = _elements, state] { gst_element_set_state(elements->pipeline, state); });
    (void)_steps->wait(STEP);
}

// A change that fails is told by the element that it failed in.
bool PlayerPipeline::play()
{
    _change(GST_STATE_PLAYING);
    return true;
}

bool PlayerPipeline::pause()
{
    _change(GST_STATE_PAUSED);
    return true;
}

bool PlayerPipeline::seek(int position, bool isAccurate)
{
    if (_patience == nullptr)
        return _send(position, isAccurate);
    _waitingSeek = {position, isAccurate};
    return true;
}

bool PlayerPipeline::_send(int position, bool isAccurate) const
{
    const int flags = GST_SEEK_FLAG_FLUSH | (isAccurate ? GST_SEEK_FLAG_ACCURATE : GST_SEEK_FLAG_KEY_UNIT);
    return gst_element_seek_simple(_elements->pipeline, GST_FORMAT_TIME, static_cast<GstSeekFlags>(flags),
               position * static_cast<gint64>(GST_MSECOND))
        == TRUE;
}

// What took its time is there.
void PlayerPipeline::_opened()
{
    ecore_timer_del(std::exchange(_patience, nullptr));
    if (const auto waiting = std::exchange(_waitingSeek, std::nullopt))
        _send(waiting->first, waiting->second);
}

void PlayerPipeline::_giveUp()
{
    if (_patience != nullptr)
        ecore_timer_del(std::exchange(_patience, nullptr));
    if (!std::exchange(_isFailed, true)) {
        PLATFORM_LOGE("playback failed: the file does not come to its first sound");
        _events->failed(false, "no sound");
    }
}

Eina_Bool PlayerPipeline::_patienceCb(void* data)
{
    auto* self = static_cast<PlayerPipeline*>(data);
    const auto events = self->_events; // the call may destroy the pipeline
    self->_patience = nullptr; // goes by itself
    self->_giveUp();
    return ECORE_CALLBACK_CANCEL;
}

int PlayerPipeline::position() const
{
    gint64 value = 0;
    return gst_element_query_position(_elements->pipeline, GST_FORMAT_TIME, &value) == TRUE ? milliseconds(value) : -1;
}

int PlayerPipeline::duration() const
{
    gint64 value = 0;
    const bool isKnown = gst_element_query_duration(_elements->pipeline, GST_FORMAT_TIME, &value) == TRUE && value > 0;
    return isKnown ? milliseconds(value) : -1;
}

bool PlayerPipeline::_isFromSink(GstMessage* message) const
{
    return GST_MESSAGE_SRC(message) == GST_OBJECT(_elements->sink);
}

void PlayerPipeline::_handleError(GstMessage* message)
{
    if (std::exchange(_isFailed, true))
        return;
    const std::string reason = textOf(message);
    PLATFORM_LOGE("playback failed: %s", reason.c_str());
    _events->failed(_isFromSink(message), reason);
}

void PlayerPipeline::_handleRequest(GstMessage* message) const
{
    GstState wanted = GST_STATE_VOID_PENDING;
    gst_message_parse_request_state(message, &wanted);
    if (wanted == GST_STATE_PAUSED || wanted == GST_STATE_PLAYING)
        _events->requested(wanted == GST_STATE_PAUSED);
}

void PlayerPipeline::_handle(GstMessage* message)
{
    const GstMessageType type = GST_MESSAGE_TYPE(message);
    if (type == GST_MESSAGE_EOS && _patience != nullptr)
        _giveUp(); // not one sample in it
    else if (type == GST_MESSAGE_EOS)
        _events->ended();
    else if (type == GST_MESSAGE_ASYNC_DONE && _patience != nullptr)
        _opened();
    else if (type == GST_MESSAGE_ASYNC_DONE)
        _events->seekDone();
    else if (type == GST_MESSAGE_REQUEST_STATE)
        _handleRequest(message);
    else if (type == GST_MESSAGE_ERROR)
        _handleError(message);
}

Eina_Bool PlayerPipeline::_busCb(void* data, Ecore_Fd_Handler*)
{
    auto* self = static_cast<PlayerPipeline*>(data);
    const auto isAlive = self->_isAlive;
    const auto events = self->_events;
    while (*isAlive) {
        GstMessage* message = gst_bus_pop(self->_elements->bus);
        if (message == nullptr)
            break;
        self->_handle(message);
        gst_message_unref(message);
    }
    return ECORE_CALLBACK_RENEW;
}

}
