#pragma once

#include <string>
#include <vector>

// Keeps the rows of the media database in step with files that are moved and deleted. Any thread.
namespace MwMediaRow {

enum class Move { DONE, UNKNOWN, FAILED };

// The row of a file follows it to its new path, with its identifier and bookmarks.
Move move(const std::string& from, const std::string& to);
// The identifier of the row of exactly this path; empty when there is none.
std::string idAt(const std::string& path);
// The rows of several deleted files, in one step: all or none.
bool remove(const std::vector<std::string>& mediaIds);

}
