#pragma once

#include <string>
#include <vector>

#include "media/FileDescriptor.h"
#include "media/MediaDatabase.h"

namespace media {

// The folders that hold recordings: device, card, private.
std::vector<std::string> recordingFolders();

struct ScanCount {
    int added = 0;
    int removed = 0;
    int changed = 0; // rows of any kind
};

// Whether files that did not tell their length are asked again, though they have not changed: a later version of this
// program may know how to.
enum class Lengths { KNOWN, ASKED_AGAIN };

// Brings the rows in step with the files of the folders: new and changed files are read, rows whose file is gone are
// dropped, and a file that was renamed or moved by another program keeps its row with the bookmarks, also when it took
// the path of another. A folder that cannot be read (a card pulled out) says nothing about its files; one of the device
// that is not there was deleted. Any thread. Answers SQLite's code.
int scanFolders(Database& database, const std::vector<std::string>& folders, Lengths lengths, ScanCount& count);

// Held while a file and its row change together, by any process, so that no scan sees one without the other. Waits two
// seconds at most: a process that hangs must not stop all others.
class FilesLock {
public:
    explicit FilesLock(const std::string& databasePath);
    // False when others held it for too long.
    [[nodiscard]] bool isHeld() const { return _held; }

private:
    FileDescriptor _file;
    bool _held = false;
};

}
