#include "media/RecordingRebuild.h"

#include "media/FileDescriptor.h"
#include "media/FileDuration.h"

#include <sys/stat.h>

#include <algorithm>
#include <cstring>
#include <vector>

namespace media {

namespace {

    constexpr size_t BLOCK_FRAMES = 16384;
    constexpr auto AMR_HEAD_BYTES = static_cast<size_t>(AMR_DATA_START);

    int errorOf(int result) { return result == 0 ? 0 : errno; }

    off_t sizeOf(int fd)
    {
        struct stat status { };
        return fstat(fd, &status) == 0 ? status.st_size : 0;
    }

    // Copies the frame sizes from the journal to the end of the index.
    int writeSizeTable(int file, int journal, uint64_t frames, off_t offset)
    {
        std::vector<uint16_t> sizes(BLOCK_FRAMES);
        std::vector<unsigned char> table;
        for (uint64_t done = 0; done < frames;) {
            const size_t count = std::min<uint64_t>(BLOCK_FRAMES, frames - done);
            if (!readAt(journal, sizes.data(), 2 * count, journalSize(done)))
                return EIO;
            table.assign(4 * count, 0);
            for (size_t i = 0; i < count; ++i) {
                table[4 * i + 2] = static_cast<unsigned char>(sizes[i] >> 8);
                table[4 * i + 3] = static_cast<unsigned char>(sizes[i]);
            }
            if (const int error = writeAt(file, table.data(), table.size(), offset); error != 0)
                return error;
            done += count;
            offset += static_cast<off_t>(table.size());
        }
        return 0;
    }

    int markComplete(int journal, JournalHeader header)
    {
        header.isComplete = 1;
        const int error = writeJournalHeader(journal, header);
        return error != 0 ? error : errorOf(fdatasync(journal));
    }

    // After a power cut the end of a file may be there in length only.
    bool isBlank(int file, off_t begin, off_t end)
    {
        std::vector<char> bytes(static_cast<size_t>(end - begin));
        return readAt(file, bytes.data(), bytes.size(), begin)
            && std::all_of(bytes.begin(), bytes.end(), [](char byte) { return byte == 0; });
    }

    JournalFrames withoutLast(JournalFrames frames, uint16_t size) { return {frames.count - 1, frames.bytes - size}; }

    JournalFrames dropBlankTail(int file, int journal, JournalFrames frames)
    {
        constexpr off_t TORN_END = 8;
        uint16_t size = 0;
        for (bool isTorn = false; frames.count > 0 && readAt(journal, &size, 2, journalSize(frames.count - 1));) {
            const off_t end = static_cast<off_t>(MP4_DATA_START + frames.bytes);
            if (isBlank(file, end - size, end))
                isTorn = true;
            else if (isTorn && size > TORN_END && isBlank(file, end - TORN_END, end))
                return withoutLast(frames, size); // the blank stretch begins in it
            else
                break;
            frames = withoutLast(frames, size);
        }
        return frames;
    }

    RebuildResult resultOf(int error, recorder_file_format_e format)
    {
        return {error == 0 ? Rebuild::COMPLETE : Rebuild::FAILED, format, error};
    }

    RebuildResult rebuildMp4(int file, int journal, const JournalHeader& header)
    {
        const auto available
            = static_cast<uint64_t>(std::max<off_t>(0, sizeOf(file) - static_cast<off_t>(MP4_DATA_START)));
        const JournalFrames frames = dropBlankTail(file, journal, fitJournalFrames(journal, available));
        if (frames.count == 0)
            return {available == 0 || isBlank(file, 0, std::min<off_t>(sizeOf(file), 4096)) ? Rebuild::EMPTY
                                                                                            : Rebuild::BEYOND_RESCUE,
                RECORDER_FILE_FORMAT_MP4, 0};
        // The journal first: a repetition must not take a half-written index for further frames.
        if (ftruncate(journal, journalSize(frames.count)) != 0 || fdatasync(journal) != 0)
            return resultOf(errno, RECORDER_FILE_FORMAT_MP4);
        return resultOf(finishMp4(file, journal, header, frames, aacSamples(frames.count)), RECORDER_FILE_FORMAT_MP4);
    }

