#pragma once

#include <optional>
#include <string>
#include <vector>

#include "MwModel.h"

// What only the running program knows about a recording (its name and bookmarks), kept in a small file beside the
// temporary file while it runs, so that a rescue after a crash finds it. Any thread.
namespace MwRecordingNotes {

struct Content {
    std::string name;
    std::vector<MwBookmark> bookmarks;
};

// The notes of a temporary file.
std::string pathFor(const std::string& temporaryPath);
// The notes that wait beside a saved recording until its bookmarks are in the database.
std::string pathForSaved(const std::string& recordingPath);
// Replaces the notes atomically; only the owner can read them.
bool save(const std::string& notesPath, const Content& content);
// Gives the notes of a running recording a second name; needs no room on the disk where the file system can.
bool keepFor(const std::string& notesPath, const std::string& recordingPath);
// Nothing when there are none or they cannot be read.
std::optional<Content> load(const std::string& notesPath);
void remove(const std::string& notesPath);

}
