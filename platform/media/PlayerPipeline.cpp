#include "media/PlayerPipeline.h"

#include "media/FileDescriptor.h"
#include "media/FileDuration.h"
#include "media/RecorderPipeline.h"
#include "state/Log.h"

#include <fcntl.h>

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
    constexpr GstClockTime PREROLL = 3 * GST_SECOND;

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
    _pipeline = gst_parse_launch_full(description.c_str(), nullptr, GST_PARSE_FLAG_FATAL_ERRORS, nullptr);
    if (_pipeline == nullptr)
        return false;
    _bus = gst_element_get_bus(_pipeline);
    _sink = gst_bin_get_by_name(GST_BIN(_pipeline), "speaker");
    GstElement* file = gst_bin_get_by_name(GST_BIN(_pipeline), "file");
    g_object_set(file, "location", path.c_str(), nullptr);
    gst_object_unref(file);
    return true;
}

PlayerPipeline::Opened PlayerPipeline::_preroll()
{
    gst_element_set_state(_pipeline, GST_STATE_PAUSED);
    constexpr auto WANTED = static_cast<GstMessageType>(GST_MESSAGE_ERROR | GST_MESSAGE_ASYNC_DONE | GST_MESSAGE_EOS);
    GstMessage* message = gst_bus_timed_pop_filtered(_bus, PREROLL, WANTED);
    if (message == nullptr)
        return Opened::UNREADABLE;
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
    gst_bus_get_pollfd(_bus, &poll);
    _handler = ecore_main_fd_handler_add(poll.fd, ECORE_FD_READ, _busCb, this, nullptr, nullptr);
}

PlayerPipeline::~PlayerPipeline()
{
    *_isAlive = false;
    if (_handler != nullptr)
        ecore_main_fd_handler_del(_handler);
    // Not at once to the end: a decoder may still be asking the sink, which then has lost its connection.
    if (_pipeline != nullptr) {
        gst_element_set_state(_pipeline, GST_STATE_READY);
        gst_element_set_state(_pipeline, GST_STATE_NULL);
    }
    g_clear_object(&_bus);
    g_clear_object(&_sink);
    g_clear_object(&_pipeline);
}

bool PlayerPipeline::play() { return gst_element_set_state(_pipeline, GST_STATE_PLAYING) != GST_STATE_CHANGE_FAILURE; }

bool PlayerPipeline::pause() { return gst_element_set_state(_pipeline, GST_STATE_PAUSED) != GST_STATE_CHANGE_FAILURE; }

bool PlayerPipeline::seek(int position, bool isAccurate)
{
    const int flags = GST_SEEK_FLAG_FLUSH | (isAccurate ? GST_SEEK_FLAG_ACCURATE : GST_SEEK_FLAG_KEY_UNIT);
    return gst_element_seek_simple(_pipeline, GST_FORMAT_TIME, static_cast<GstSeekFlags>(flags),
               position * static_cast<gint64>(GST_MSECOND))
        == TRUE;
}

int PlayerPipeline::position() const
{
    gint64 value = 0;
    return gst_element_query_position(_pipeline, GST_FORMAT_TIME, &value) == TRUE ? milliseconds(value) : -1;
}

int PlayerPipeline::duration() const
{
    gint64 value = 0;
    const bool isKnown = gst_element_query_duration(_pipeline, GST_FORMAT_TIME, &value) == TRUE && value > 0;
    return isKnown ? milliseconds(value) : -1;
}

bool PlayerPipeline::_isFromSink(GstMessage* message) const { return GST_MESSAGE_SRC(message) == GST_OBJECT(_sink); }

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
    if (type == GST_MESSAGE_EOS)
        _events->ended();
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
        GstMessage* message = gst_bus_pop(self->_bus);
        if (message == nullptr)
            break;
        self->_handle(message);
        gst_message_unref(message);
    }
    return ECORE_CALLBACK_RENEW;
}

}
