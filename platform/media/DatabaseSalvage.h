#pragma once

#include "media/MediaDatabase.h"

#include <string>
#include <utility>
#include <vector>

namespace media {

// What could be read of a database file, by whatever way led to it.
struct Salvage {
    std::vector<MediaRow> rows;
    std::vector<std::pair<std::string, BookmarkRow>> bookmarks; // by the identifier of their row
    bool isComplete = true; // nothing failed

    // Takes over what only the other one has, and what was sound there and is damaged here. Looks at the files.
    void fillFrom(const Salvage& other);
};

// Reads a database that may be damaged, older, newer or foreign, row by row: from both ends of each table and index,
// and then one by one in between. Columns that it does not have get their defaults. The file itself is not changed, but
// for its log, which is taken up.
Salvage salvageDatabase(const std::string& path);

}
