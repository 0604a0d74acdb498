#pragma once

#include "media/Mp4Index.h"

#include <recorder.h>

#include <sys/types.h>

#include <array>
#include <cstdint>
#include <optional>
#include <type_traits>

namespace media {

// The journal "<recording>.idx": this header, then one 16-bit size per AAC frame (AMR frames tell their own). It is all
// that is needed to finish the recording's file, now or after a crash. Written as it lies in memory: it never leaves
// the machine.
struct JournalHeader {
    std::array<char, 8> magic{};
    uint8_t format = 0; // recorder_file_format_e, 0 unknown
    uint8_t isComplete = 0;
    uint8_t channels = 0;
    uint8_t configBytes = 0;
    uint32_t sampleRate = 0;
    uint32_t bitRate = 0;
    std::array<char, 20> config{};
    uint64_t rescueId = 0; // the files are being moved aside under this number
    uint32_t reserved = 0;
    uint32_t checksum = 0;

    [[nodiscard]] Mp4Track track() const;
};
static_assert(std::is_trivially_copyable_v<JournalHeader> && sizeof(JournalHeader) == 56);

JournalHeader makeJournalHeader(recorder_file_format_e format, uint32_t sampleRate, uint8_t channels, uint32_t bitRate);
// None when the header is torn or not ours.
std::optional<JournalHeader> readJournalHeader(int fd);
// Answers 0 or the system's error number.
int writeJournalHeader(int fd, JournalHeader header);

struct JournalFrames {
    uint64_t count = 0;
    uint64_t bytes = 0;
};
// The leading frames whose sizes together fit into the given number of bytes.
JournalFrames fitJournalFrames(int fd, uint64_t available);
off_t journalSize(uint64_t frames);

}
