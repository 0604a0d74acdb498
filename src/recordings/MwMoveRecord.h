#pragma once

#include <string>

// What a move is about to do when a file is to have two places for a moment: a hidden file in the destination
// directory, locked while its process lives. A move that was killed then is finished by the next start or the next
// move, so that no recording is left twice. One thread.
class MwMoveRecord {
public:
    // The staged file is what will have the destination's name.
    MwMoveRecord(const std::string& source, const std::string& staged, const std::string& destination);
    // Nothing is left to do.
    ~MwMoveRecord();
    MwMoveRecord(const MwMoveRecord&) = delete;
    MwMoveRecord& operator=(const MwMoveRecord&) = delete;

    // Finishes what dead processes have left in a directory.
    static void recover(const std::string& directory);
    // Takes a destination that doubles its source back, row first.
    static bool undo(const std::string& source, const std::string& destination);

private:
    std::string _path;
    int _file = -1;
};
