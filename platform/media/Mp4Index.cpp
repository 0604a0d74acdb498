#include "media/Mp4Index.h"

#include <algorithm>
#include <array>

namespace media {

namespace {

    constexpr uint64_t INDEX_FIXED_BYTES = 640; // everything of "moov" but the frame sizes, rounded up

    std::string number(uint64_t value, int bytes)
    {
        std::string out;
        for (int shift = 8 * (bytes - 1); shift >= 0; shift -= 8)
            out.push_back(static_cast<char>(value >> shift));
        return out;
    }

    std::string u16(uint64_t value) { return number(value, 2); }
    std::string u32(uint64_t value) { return number(value, 4); }
    std::string u64(uint64_t value) { return number(value, 8); }
    std::string zeros(size_t count) { return std::string(count, '\0'); }

    // tail: bytes of the box that the caller writes later.
    std::string box(const char* type, const std::string& content, uint64_t tail = 0)
    {
        return u32(8 + content.size() + tail) + type + content;
    }

    std::string descriptor(int tag, const std::string& content)
    {
        return number(static_cast<uint64_t>(tag), 1) + number(content.size(), 1) + content;
    }

    bool isLong(uint64_t duration) { return duration > 0xFFFFFFFEu; }

    // Version, flags and the two dates, which stay unset.
    std::string timedHead(uint64_t duration, int flags = 0)
    {
        return number(isLong(duration) ? 1 : 0, 1) + number(static_cast<uint64_t>(flags), 3)
            + zeros(isLong(duration) ? 16 : 8);
    }

    std::string time(uint64_t duration) { return isLong(duration) ? u64(duration) : u32(duration); }

    std::string matrix() { return u32(0x10000) + zeros(12) + u32(0x10000) + zeros(12) + u32(0x40000000); }

    std::string movieHeader(const Mp4Track& track, uint64_t duration)
    {
        return box("mvhd",
            timedHead(duration) + u32(track.sampleRate) + time(duration) + u32(0x10000) + u16(0x100) + zeros(10)
                + matrix() + zeros(24) + u32(2));
    }

    std::string trackHeader(uint64_t duration)
    {
        return box("tkhd",
            timedHead(duration, 3) + u32(1) + u32(0) + time(duration) + zeros(8) + u16(0) + u16(0) + u16(0x100) + u16(0)
                + matrix() + u32(0) + u32(0));
    }

    std::string edits(uint64_t shown)
    {
        const std::string entry = time(shown) + (isLong(shown) ? u64(AAC_PRIMING_SAMPLES) : u32(AAC_PRIMING_SAMPLES));
        return box("edts", box("elst", number(isLong(shown) ? 1 : 0, 1) + zeros(3) + u32(1) + entry + u32(0x10000)));
    }

    std::string sampleDescription(const Mp4Track& track)
    {
        const std::string decoder = number(0x40, 1) + number(0x15, 1) + number(6144 / 8 * track.channels, 3)
            + u32(track.bitRate) + u32(track.bitRate) + descriptor(5, track.decoderConfig);
        const std::string stream = u16(0) + number(0, 1) + descriptor(4, decoder) + descriptor(6, number(2, 1));
        const uint32_t shownRate = track.sampleRate < 0x10000 ? track.sampleRate : 0;
        const std::string entry = box("mp4a",
            zeros(6) + u16(1) + zeros(8) + u16(track.channels) + u16(16) + zeros(4) + u32(uint64_t{shownRate} << 16)
                + box("esds", u32(0) + descriptor(3, stream)));
        return box("stsd", u32(0) + u32(1) + entry);
    }

}

std::string aacDecoderConfig(uint32_t sampleRate, uint16_t channels)
{
    const auto* found = std::find(AAC_RATES.begin(), AAC_RATES.end(), sampleRate);
    if (found == AAC_RATES.end())
        return {};
    const auto index = static_cast<unsigned>(found - AAC_RATES.begin());
    return u16(2u << 11 | index << 7 | static_cast<unsigned>(channels) << 3);
}

std::string mp4FileHead(uint64_t dataBytes)
{
    const std::string type = box("ftyp", std::string("M4A ") + u32(0) + "M4A " + "mp42" + "isom" + "iso2");
    if (dataBytes == MP4_UNFINISHED)
        return type + box("free", "") + u32(0) + "mdat";
    if (dataBytes + 8 > 0xFFFFFFFFu)
        return type + u32(1) + "mdat" + u64(dataBytes + 16);
    return type + box("free", "") + u32(dataBytes + 8) + "mdat";
}

uint64_t aacSamples(uint64_t frames)
{
    const uint64_t all = frames * AAC_FRAME_SAMPLES;
    return all > AAC_PRIMING_SAMPLES ? all - AAC_PRIMING_SAMPLES : 0;
}

std::string mp4IndexHead(const Mp4Track& track, uint64_t frames, uint64_t samples)
{
    const uint64_t tail = 4 * frames;
    const uint64_t duration = frames * AAC_FRAME_SAMPLES;
    const uint64_t shown = std::min(samples, aacSamples(frames));
    const std::string tables = sampleDescription(track)
        + box("stts", u32(0) + u32(1) + u32(frames) + u32(AAC_FRAME_SAMPLES))
        + box("stsc", u32(0) + u32(1) + u32(1) + u32(frames) + u32(1))
        + box("stco", u32(0) + u32(1) + u32(MP4_DATA_START)) + box("stsz", u32(0) + u32(0) + u32(frames), tail);
    const std::string self = box("url ", u32(1));
    const std::string information
        = box("smhd", zeros(8)) + box("dinf", box("dref", u32(0) + u32(1) + self)) + box("stbl", tables, tail);
    const std::string media
        = box("mdhd", timedHead(duration) + u32(track.sampleRate) + time(duration) + u16(0x55C4) + u16(0))
        + box("hdlr", u32(0) + u32(0) + "soun" + zeros(12) + "SoundHandler" + zeros(1))
        + box("minf", information, tail);
    const std::string trackContent = trackHeader(shown) + edits(shown) + box("mdia", media, tail);
    // GStreamer ends a file when its frames, counted from the hidden ones on, reach the length of the movie.
    const uint64_t movie = shown + AAC_PRIMING_SAMPLES / AAC_FRAME_SAMPLES * AAC_FRAME_SAMPLES;
    return box("moov", movieHeader(track, movie) + box("trak", trackContent, tail), tail);
}

uint64_t mp4FileSize(uint64_t frames, uint64_t dataBytes)
{
    return MP4_DATA_START + dataBytes + INDEX_FIXED_BYTES + 4 * frames;
}

}
