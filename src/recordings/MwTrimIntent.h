#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <sys/stat.h>
#include <vector>

#include "MwModel.h"

// The record of a trim that changes a recording: a hidden file with an unguessable name, locked as long as its process
// works on it, with what somebody else needs to finish the work. Beside it lies the staged result under the same name
// without its ending. One thread.
class MwTrimIntent {
public:
    struct Identity { // tells one state of a file from another
        uint64_t inode = 0;
        uint64_t size = 0; // bytes

        static Identity of(const struct stat& status) { return {status.st_ino, static_cast<uint64_t>(status.st_size)}; }
        bool operator==(const Identity&) const = default;
    };
    struct Content {
        bool replaces = false;
        std::string name; // of the recording that is written, without its directory
        std::string formerId; // of the row that goes; may be empty
        Identity result;
        Identity original;
        std::vector<MwBookmark> bookmarks; // of the result
    };

    // A new one in a directory, with its empty staged file; check isOpen().
    static MwTrimIntent create(const std::string& directory);
    // One that a dead process of the same user has left; not open while its process lives.
    static MwTrimIntent adopt(const std::string& path);
    // All of a directory.
    static std::vector<std::string> find(const std::string& directory);

    MwTrimIntent() = default;
    MwTrimIntent(MwTrimIntent&& other) noexcept;
    MwTrimIntent& operator=(MwTrimIntent&& other) noexcept;
    // Closes; the files stay.
    ~MwTrimIntent();

    [[nodiscard]] bool isOpen() const { return _file >= 0; }
    [[nodiscard]] std::string stagedPath() const;
    // To the storage.
    [[nodiscard]] bool save(const Content& content) const;
    // None while nothing was to be changed yet.
    [[nodiscard]] std::optional<Content> load() const;
    // Removes the record, the last step of all.
    void remove();

private:
    MwTrimIntent(std::string path, int file);

    std::string _path;
    int _file = -1;
};
