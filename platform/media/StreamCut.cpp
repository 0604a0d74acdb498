#include "media/StreamCut.h"

extern "C" {
#include <libavutil/audio_fifo.h>
}

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <utility>
#include <vector>

namespace media {

namespace {

    constexpr AVRational MILLISECONDS{1, 1000};

    struct Container {
        const char* input; // how the library names what it has read
        const char* output;
    };
    constexpr std::array<Container, 7> CONTAINERS = {{
        {.input = "mov,mp4,m4a,3gp,3g2,mj2", .output = "ipod"},
        {.input = "mp3", .output = "mp3"},
        {.input = "ogg", .output = "ogg"},
        {.input = "flac", .output = "flac"},
        {.input = "wav", .output = "wav"},
        {.input = "aac", .output = "adts"},
        {.input = "matroska,webm", .output = "matroska"},
    }};

    // A file that is open already, so that it stays the same one whatever happens to its name.
    std::string pathOf(int descriptor) { return "/proc/self/fd/" + std::to_string(descriptor); }

    bool isPcm(AVCodecID codec) { return codec >= AV_CODEC_ID_FIRST_AUDIO && codec < AV_CODEC_ID_ADPCM_IMA_QT; }

    // Samples before the first heard one that its decoder wants to see.
    int64_t prerollOf(const AVCodecParameters* parameters)
    {
        switch (parameters->codec_id) {
        case AV_CODEC_ID_OPUS:
            return parameters->initial_padding;
        case AV_CODEC_ID_MP3:
        case AV_CODEC_ID_AAC:
        case AV_CODEC_ID_VORBIS:
            return std::max(parameters->frame_size, 1024);
        default:
            return 0;
        }
    }