    off_t dropBlankAmrTail(int file, off_t end)
    {
        constexpr off_t STEP = 32; // a frame at the rate we write
        while (end - STEP >= AMR_DATA_START && isBlank(file, end - STEP, end))
            end -= STEP;
        return end;
    }

    RebuildResult rebuildAmr(int file, int journal, const JournalHeader& header)
    {
        const off_t solidEnd = dropBlankAmrTail(file, sizeOf(file));
        if (solidEnd <= AMR_DATA_START)
            return {Rebuild::EMPTY, RECORDER_FILE_FORMAT_AMR, 0};
        if (ftruncate(file, solidEnd) != 0)
            return resultOf(errno, RECORDER_FILE_FORMAT_AMR);
        if (const int error = writeAt(file, AMR_MAGIC, AMR_HEAD_BYTES, 0); error != 0)
            return resultOf(error, RECORDER_FILE_FORMAT_AMR);
        const AmrFrames frames = walkAmr(file);
        if (frames.count == 0)
            return {Rebuild::EMPTY, RECORDER_FILE_FORMAT_AMR, 0};
        if (!frames.isClean && ftruncate(file, frames.end) != 0)
            return resultOf(errno, RECORDER_FILE_FORMAT_AMR);
        return resultOf(finishAmr(file, journal, header), RECORDER_FILE_FORMAT_AMR);
    }

    // Without a journal the file has to tell.
    RebuildResult rebuildAlone(int file, int journal)
    {
        switch (kindOf(file)) {
        case FileKind::AMR:
            return rebuildAmr(file, journal,
                makeJournalHeader(RECORDER_FILE_FORMAT_AMR, RECORDER_AMR_SAMPLE_RATE, 1, RECORDER_AMR_BIT_RATE));
        case FileKind::AMR_WIDE:
        case FileKind::ADTS:
        case FileKind::MP4:
        case FileKind::UNKNOWN:
            break;
        }
        const off_t size = sizeOf(file);
        const bool isEmpty
            = size <= static_cast<off_t>(MP4_DATA_START) || isBlank(file, 0, std::min<off_t>(size, 1 << 20));
        return {isEmpty ? Rebuild::EMPTY : Rebuild::BEYOND_RESCUE, RECORDER_FILE_FORMAT_MP4, 0};
    }

}

int finishMp4(int file, int journal, JournalHeader header, const JournalFrames& frames, uint64_t samples)
{
    const off_t end = static_cast<off_t>(MP4_DATA_START + frames.bytes);
    const std::string index = mp4IndexHead(header.track(), frames.count, samples);
    const std::string head = mp4FileHead(frames.bytes);
    if (ftruncate(file, end) != 0)
        return errno;
    if (const int error = writeAt(file, index.data(), index.size(), end); error != 0)
        return error;
    if (const int error = writeSizeTable(file, journal, frames.count, end + static_cast<off_t>(index.size()));
        error != 0)
        return error;
    if (fdatasync(file) != 0)
        return errno;
    // Only now may the head say that an index follows the frames.
    if (const int error = writeAt(file, head.data(), head.size(), 0); error != 0)
        return error;
    return fdatasync(file) != 0 ? errno : markComplete(journal, header);
}

int finishAmr(int file, int journal, JournalHeader header)
{
    return fdatasync(file) != 0 ? errno : markComplete(journal, header);
}

RebuildResult rebuildRecording(int file, int journal)
{
    if (isCompleteMp4(file))
        return {Rebuild::COMPLETE, RECORDER_FILE_FORMAT_MP4, errorOf(fdatasync(file))};
    const auto header = readJournalHeader(journal);
    if (header && header->format == RECORDER_FILE_FORMAT_MP4)
        return rebuildMp4(file, journal, *header);
    if (header && header->format == RECORDER_FILE_FORMAT_AMR)
        return rebuildAmr(file, journal, *header);
    return rebuildAlone(file, journal);
}

}
