#pragma once

#include <sys/types.h>

#include <cstdint>
#include <optional>
#include <string>

namespace media {

enum class FileKind { UNKNOWN, MP4, AMR, AMR_WIDE, ADTS };

// What a recording's file itself tells; built for hostile input: every read is bounded by the file, memory by a block.
FileKind kindOf(int fd);
// Milliseconds of sound; none for a damaged, unfinished or foreign file.
std::optional<int> durationOf(int fd);
std::optional<int> durationOf(const std::string& path);
// Whether an MP4 file has its whole index and its boxes fill it exactly.
bool isCompleteMp4(int fd);

struct AmrFrames {
    uint64_t count = 0;
    off_t end = 0; // behind the last whole frame
    bool isClean = true; // nothing but whole frames up to the end of the file
};
constexpr auto AMR_MAGIC = "#!AMR\n";
constexpr off_t AMR_DATA_START = 6;
constexpr int AMR_FRAME_MS = 20;
// The frames of one of the two kinds of AMR.
AmrFrames walkAmr(int fd, FileKind kind = FileKind::AMR);

}
