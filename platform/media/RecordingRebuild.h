#pragma once

#include "media/RecordingJournal.h"

namespace media {

enum class Rebuild {
    COMPLETE, // an ordinary file
    EMPTY, // no frame in it
    BEYOND_RESCUE, // there are bytes, but nothing tells what they are
    FAILED, // the storage refused (full, broken): the next attempt may succeed
};

struct RebuildResult {
    Rebuild outcome = Rebuild::FAILED;
    recorder_file_format_e format = RECORDER_FILE_FORMAT_MP4;
    int error = 0; // the system's number when FAILED
};

// Writes the index of an MP4 recording behind its frames, then its head, flushing in between, and marks the journal.
// A crash at any point leaves what a repetition completes. Answers 0 or the system's error number.
int finishMp4(int file, int journal, JournalHeader header, const JournalFrames& frames, uint64_t samples);
int finishAmr(int file, int journal, JournalHeader header);
// Makes the best of a leftover, whatever part of file and journal survived. Any thread; both must be open for writing.
RebuildResult rebuildRecording(int file, int journal);

}
