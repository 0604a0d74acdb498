#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>

// What to do with a file whose name is taken at its destination.
enum class MwClashAction : int { NONE = 0, CANCEL = 1, REPLACE = 2, RENAME = 3 };

// Moves recordings into one directory, each together with its row in the media database. Whatever happens in between, a
// file is whole at its source or at its destination. On the worker's thread.
class MwFileMover {
public:
    enum class Outcome { MOVED, SKIPPED, FAILED };
    enum class Trouble { NONE, MISSING, NO_ROOM, NOT_REMOVABLE, OTHER };
    // Asked for every name that is taken; may take its time.
    using Ask = std::function<MwClashAction(const std::string& source)>;
    using Report = std::function<void(uint64_t bytes)>;

    // totalBytes: of all files to come, for the pace of the reports. The flag is borrowed.
    MwFileMover(std::string directory, uint64_t totalBytes, const std::atomic<bool>& cancelled, Ask ask, Report report);

    // On success the destination is where the file is now.
    [[nodiscard]] Outcome move(const std::string& source, std::string& destination);
    // Why the last one failed.
    [[nodiscard]] Trouble trouble() const { return _trouble; }

private:
    struct Place {
        std::string path;
        bool replace = false;
    };

    Outcome _fail(Trouble trouble);
    Outcome _endInterrupted(const std::string& source, std::string& destination);
    std::optional<Place> _choosePlace(const std::string& source, bool late);
    Outcome _stageAndPublish(const std::string& source, Place place, std::string& destination);
    Outcome _moveRow(const std::string& source, const Place& place, bool sourceLeft);
    Outcome _removeSource(const std::string& source, const Place& place);

    std::string _directory;
    unsigned int _chunksPerReport;
    const std::atomic<bool>& _cancelled;
    Ask _ask;
    Report _report;
    Trouble _trouble = Trouble::NONE;
};
