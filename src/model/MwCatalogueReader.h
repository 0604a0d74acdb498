#pragma once

#include <MainLoopMailbox.h>

#include <functional>
#include <thread>
#include <vector>

#include "MwModel.h"

// Reads the catalogue on a thread of its own: with thousands of recordings it would hold the main loop. Main loop only.
class MwCatalogueReader {
public:
    using Files = std::vector<MwFileInfo>;
    // Called on the main loop with what was there when it was last asked for, or later.
    explicit MwCatalogueReader(std::function<void(Files files)> read);
    // Waits for the read that is under way; nothing is called any more.
    ~MwCatalogueReader() = default;
    MwCatalogueReader(const MwCatalogueReader&) = delete;
    MwCatalogueReader& operator=(const MwCatalogueReader&) = delete;

    // However often it is asked while it reads, it reads once more.
    void ask();

private:
    void _start();
    void _finished(Files files);

    std::function<void(Files files)> _read;
    bool _isReading = false;
    bool _isAskedAgain = false;
    platform::MainLoopMailbox _mailbox;
    std::jthread _thread; // ends before what it uses
};
