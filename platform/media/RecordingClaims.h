#pragma once

#include "media/FileDescriptor.h"

#include <cstdint>
#include <string>
#include <vector>

namespace media {

// Who may touch a temporary recording: the holder of the lock on its journal "<path>.idx". A lock belongs to an open
// file, so it ends with the process whatever happens, and is never taken twice. Any thread.

constexpr auto JOURNAL_SUFFIX = ".idx";
constexpr auto RESCUE_PREFIX = ".mw_rescue_";
constexpr auto DAMAGED_PREFIX = ".mw_damaged_";

// Opens (creating it) and locks a journal without waiting; answers the file or the negative of the system's error
// number, -EWOULDBLOCK when somebody else holds it.
int openLocked(const std::string& journalPath);

// Takes the path for a new recording and keeps it until releaseTemporary or the end of the process. What an earlier run
// left there is moved aside first. Answers 0 or an error number (EWOULDBLOCK: somebody records there).
int claimTemporary(const std::string& path);
bool isClaimedHere(const std::string& path);
// Whether a recorder of this process writes there at the moment; the end of writing leaves the claim.
bool isBeingWritten(const std::string& path);
void endWriting(const std::string& path, bool isComplete);
// Whether the last recording that this process ended there is complete.
bool isComplete(const std::string& path);
// Another handle of the claimed journal; empty when the path is not claimed here.
FileDescriptor claimedJournal(const std::string& path);
// Removes the journal and ends the claim; answers whether there was one.
bool releaseTemporary(const std::string& path);

// Moves a leftover recording, its journal and everything named after it to RESCUE_PREFIX names; repeats what a crash
// interrupted. The caller holds the journal's lock. Answers 0 or an error number.
int moveAside(const std::string& path, int journal);
// The name a recording gets by a move under a number.
std::string rescueName(const std::string& path, uint64_t id);
// Renames a file and its companions to another prefix in the same directory, never overwriting; answers an error
// number.
int renameGroup(const std::string& path, const std::string& newPath);
// Whether a recording or the trace of one lies there.
bool hasLeftover(const std::string& path, int journal);

std::string directoryOf(const std::string& path);
std::string nameOf(const std::string& path);
// Full names of the files in a directory that begin with a prefix.
std::vector<std::string> filesWithPrefix(const std::string& directory, const std::string& prefix);
void flushDirectory(const std::string& directory);

}
