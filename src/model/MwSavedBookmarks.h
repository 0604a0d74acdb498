#pragma once

#include "MwModel.h"

#include <string>
#include <vector>

// A bookmark of a saved recording, as the media database keeps it.
struct MwSavedBookmark {
    int id = 0;
    unsigned int markedTime = 0; // seconds
    std::string name;

    bool operator==(const MwSavedBookmark&) const = default;
};

// Told about a failed call of the database: its name and code.
using MwBookmarkFailure = void (*)(const char* call, int code);

// The bookmarks of a recording by rising time; what could not be read is reported and left out. Any thread.
std::vector<MwSavedBookmark> mwReadBookmarks(const std::string& mediaId, MwBookmarkFailure failed);

// Writes the bookmarks that a saved recording does not have yet, all of them or none; answers the database's code. Any
// thread.
int mwInsertBookmarks(const std::string& mediaId, const std::vector<MwBookmark>& bookmarks);
