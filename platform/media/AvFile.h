#pragma once

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

#include <memory>
#include <string>

namespace media {

template <auto Free>
struct AvFree {
    template <typename T>
    void operator()(T* pointer) const
    {
        Free(&pointer);
    }
};
using AvInput = std::unique_ptr<AVFormatContext, AvFree<avformat_close_input>>;
using AvPacket = std::unique_ptr<AVPacket, AvFree<av_packet_free>>;
using AvFrame = std::unique_ptr<AVFrame, AvFree<av_frame_free>>;
using AvCodec = std::unique_ptr<AVCodecContext, AvFree<avcodec_free_context>>;

// Opens a plain file of one of the kinds of sound that we know, whatever its name says, and nothing that it may refer
// to. Null with the system's error number: ENOTSUP for another kind, EBADMSG for damage.
AvInput openSound(const std::string& path, int& error);
// Its first track of sound; null when there is none.
AVStream* soundOf(AVFormatContext* input);
// A decoder of the track, on one thread; null when there is none.
AvCodec decoderOf(const AVStream* stream);
// The system's number of one of the library's.
int errorOf(int code);

}
