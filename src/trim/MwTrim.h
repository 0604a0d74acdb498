#pragma once

#include <MainLoopMailbox.h>
#include <Mutex.h>
#include <panekit/WSignal.h>

#include <atomic>
#include <condition_variable>
#include <deque>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "MwModel.h"
#include "MwTrimStore.h"

// Cuts a recording down to a time range, as a new file or in place of it, with the bookmarks inside. A worker drives
// the platform's engine by a queue of commands; the outcome arrives as one event on the main loop. Used once; one at a
// time in a process, made and destroyed on the main loop.
class MwTrim {
public:
    enum eventType : int { TRIM_EVENT_FAILED = 0, TRIM_EVENT_DONE = 1 };
    // Why it failed.
    enum class Failure { NONE, CANCELLED, NOT_SUPPORTED, DAMAGED, OUT_OF_STORAGE, CHANGED, OTHER };

    MwTrim();
    // Ends what runs and waits for it.
    virtual ~MwTrim();
    MwTrim(const MwTrim&) = delete;
    MwTrim& operator=(const MwTrim&) = delete;

    // Milliseconds. Once per object. Of a new file the name may be given, else it counts up from the source's.
    bool start(const char* inFile, bool overwrite, int startMs, int endMs, int durationMs, const char* name = nullptr);
    // The event of a cancelled trim is a failure; one that comes too late changes nothing.
    bool cancel();
    // Both hold when the event has arrived.
    [[nodiscard]] Failure getFailure() const { return _failure; }
    [[nodiscard]] std::string getOutputPath() const { return _outputPath; }
    // 0 to 100.
    [[nodiscard]] static int getProgress();

    panekit::WSignal<void(MwTrim::eventType)> trimSignal;

private:
    enum Command : int { CMD_INIT, CMD_DEINIT, CMD_PREPARE, CMD_UNPREPARE, CMD_EXPORT, CMD_CANCEL };

    void _runThread();
    void _work();
    // False when the worker has to end.
    bool _execute(int command);
    void _queue(std::initializer_list<Command> commands);
    bool _initEngine();
    void _deinitEngine();
    bool _prepareEngine();
    void _unprepareEngine();
    bool _exportEngine();
    bool _cancelEngine();
    bool _fail(const char* what);

    void _stateEOSCb();
    bool _getMediaInfo(const std::string& path, std::vector<MwBookmark>* bookmarks, std::string* mediaId);
    std::vector<MwBookmark> _shifted(const std::vector<MwBookmark>& bookmarks) const;
    void _end(eventType event, Failure failure);
    void _failEngine(int error);

    static void _errorCb(int error);
    static void _stateChangedCb(int state);

    static std::atomic<MwTrim*> _pInstance;

    // Written before the worker starts.
    std::string _inputPath;
    bool _overwrite = false;
    int _start = 0;
    int _finish = 0;
    int _duration = 0;

    std::unique_ptr<MwTrimStore> _store; // of the worker, then of the engine's thread
    std::atomic<Failure> _failure = Failure::NONE;
    std::string _outputPath; // read after the event
    std::atomic<bool> _isTold = false;
    bool _isFinished = false; // of the worker

    std::thread _worker;
    platform::Mutex _queueLock;
    std::condition_variable_any _queueSignal;
    std::deque<int> _commands GUARDED_BY(_queueLock);
    platform::MainLoopMailbox _mailbox;
};
