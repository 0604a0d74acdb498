#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <sys/stat.h>

// Copies the content of one open file to another, with the kernel's help where it can. Any thread.
class MwFileCopy {
public:
    using Report = std::function<void(uint64_t bytes)>;

    // Both descriptors are borrowed. Reports the bytes since the last report.
    MwFileCopy(int from, int to, unsigned int chunksPerReport, Report report);

    // False when it failed or was cancelled.
    [[nodiscard]] bool run(const std::atomic<bool>& cancelled);
    // Mode and times that the source had before it was read.
    [[nodiscard]] bool copyAttributes() const;

private:
    enum class Step { DONE, MORE, UNABLE, FAILED };

    bool _shareBlocks();
    [[nodiscard]] bool _reserve() const;
    Step _copyInKernel();
    Step _sendInKernel();
    Step _copyThroughBuffer();
    bool _writeAll(const char* data, size_t size);
    Step _advanced(ssize_t bytes);

    int _from;
    int _to;
    unsigned int _chunksPerReport;
    Report _report;
    struct stat _source { };
    off_t _done = 0;
    uint64_t _pending = 0;
};
