#pragma once

#include <string>

// Moving and flushing recordings so that none is overwritten and none is lost in a power cut. Any thread.
namespace MwFiles {

enum class Move { DONE, EXISTS, FAILED };

// Moves a file; never over another one. Between file systems the copy is complete before the source goes.
Move moveWithoutOverwriting(const std::string& from, const std::string& to);
// Flushes the directory that holds the path, so that the name itself survives a power cut.
void flushDirectoryOf(const std::string& path);
// Creates a directory and every missing ancestor: open to all below a place that all may write, else after the umask.
bool makeDirectories(const std::string& path);

}
