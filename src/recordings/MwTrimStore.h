#pragma once

#include <string>
#include <vector>

#include "MwModel.h"
#include "MwTrimIntent.h"

// Puts a trimmed recording where it belongs, beside its source or in its place, together with its row and bookmarks:
// at every instant either the whole original or the whole result is under the recording's name, and what a dead
// process has left half done the next start finishes. The replaced original goes to the desktop's trash where there is
// one. One thread.
class MwTrimStore {
public:
    enum class Outcome {
        DONE,
        CHANGED, // the source is not what it was when staged
        FAILED
    };

    // An empty name counts up from the source's.
    MwTrimStore(std::string source, bool overwrite, std::string name = {});
    // What was not stored goes.
    ~MwTrimStore();
    MwTrimStore(const MwTrimStore&) = delete;
    MwTrimStore& operator=(const MwTrimStore&) = delete;

    // Makes the file for the result, which the caller then fills and flushes, and remembers what the source is now.
    [[nodiscard]] bool stage();
    [[nodiscard]] const std::string& getStagedPath() const { return _stagedPath; }
    // formerId is the source's row, may be empty; the bookmarks are those of the result.
    [[nodiscard]] Outcome store(const std::string& formerId, const std::vector<MwBookmark>& bookmarks);
    // Where the result is, once stored.
    [[nodiscard]] const std::string& getOutputPath() const { return _output; }

    // Finishes or undoes what dead processes have left in a directory.
    static void recover(const std::string& directory);

private:
    [[nodiscard]] bool _isSourceUnchanged() const;
    [[nodiscard]] bool _publish(MwTrimIntent::Content& content);
    [[nodiscard]] bool _addFile(MwTrimIntent::Content& content);
    [[nodiscard]] bool _replaceFile(const MwTrimIntent::Content& content);
    [[nodiscard]] bool _undo(const MwTrimIntent::Content& content);

    std::string _source;
    bool _overwrite;
    std::string _name;
    std::string _output;
    std::string _stagedPath;
    struct stat _sourceState { };
    MwTrimIntent _intent;
    bool _canExchange = true;
};
