#include "media/RecordingJournal.h"

#include "media/FileDescriptor.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <vector>

namespace media {

namespace {

    constexpr std::array<char, 8> MAGIC = {'M', 'W', 'R', 'E', 'C', '0', '1', '\n'};
    constexpr size_t BLOCK_FRAMES = 32768;

    uint32_t checksumOf(const JournalHeader& header)
    {
        const auto* bytes = reinterpret_cast<const unsigned char*>(&header);
        uint32_t sum = 2166136261u;
        for (size_t i = 0; i < offsetof(JournalHeader, checksum); ++i)
            sum = (sum ^ bytes[i]) * 16777619u;
        return sum;
    }

}

Mp4Track JournalHeader::track() const
{
    return {sampleRate, channels, bitRate, std::string(config.data(), std::min<size_t>(configBytes, config.size()))};
}

JournalHeader makeJournalHeader(recorder_file_format_e format, uint32_t sampleRate, uint8_t channels, uint32_t bitRate)
{
    JournalHeader header;
    header.format = static_cast<uint8_t>(format);
    header.channels = channels;
    header.sampleRate = sampleRate;
    header.bitRate = bitRate;
    const std::string config = format == RECORDER_FILE_FORMAT_MP4 ? aacDecoderConfig(sampleRate, channels) : "";
    header.configBytes = static_cast<uint8_t>(config.size());
    std::copy(config.begin(), config.end(), header.config.begin());
    return header;
}

std::optional<JournalHeader> readJournalHeader(int fd)
{
    JournalHeader header;
    if (!readAt(fd, &header, sizeof header, 0) || header.magic != MAGIC || header.checksum != checksumOf(header))
        return {};
    return header;
}

int writeJournalHeader(int fd, JournalHeader header)
{
    header.magic = MAGIC;
    header.checksum = checksumOf(header);
    return writeAt(fd, &header, sizeof header, 0);
}

off_t journalSize(uint64_t frames) { return static_cast<off_t>(sizeof(JournalHeader) + 2 * frames); }

JournalFrames fitJournalFrames(int fd, uint64_t available)
{
    JournalFrames fit;
    std::vector<uint16_t> sizes(BLOCK_FRAMES);
    for (;;) {
        const ssize_t count = pread(fd, sizes.data(), 2 * BLOCK_FRAMES, journalSize(fit.count));
        if (count < 2)
            return fit;
        for (size_t i = 0; i < static_cast<size_t>(count) / 2; ++i) {
            // A zero is a stretch that a power cut left unwritten.
            if (sizes[i] == 0 || fit.bytes + sizes[i] > available)
                return fit;
            fit.bytes += sizes[i];
            ++fit.count;
        }
    }
}

}
