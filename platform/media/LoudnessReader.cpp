#include "media/LoudnessReader.h"

#include "media/AmrIndex.h"
#include "media/AvFile.h"
#include "media/FileDescriptor.h"
#include "media/Mp4Movie.h"

#include <fcntl.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <optional>
#include <string_view>
#include <thread>

namespace media {

namespace {

    constexpr uint64_t WINDOWS = 3600; // of a coarse look
    constexpr uint64_t WINDOW_FRAMES = 4; // with those that only warm the decoder up
    constexpr uint64_t FRAMES_WORTH_A_SECOND_THREAD = 256;

    using Cancelled = std::atomic<bool>;

    template <typename T>
    double sumOf(const uint8_t* data, int from, int count, double scale)
    {
        const T* samples = reinterpret_cast<const T*>(data) + from;
        double sum = 0;
        for (int i = 0; i < count; ++i)
            sum += std::abs(static_cast<double>(samples[i]));
        return sum * scale;
    }

    template <>
    double sumOf<float>(const uint8_t* data, int from, int count, double scale)
    {
        // Several sums side by side, which the compiler turns into one instruction each.
        const float* samples = reinterpret_cast<const float*>(data) + from;
        std::array<float, 8> sums{};
        int i = 0;
        for (; i + 8 <= count; i += 8) {
            for (size_t k = 0; k < sums.size(); ++k)
                sums[k] += std::fabs(samples[i + static_cast<int>(k)]);
        }
        double sum = 0;
        for (const float each : sums)
            sum += static_cast<double>(each);
        for (; i < count; ++i)
            sum += static_cast<double>(std::fabs(samples[i]));
        return sum * scale;
    }

    double sumOf(const AVFrame& frame, int from, int count)
    {
        constexpr double SHORT = 1.0 / 32768;
        constexpr double LONG = 1.0 / 2147483648.0;
        const auto format = static_cast<AVSampleFormat>(frame.format);
        // The first channel of planes, all of what is interleaved.
        const int width = av_sample_fmt_is_planar(format) != 0 ? 1 : std::max(1, frame.ch_layout.nb_channels);
        const uint8_t* data = frame.data[0];
        switch (av_get_planar_sample_fmt(format)) {
        case AV_SAMPLE_FMT_FLTP:
            return sumOf<float>(data, from * width, count * width, 1.0) / width;
        case AV_SAMPLE_FMT_S16P:
            return sumOf<int16_t>(data, from * width, count * width, SHORT) / width;
        case AV_SAMPLE_FMT_S32P:
            return sumOf<int32_t>(data, from * width, count * width, LONG) / width;
        case AV_SAMPLE_FMT_DBLP:
            return sumOf<double>(data, from * width, count * width, 1.0) / width;
        default:
            return 0;
        }
    }

    void addFrame(LoudnessSum& sum, const AVFrame& frame, int64_t position)
    {
        constexpr auto BLOCK = static_cast<int>(LoudnessSum::BLOCK);
        for (int from = 0; from < frame.nb_samples; from += BLOCK) {
            const int count = std::min(BLOCK, frame.nb_samples - from);
            if (position + from >= 0)
                sum.add(
                    static_cast<uint64_t>(position + from), sumOf(frame, from, count), static_cast<uint64_t>(count));
        }
    }

