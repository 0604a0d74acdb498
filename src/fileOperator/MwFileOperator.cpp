#include "MwFileOperator.h"

#include <Ecore.h>

#include <algorithm>
#include <numeric>
#include <utility>

#include "MwFileDeleter.h"
#include "MwFilePlaces.h"
#include "MwLog.h"
#include "MwMoveRecord.h"
#include "MwStagedFile.h"
#include "MwStorageRoots.h"

namespace {

constexpr double START_DELAY = 0.3; // seconds
constexpr auto UPDATE = "update";
constexpr auto FINISH = "finish";

uint64_t sizeOfAll(MwFileOperator::Type type, const std::vector<MwFileOperator::Source>& sources)
{
    if (type != MwFileOperator::MOVE_TO_PRIVATE && type != MwFileOperator::REMOVE_FROM_PRIVATE)
        return 0;
    const uint64_t size = std::accumulate(sources.begin(), sources.end(), uint64_t{0},
        [](uint64_t sum, const auto& source) { return sum + MwFilePlaces::_get_file_size(source.path); });
    MW_LOGW("totalSize :%lld", static_cast<long long>(size));
    return size;
}

}

double MwFileOperator::Progress::share() const
{
    if (totalBytes > 0)
        return std::min(1.0, static_cast<double>(doneBytes) / static_cast<double>(totalBytes));
    return allFiles > 0 ? static_cast<double>(doneFiles) / static_cast<double>(allFiles) : 1.0;
}

MwFileOperator::MwFileOperator(Type type, std::vector<Source> sources, Callbacks callbacks)
    : _type(type)
    , _sources(std::move(sources))
    , _totalBytes(sizeOfAll(type, _sources))
    , _callbacks(std::move(callbacks))
    , _pipe(ecore_pipe_add(_pipeCb, this))
{
}

MwFileOperator::~MwFileOperator()
{
    requestCancel();
    panekit::WTimer::destroy(_startTimer);
    _join();
    if (_pipe != nullptr)
        ecore_pipe_del(_pipe);
}

void MwFileOperator::start()
{
    WASSERT(eina_main_loop_is());
    if (_type == RENAME)
        return _begin();
    _startTimer = panekit::WTimer::addTimer(START_DELAY, [this](void*) {
        _begin();
        return false;
    });
}

void MwFileOperator::_begin()
{
    _begun = true;
    _worker = std::thread([this] { _run(); });
}

void MwFileOperator::requestCancel()
{
    const std::lock_guard lock(_mutex);
    _cancelRequested = true;
    _answered.notify_all();
}

void MwFileOperator::cancelAndWait()
{
    requestCancel();
    panekit::WTimer::destroy(_startTimer);
    _join();
    _finished = true;
}

void MwFileOperator::_join()
{
    if (_worker.joinable())
        _worker.join();
}

void MwFileOperator::answer(MwClashAction action)
{
    const std::lock_guard lock(_mutex);
    _action = action;
    _waiting = false;
    _answered.notify_all();
}

void MwFileOperator::setApplyToAll(bool on)
{
    const std::lock_guard lock(_mutex);
    _applyToAll = on;
}

MwFileOperator::Progress MwFileOperator::progress() const
{
    return {_doneBytes, _totalBytes, _doneFiles, _sources.size()};
}

std::string MwFileOperator::currentPath() const
{
    const std::lock_guard lock(_mutex);
    return _currentPath;
}

void MwFileOperator::_pipeCb(void* data, void* buffer, unsigned int size)
{
    auto* self = static_cast<MwFileOperator*>(data);
    // A callback may delete the operator, and this function with it: nothing follows.
    self->_onMoveFilePipe(buffer != nullptr ? std::string(static_cast<char*>(buffer), size) : std::string());
}

void MwFileOperator::_onMoveFilePipe(const std::string& message)
{
    if (_finished)
        return;
    const Callbacks callbacks = _callbacks;
    if (message == UPDATE) {
        _updateOnItsWay = false;
        if (callbacks.onUpdate)
            callbacks.onUpdate();
    } else if (message == FINISH || message.empty()) {
        _join(); // its last words
        _finished = true;
        if (callbacks.onFinished)
            callbacks.onFinished();
    } else if (callbacks.onClash && !_cancelRequested) {
        callbacks.onClash(message);
    }
}

void MwFileOperator::_run()
{
    if (_type == RENAME)
        _renameFile();
    else if (_type == DELETE || _type == DELETE_FOR_GOOD)
        _deleteFiles();
    else
        _moveFiles();
}

void MwFileOperator::_deleteFiles()
{
    MwFileDeleter deleter(_type == DELETE_FOR_GOOD);
    for (const Source& source : _sources) {
        if (_cancelRequested) {
            MW_LOGW("canceled deleting");
            break;
        }
        deleter.remove(source.path, source.mediaId);
    }
    _donePaths = deleter.finish();
    _doneFiles = _donePaths.size();
    _withoutTrash = deleter.withoutTrash();
    _failed = !_cancelRequested && _donePaths.size() + _withoutTrash.size() < _sources.size();
    _tell({});
}

void MwFileOperator::_moveFiles()
{
    const std::string directory
        = MwFilePlaces::directoryBelow(_type == MOVE_TO_PRIVATE ? mwPrivateRoot() : mwDeviceRoot());
    MwStagedFile::sweep(directory);
    MwMoveRecord::recover(directory);
    MwFileMover mover(
        directory, _totalBytes, _cancelRequested, [this](const std::string& path) { return _ask(path); },
        [this](uint64_t bytes) { _report(bytes); });
    for (const Source& source : _sources) {
        if (_cancelRequested)
            break;
        if (!_moveFile(mover, source.path)) {
            MW_LOGE("stopped _moveFile!!!");
            _failed = !_cancelRequested;
            _trouble = mover.trouble();
            break;
        }
        _donePaths.push_back(source.path);
        ++_doneFiles;
        _tellUpdate();
    }
    _tell(FINISH);
}

void MwFileOperator::_renameFile()
{
    const auto& [path, mediaId, newPath] = _sources.front();
    _renamed = MwFileRenamer::rename(path, newPath);
    if (_renamed == MwFileRenamer::Outcome::DONE)
        _moved.push_back({path, newPath});
    _tell(FINISH);
}

bool MwFileOperator::_moveFile(MwFileMover& mover, const std::string& path)
{
    {
        const std::lock_guard lock(_mutex);
        _currentPath = path;
    }
    std::string destination;
    const auto outcome = mover.move(path, destination);
    if (outcome == MwFileMover::Outcome::MOVED)
        _moved.push_back({path, destination});
    return outcome != MwFileMover::Outcome::FAILED;
}

MwClashAction MwFileOperator::_ask(const std::string& path)
{
    std::unique_lock lock(_mutex);
    if (_applyToAll && _action != MwClashAction::NONE)
        return _action;
    _waiting = true;
    lock.unlock();
    _tell(path);
    lock.lock();
    _answered.wait(lock, [this] { return !_waiting || _cancelRequested; });
    return _cancelRequested ? MwClashAction::CANCEL : _action;
}

void MwFileOperator::_report(uint64_t bytes)
{
    _doneBytes += bytes;
    _tellUpdate();
}

void MwFileOperator::_tellUpdate()
{
    if (!_updateOnItsWay.exchange(true))
        _tell(UPDATE);
}

void MwFileOperator::_tell(const std::string& message)
{
    if (ecore_pipe_write(_pipe, message.data(), static_cast<unsigned int>(message.size())) == EINA_FALSE)
        MW_LOGE("ecore_pipe_write failed!!!");
}
