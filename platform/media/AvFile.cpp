#include "media/AvFile.h"

#include <cerrno>

namespace media {

namespace {

    constexpr auto KINDS = "mov,mp3,ogg,flac,wav,aac,amr,matroska";

}

int errorOf(int code)
{
    switch (code) {
    case AVERROR_INVALIDDATA:
    case AVERROR_EOF:
        return EBADMSG;
    case AVERROR_DEMUXER_NOT_FOUND:
    case AVERROR_DECODER_NOT_FOUND:
    case AVERROR_MUXER_NOT_FOUND:
    case AVERROR_PATCHWELCOME:
        return ENOTSUP;
    default:
        return code < 0 && code > -4096 ? AVUNERROR(code) : code < 0 ? EBADMSG : 0;
    }
}

AvInput openSound(const std::string& path, int& error)
{
    av_log_set_level(AV_LOG_QUIET);
    AVDictionary* options = nullptr;
    av_dict_set(&options, "protocol_whitelist", "file", 0);
    av_dict_set(&options, "format_whitelist", KINDS, 0);
    AVFormatContext* context = nullptr;
    int code = avformat_open_input(&context, ("file:" + path).c_str(), nullptr, &options);
    av_dict_free(&options);
    AvInput input(context);
    if (code >= 0)
        code = avformat_find_stream_info(input.get(), nullptr);
    error = code >= 0 ? 0 : errorOf(code);
    if (code < 0)
        return nullptr;
    if (soundOf(input.get()) == nullptr) {
        error = ENOTSUP;
        return nullptr;
    }
    return input;
}

AVStream* soundOf(AVFormatContext* input)
{
    const int index = av_find_best_stream(input, AVMEDIA_TYPE_AUDIO, -1, -1, nullptr, 0);
    return index >= 0 ? input->streams[index] : nullptr;
}

AvCodec decoderOf(const AVStream* stream)
{
    const AVCodec* codec = avcodec_find_decoder(stream->codecpar->codec_id);
    AvCodec context(codec != nullptr ? avcodec_alloc_context3(codec) : nullptr);
    if (!context || avcodec_parameters_to_context(context.get(), stream->codecpar) < 0)
        return nullptr;
    context->thread_count = 1;
    context->pkt_timebase = stream->time_base;
    return avcodec_open2(context.get(), codec, nullptr) >= 0 ? std::move(context) : nullptr;
}

}