    // What of our own recordings can be found without asking a library: its index is right and small.
    class Frames {
    public:
        static std::optional<Frames> open(const std::string& path)
        {
            Frames frames;
            frames._file = FileDescriptor(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
            if (!frames._file)
                return {};
            const int fd = frames._file.get();
            frames._amr = AmrIndex::read(fd);
            if (!frames._amr)
                frames._movie = Mp4Movie::read(fd);
            const bool isOurs = frames._amr
                || (frames._movie && !frames._movie->decoderConfig().empty() && frames._movie->pieces().size() == 1
                    && !frames._movie->pieces().front().isSilence);
            return isOurs ? std::optional<Frames>(std::move(frames)) : std::nullopt;
        }

        [[nodiscard]] uint64_t count() const { return _amr ? _amr->frames() : _movie->frames(); }
        [[nodiscard]] uint64_t warmUp() const { return _amr ? 2 : 1; }
        [[nodiscard]] int64_t timeOf(uint64_t frame) const
        {
            if (_amr)
                return static_cast<int64_t>(frame * _amrSamples());
            return static_cast<int64_t>(_movie->timeOf(frame)) - static_cast<int64_t>(_movie->pieces().front().from);
        }
        [[nodiscard]] uint64_t length() const { return _amr ? count() * _amrSamples() : _movie->length(); }

        [[nodiscard]] AvCodec decoder() const
        {
            const AVCodec* codec = avcodec_find_decoder(!_amr ? AV_CODEC_ID_AAC
                    : _amr->isWideBand()                      ? AV_CODEC_ID_AMR_WB
                                                              : AV_CODEC_ID_AMR_NB);
            AvCodec context(codec != nullptr ? avcodec_alloc_context3(codec) : nullptr);
            if (!context)
                return nullptr;
            context->thread_count = 1;
            if (_amr) {
                context->sample_rate = _amr->isWideBand() ? 16000 : 8000;
                av_channel_layout_default(&context->ch_layout, 1);
            } else {
                const std::string config = _movie->decoderConfig();
                context->extradata = static_cast<uint8_t*>(av_mallocz(config.size() + AV_INPUT_BUFFER_PADDING_SIZE));
                if (context->extradata == nullptr)
                    return nullptr;
                std::copy(config.begin(), config.end(), context->extradata);
                context->extradata_size = static_cast<int>(config.size());
            }
            return avcodec_open2(context.get(), codec, nullptr) >= 0 ? std::move(context) : nullptr;
        }

        // Calls back with the bytes of each frame until told to stop.
        template <typename Visitor>
        void visit(uint64_t first, uint64_t end, const Visitor& visitor) const
        {
            std::vector<uint8_t> buffer;
            const std::vector<ByteRange> ranges
                = _amr ? std::vector<ByteRange>{_amrRange(first, end)} : _movie->bytesOf(first, end);
            uint64_t frame = first;
            for (const ByteRange& range : ranges) {
                uint64_t offset = range.offset;
                while (offset < range.offset + range.size && frame < end) {
                    const auto size
                        = static_cast<size_t>(std::min<uint64_t>(BLOCK, range.offset + range.size - offset));
                    buffer.resize(size + AV_INPUT_BUFFER_PADDING_SIZE);
                    if (!readAt(_file.get(), buffer.data(), size, static_cast<off_t>(offset)))
                        return;
                    const size_t used = _visitBlock(buffer, size, frame, end, visitor);
                    if (used == 0)
                        return;
                    offset += used;
                }
            }
        }

    private:
        static constexpr size_t BLOCK = 65536;

        [[nodiscard]] uint64_t _amrSamples() const { return _amr->isWideBand() ? 320 : 160; }
        [[nodiscard]] ByteRange _amrRange(uint64_t first, uint64_t end) const
        {
            const uint64_t from = _amr->offsetOf(_file.get(), first);
            return {from, _amr->offsetOf(_file.get(), end) - from};
        }

        // The bytes of whole frames that were used; 0 to stop.
        template <typename Visitor>
        size_t _visitBlock(
            std::vector<uint8_t>& buffer, size_t size, uint64_t& frame, uint64_t end, const Visitor& visitor) const
        {
            size_t at = 0;
            while (at < size && frame < end) {
                const size_t length
                    = _amr ? AmrIndex::frameSize(buffer[at], _amr->isWideBand()) : _movie->sizeOf(frame);
                if (length > BLOCK || (length == 0 && _amr))
                    return 0;
                if (at + length > size)
                    break;
                if (!visitor(frame, buffer.data() + at, length))
                    return 0;
                at += length;
                ++frame;
            }
            return at;
        }

        FileDescriptor _file;
        std::optional<AmrIndex> _amr;
        std::optional<Mp4Movie> _movie;
    };

    // Decodes frames one after the other, from any place on.
    class FrameDecoder {
    public:
        FrameDecoder(const Frames& frames, LoudnessSum& sum)
            : _frames(frames)
            , _sum(sum)
            , _decoder(frames.decoder())
        {
        }