    struct FreeOutput {
        void operator()(AVFormatContext* context) const
        {
            avio_closep(&context->pb);
            avformat_free_context(context);
        }
    };
    struct FreeFifo {
        void operator()(AVAudioFifo* fifo) const { av_audio_fifo_free(fifo); }
    };

}

// One export on its way.
struct StreamCut::Output {
    AvInput input;
    AVStream* from = nullptr;
    std::unique_ptr<AVFormatContext, FreeOutput> context;
    AVStream* to = nullptr;
    std::vector<int> streams; // of the input, by number: which one of the output, or -1
    int64_t begin = 0; // in units of the input's track
    int64_t end = 0;
    bool hasHead = false;
    AvCodec encoder;
};

StreamCut::StreamCut(FileDescriptor source, const char* container, AVCodecID codec)
    : SoundCut(std::move(source))
    , _container(container)
    , _codec(codec)
{
}

std::unique_ptr<SoundCut> StreamCut::open(FileDescriptor source, int& error)
{
    const AvInput input = openSound(pathOf(source.get()), error);
    if (!input)
        return nullptr;
    const auto* found = std::find_if(CONTAINERS.begin(), CONTAINERS.end(),
        [&](const Container& each) { return std::strcmp(each.input, input->iformat->name) == 0; });
    error = found == CONTAINERS.end() ? ENOTSUP : 0;
    if (error != 0)
        return nullptr;
    const AVCodecParameters* parameters = soundOf(input.get())->codecpar;
    auto* cut = new StreamCut(std::move(source), found->output, parameters->codec_id);
    if (parameters->frame_size > 0 && parameters->sample_rate > 0)
        cut->_frameMs = parameters->frame_size * 1000 / parameters->sample_rate + 1;
    return std::unique_ptr<SoundCut>(cut);
}

int StreamCut::_begin(Output& output, const Range& range, int target)
{
    int error = 0;
    output.input = openSound(pathOf(source()), error);
    if (!output.input)
        return error;
    output.from = soundOf(output.input.get());
    const int64_t start = output.from->start_time == AV_NOPTS_VALUE ? 0 : std::max<int64_t>(0, output.from->start_time);
    output.begin = start + av_rescale_q(range.begin, MILLISECONDS, output.from->time_base);
    output.end = start + av_rescale_q(range.end, MILLISECONDS, output.from->time_base);

    AVFormatContext* context = nullptr;
    if (avformat_alloc_output_context2(&context, nullptr, _container, nullptr) < 0)
        return ENOTSUP;
    output.context.reset(context);
    av_dict_copy(&context->metadata, output.input->metadata, 0);
    output.streams.assign(output.input->nb_streams, -1);
    for (unsigned int i = 0; i < output.input->nb_streams; ++i) {
        const AVStream* from = output.input->streams[i];
        const bool isCover = (from->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0
            && avformat_query_codec(context->oformat, from->codecpar->codec_id, FF_COMPLIANCE_NORMAL) == 1;
        if (from != output.from && !isCover)
            continue;
        AVStream* to = avformat_new_stream(context, nullptr);
        if (to == nullptr || avcodec_parameters_copy(to->codecpar, from->codecpar) < 0)
            return ENOMEM;
        to->codecpar->codec_tag = 0;
        to->time_base = from->time_base;
        to->disposition = from->disposition;
        av_dict_copy(&to->metadata, from->metadata, 0);
        output.streams[i] = to->index;
        if (from == output.from)
            output.to = to;
    }
    return errorOf(avio_open(&context->pb, ("file:" + pathOf(target)).c_str(), AVIO_FLAG_WRITE));
}

int StreamCut::_put(Output& output, AVPacket* packet)
{
    if (!std::exchange(output.hasHead, true)) {
        if (const int code = avformat_write_header(output.context.get(), nullptr); code < 0)
            return code == AVERROR(EINVAL) ? ENOTSUP : errorOf(code);
        for (unsigned int i = 0; i < output.input->nb_streams; ++i) {
            AVStream* from = output.input->streams[i];
            if (output.streams[i] < 0 || from == output.from || from->attached_pic.size == 0)
                continue;
            AvPacket cover(av_packet_clone(&from->attached_pic));
            cover->stream_index = output.streams[i];
            av_interleaved_write_frame(output.context.get(), cover.get());
        }
    }
    packet->stream_index = output.to->index;
    av_packet_rescale_ts(packet, output.from->time_base, output.to->time_base);
    packet->pos = -1;
    return errorOf(av_interleaved_write_frame(output.context.get(), packet));
}

int StreamCut::_copy(Output& output, ExportWatch& watch)
{
    const AVCodecParameters* parameters = output.from->codecpar;
    const AVRational samples{1, std::max(1, parameters->sample_rate)};
    const int64_t first = output.begin - av_rescale_q(prerollOf(parameters), samples, output.from->time_base);
    const AvPacket packet(av_packet_alloc());
    int64_t next = 0;
    int code = 0;
    while ((code = av_read_frame(output.input.get(), packet.get())) >= 0) {
        if (watch.cancelled)
            return ECANCELED;
        const bool isOurs = packet->stream_index == output.from->index;
        const int64_t at = packet->pts != AV_NOPTS_VALUE ? packet->pts : next;
        const int64_t length = std::max<int64_t>(1, packet->duration);
        next = at + length;
        if (!isOurs || next <= first) {
            av_packet_unref(packet.get());
            continue;
        }
        if (at >= output.end)
            break;
        int64_t from = at;
        int64_t to = std::min(next, output.end);
        if (isPcm(_codec)) {
            // Sample by sample.
            const int64_t block = std::max(1, parameters->block_align);
            from = std::max(at, output.begin);
            const int64_t skip = av_rescale_q(from - at, output.from->time_base, samples) * block;
            const int64_t keep = av_rescale_q(to - from, output.from->time_base, samples) * block;
            packet->data += std::min<int64_t>(skip, packet->size);
            packet->size = static_cast<int>(std::clamp<int64_t>(packet->size - skip, 0, keep));
        }
        if (!output.hasHead && _codec == AV_CODEC_ID_MP3) {
            output.to->codecpar->initial_padding
                = static_cast<int>(av_rescale_q(output.begin - at, output.from->time_base, samples));
        }
        packet->pts = packet->dts = from - output.begin;
        packet->duration = to - from;
        if (const int error = _put(output, packet.get()); error != 0)
            return error;
        watch.percent = static_cast<int>(
            std::clamp<int64_t>((to - output.begin) * 100 / std::max<int64_t>(1, output.end - output.begin), 0, 100));
    }
    if (code < 0 && code != AVERROR_EOF)
        return errorOf(code);
    return output.hasHead ? errorOf(av_write_trailer(output.context.get())) : EBADMSG;
}

int StreamCut::_write(const Range& range, int target, ExportWatch& watch)
{
    Output output;
    int error = _begin(output, range, target);
    if (error == 0)
        error = _codec == AV_CODEC_ID_FLAC ? _encode(output, watch) : _copy(output, watch);
    if (error == 0 && output.context->pb->error < 0)
        error = errorOf(output.context->pb->error);
    return error;
}

int StreamCut::_lengthOf(int target) const
{
    int error = 0;
    const AvInput written = openSound(pathOf(target), error);
    if (!written || written->duration == AV_NOPTS_VALUE)
        return -1;
    return static_cast<int>(written->duration * 1000 / AV_TIME_BASE);
}

int StreamCut::_encode(Output& output, ExportWatch& watch)
{
    const AvCodec decoder = decoderOf(output.from);
    const AVCodec* kind = avcodec_find_encoder(_codec);
    output.encoder.reset(kind != nullptr ? avcodec_alloc_context3(kind) : nullptr);
    if (!decoder || !output.encoder)
        return ENOTSUP;
    AVCodecContext* encoder = output.encoder.get();
    encoder->sample_rate = decoder->sample_rate;
    av_channel_layout_copy(&encoder->ch_layout, &decoder->ch_layout);
    encoder->sample_fmt = av_get_packed_sample_fmt(decoder->sample_fmt);
    encoder->bits_per_raw_sample = decoder->bits_per_raw_sample;
    encoder->time_base = {1, decoder->sample_rate};
    encoder->strict_std_compliance = FF_COMPLIANCE_EXPERIMENTAL; // 32 bits
    if (avcodec_open2(encoder, kind, nullptr) < 0 || avcodec_parameters_from_context(output.to->codecpar, encoder) < 0)
        return ENOTSUP;
    const AVRational unit = output.from->time_base;
    const int64_t begin = av_rescale_q(output.begin, unit, encoder->time_base);
    const int64_t end = av_rescale_q(output.end, unit, encoder->time_base);
    // From here on packets are counted in samples.
    output.to->time_base = encoder->time_base;
    const std::unique_ptr<AVAudioFifo, FreeFifo> fifo(
        av_audio_fifo_alloc(encoder->sample_fmt, encoder->ch_layout.nb_channels, encoder->frame_size));
    const AvPacket packet(av_packet_alloc());
    const AvFrame frame(av_frame_alloc());
    const AvPacket made(av_packet_alloc());
    int64_t written = 0;

    const auto drain = [&](const AVFrame* next) {
        int code = avcodec_send_frame(encoder, next);
        while (code >= 0 && (code = avcodec_receive_packet(encoder, made.get())) >= 0) {
            av_packet_rescale_ts(made.get(), encoder->time_base, unit);
            if (const int error = _put(output, made.get()); error != 0)
                return error;
        }
        return code == AVERROR(EAGAIN) || code == AVERROR_EOF ? 0 : errorOf(code);
    };
    const auto encodeWhole = [&](bool isLast) {
        while (
            av_audio_fifo_size(fifo.get()) >= encoder->frame_size || (isLast && av_audio_fifo_size(fifo.get()) > 0)) {
            AvFrame chunk(av_frame_alloc());
            chunk->nb_samples = std::min(encoder->frame_size, av_audio_fifo_size(fifo.get()));
            chunk->format = encoder->sample_fmt;
            chunk->sample_rate = encoder->sample_rate;
            av_channel_layout_copy(&chunk->ch_layout, &encoder->ch_layout);
            if (av_frame_get_buffer(chunk.get(), 0) < 0
                || av_audio_fifo_read(fifo.get(), reinterpret_cast<void**>(chunk->data), chunk->nb_samples) < 0)
                return ENOMEM;
            chunk->pts = written;
            written += chunk->nb_samples;
            if (const int error = drain(chunk.get()); error != 0)
                return error;
        }
        return 0;
    };

    int64_t position = 0;
    while (position < end && av_read_frame(output.input.get(), packet.get()) >= 0) {
        if (watch.cancelled)
            return ECANCELED;
        if (packet->stream_index == output.from->index && avcodec_send_packet(decoder.get(), packet.get()) < 0)
            return EBADMSG;
        av_packet_unref(packet.get());
        while (avcodec_receive_frame(decoder.get(), frame.get()) >= 0) {
            const int64_t from = std::clamp<int64_t>(begin - position, 0, frame->nb_samples);
            const int64_t to = std::clamp<int64_t>(end - position, 0, frame->nb_samples);
            const int width = av_get_bytes_per_sample(encoder->sample_fmt) * encoder->ch_layout.nb_channels;
            void* samples = frame->data[0] + from * width;
            if (from < to && av_audio_fifo_write(fifo.get(), &samples, static_cast<int>(to - from)) < 0)
                return ENOMEM;
            position += frame->nb_samples;
        }
        if (const int error = encodeWhole(false); error != 0)
            return error;
        watch.percent = static_cast<int>(
            std::clamp<int64_t>((position - begin) * 100 / std::max<int64_t>(1, end - begin), 0, 100));
    }
    if (const int error = encodeWhole(true); error != 0)
        return error;
    if (written == 0)
        return EBADMSG;
    const int error = drain(nullptr);
    return error != 0 ? error : errorOf(av_write_trailer(output.context.get()));
}

}
