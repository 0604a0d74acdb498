#pragma once

#include <MainLoopMailbox.h>
#include <Mutex.h>
#include <panekit/WTimer.h>

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "MwFileMover.h"
#include "MwFileRenamer.h"

// Deletes, moves or renames recordings on a thread of its own and tells the main loop how it gets on. Owned by the
// screen that started it, which may delete it at any time, also in a callback: what runs is then cancelled and waited
// for, and every file is whole. All operations and callbacks on the main loop.
class MwFileOperator {
public:
    enum Type : int { DELETE = 1, MOVE_TO_PRIVATE = 2, REMOVE_FROM_PRIVATE = 3, RENAME = 4, DELETE_FOR_GOOD = 5 };

    struct Source {
        std::string path;
        std::string mediaId; // for deleting; empty when it is not catalogued
        std::string newPath{}; // for renaming
    };
    struct Moved {
        std::string from;
        std::string to;
    };
    struct Progress {
        uint64_t doneBytes = 0;
        uint64_t totalBytes = 0;
        size_t doneFiles = 0;
        size_t allFiles = 0;

        // 0 to 1.
        [[nodiscard]] double share() const;
        [[nodiscard]] int percent() const { return static_cast<int>(share() * 100); }
    };
    struct Callbacks {
        std::function<void()> onUpdate; // of a move, thinned out
        std::function<void(const std::string& path)> onClash; // wants answer()
        std::function<void()> onFinished; // once, however it ended
    };

    MwFileOperator(Type type, std::vector<Source> sources, Callbacks callbacks);
    ~MwFileOperator();
    MwFileOperator(const MwFileOperator&) = delete;
    MwFileOperator& operator=(const MwFileOperator&) = delete;

    // Begins a moment later, so that the popup is on the screen first; renaming, which has none, at once.
    void start();
    // Stops after the file, or in the copy, that is at work; the end is reported as ever.
    void requestCancel();
    // The same, waiting for it: nothing is reported any more.
    void cancelAndWait();
    // Of the clash that was reported; cancel leaves that file where it is.
    void answer(MwClashAction action);
    // The next answer holds for all further clashes.
    void setApplyToAll(bool on);

    [[nodiscard]] Type type() const { return _type; }
    // The worker runs or has run.
    [[nodiscard]] bool hasBegun() const { return _begun; }
    [[nodiscard]] bool isFinished() const { return _finished; }
    [[nodiscard]] bool isCancelRequested() const { return _cancelRequested; }
    [[nodiscard]] Progress progress() const;
    // The file at work, also the one of a clash.
    [[nodiscard]] std::string currentPath() const;
    // After the end: what was processed (skipped ones included), what was moved, and whether a file stopped it.
    [[nodiscard]] const std::vector<std::string>& donePaths() const { return _donePaths; }
    [[nodiscard]] const std::vector<Moved>& moved() const { return _moved; }
    [[nodiscard]] bool hasFailed() const { return _failed; }
    // Of a move that has failed.
    [[nodiscard]] MwFileMover::Trouble trouble() const { return _trouble; }
    [[nodiscard]] size_t allFiles() const { return _sources.size(); }
    // Of a delete: what only goes for good, and is still there.
    [[nodiscard]] const std::vector<std::string>& withoutTrash() const { return _withoutTrash; }
    [[nodiscard]] MwFileRenamer::Outcome renameOutcome() const { return _renamed; }

private:
    void _onUpdate();
    void _onClash(const std::string& path);
    void _onFinish();
    void _begin();
    void _join();

    // On the worker.
    void _run();
    void _deleteFiles();
    void _moveFiles();
    void _renameFile();
    bool _moveFile(MwFileMover& mover, const std::string& path);
    MwClashAction _ask(const std::string& path);
    void _report(uint64_t bytes);
    void _tellUpdate();
    void _tellFinish();

    const Type _type;
    const std::vector<Source> _sources;
    const uint64_t _totalBytes;
    Callbacks _callbacks;
    panekit::WTimer::Weak _startTimer;
    platform::MainLoopMailbox _mailbox;
    std::thread _worker;
    bool _begun = false;
    bool _finished = false;

    std::atomic<bool> _cancelRequested = false;
    std::atomic<bool> _updateOnItsWay = false; // one at a time
    std::atomic<uint64_t> _doneBytes = 0;
    std::atomic<size_t> _doneFiles = 0;
    mutable platform::Mutex _mutex;
    std::condition_variable_any _answered;
    std::string _currentPath GUARDED_BY(_mutex);
    MwClashAction _action GUARDED_BY(_mutex) = MwClashAction::NONE;
    bool _waiting GUARDED_BY(_mutex) = false;
    bool _applyToAll GUARDED_BY(_mutex) = false;

    std::vector<std::string> _donePaths; // the worker's until it has ended
    std::vector<Moved> _moved;
    std::vector<std::string> _withoutTrash;
    MwFileMover::Trouble _trouble = MwFileMover::Trouble::NONE;
    MwFileRenamer::Outcome _renamed = MwFileRenamer::Outcome::FAILED;
    bool _failed = false;
};