        // Counts frames [first, end); those before it only warm the decoder up. False when there is no decoder.
        bool run(uint64_t first, uint64_t end, const Cancelled& cancelled)
        {
            if (!_decoder)
                return false;
            avcodec_flush_buffers(_decoder.get());
            const uint64_t from = first - std::min(first, _frames.warmUp());
            _frames.visit(from, end, [&](uint64_t frame, uint8_t* data, size_t size) {
                if (cancelled)
                    return false;
                _packet->data = data;
                _packet->size = static_cast<int>(size);
                if (avcodec_send_packet(_decoder.get(), _packet.get()) < 0)
                    return true; // one damaged frame is silence
                while (avcodec_receive_frame(_decoder.get(), _frame.get()) >= 0) {
                    if (frame >= first)
                        addFrame(_sum, *_frame, _frames.timeOf(frame));
                }
                return true;
            });
            return true;
        }

    private:
        const Frames& _frames;
        LoudnessSum& _sum;
        AvCodec _decoder;
        AvPacket _packet{av_packet_alloc()};
        AvFrame _frame{av_frame_alloc()};
    };

    void readExact(const Frames& frames, uint64_t first, uint64_t end, LoudnessSum& sum, const Cancelled& cancelled)
    {
        FrameDecoder(frames, sum).run(first, end, cancelled);
    }

    // A few frames from every stretch, off the grid, so that what repeats in the sound does not fool it.
    void readCoarse(const Frames& frames, uint64_t first, uint64_t end, LoudnessSum& sum, const Cancelled& cancelled)
    {
        FrameDecoder decoder(frames, sum);
        const uint64_t stride = frames.count() / WINDOWS;
        uint64_t noise = 12345;
        for (uint64_t at = first; at < end && !cancelled; at += stride) {
            noise = noise * 6364136223846793005u + 1442695040888963407u;
            const uint64_t room = stride - std::min(stride, WINDOW_FRAMES);
            const uint64_t from = at + frames.warmUp() + (room > 0 ? (noise >> 33) % room : 0);
            if (!decoder.run(from, std::min(end, from + WINDOW_FRAMES - frames.warmUp()), cancelled))
                return;
        }
    }

    Loudness readFrames(const Frames& frames, LoudnessQuality quality, const Cancelled& cancelled)
    {
        LoudnessSum sum(frames.length());
        LoudnessSum other(frames.length());
        const bool isSparse = quality == LoudnessQuality::COARSE && frames.count() > WINDOWS * WINDOW_FRAMES;
        const auto read = isSparse ? readCoarse : readExact;
        const uint64_t middle = frames.count() > FRAMES_WORTH_A_SECOND_THREAD ? frames.count() / 2 : frames.count();
        std::thread second;
        if (middle < frames.count())
            second = std::thread([&] { read(frames, middle, frames.count(), other, cancelled); });
        read(frames, 0, middle, sum, cancelled);
        if (second.joinable())
            second.join();
        sum.add(other);
        return sum.result();
    }

    // What others have recorded: the library finds the frames.
    Loudness readByLibrary(const std::string& path, const Cancelled& cancelled)
    {
        int error = 0;
        const AvInput input = openSound(path, error);
        const AVStream* stream = input ? soundOf(input.get()) : nullptr;
        const AvCodec decoder = stream != nullptr ? decoderOf(stream) : nullptr;
        if (!decoder || input->duration <= 0 || decoder->sample_rate <= 0)
            return {};
        LoudnessSum sum(static_cast<uint64_t>(av_rescale(input->duration, decoder->sample_rate, AV_TIME_BASE)));
        const AvPacket packet(av_packet_alloc());
        const AvFrame frame(av_frame_alloc());
        int64_t position = 0;
        while (!cancelled && av_read_frame(input.get(), packet.get()) >= 0) {
            if (packet->stream_index == stream->index && avcodec_send_packet(decoder.get(), packet.get()) >= 0) {
                while (avcodec_receive_frame(decoder.get(), frame.get()) >= 0) {
                    addFrame(sum, *frame, position);
                    position += frame->nb_samples;
                }
            }
            av_packet_unref(packet.get());
        }
        return position > 0 ? sum.result() : Loudness();
    }

}

Loudness readLoudness(const std::string& path, LoudnessQuality quality, const std::atomic<bool>& cancelled)
{
    av_log_set_level(AV_LOG_QUIET);
    const auto frames = Frames::open(path);
    if (!frames && quality == LoudnessQuality::COARSE)
        return {}; // no quicker way to it
    Loudness loudness = frames ? readFrames(*frames, quality, cancelled) : readByLibrary(path, cancelled);
    return cancelled ? Loudness() : loudness;
}

}
