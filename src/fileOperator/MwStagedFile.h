#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

// A file on its way to another folder: complete under a hidden name there before it gets its own, so that a half copied
// one is never seen. What is not published is removed again; what a killed process leaves, sweep() removes. On the
// worker's thread.
class MwStagedFile {
public:
    enum class Outcome { DONE, EXISTS, FAILED };
    using Report = std::function<void(uint64_t bytes)>;

    MwStagedFile(std::string source, std::string directory);
    ~MwStagedFile();
    MwStagedFile(const MwStagedFile&) = delete;
    MwStagedFile& operator=(const MwStagedFile&) = delete;

    // Puts the whole file beside its future place: without copying on the same file system, else by a copy that keeps
    // mode and times and is flushed. Reports the bytes done every so many chunks; false when it failed or was
    // cancelled.
    [[nodiscard]] bool stage(unsigned int chunksPerReport, const Report& report, const std::atomic<bool>& cancelled);
    // Why it failed, an error number.
    [[nodiscard]] int error() const { return _error; }
    // Gives it its name, and flushes that. Without replacing, a taken name is answered; replacing is one step, so that
    // either the old or the new file is there at any time.
    [[nodiscard]] Outcome publish(const std::string& destination, bool replace);
    // Its hidden name; empty when there is none.
    [[nodiscard]] const std::string& getPath() const { return _path; }
    // Whether the source is still there after publishing, to be removed.
    [[nodiscard]] bool leavesSource() const { return _kind != Kind::SOURCE_ITSELF; }

    // Removes what dead processes left in a directory.
    static void sweep(const std::string& directory);

private:
    enum class Kind { NONE, LINK, COPY, SOURCE_ITSELF };

    bool _link();
    static bool _replace(const std::string& from, const std::string& destination);
    void _discard();

    std::string _source;
    std::string _directory;
    std::string _path;
    Kind _kind = Kind::NONE;
    int _error = 0;
    int _file = -1; // of a copy: open, and locked, until it has its name
};
