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
{
}

MwFileOperator::~MwFileOperator()
{
    requestCancel();
    panekit::WTimer::destroy(_startTimer);
    _join();
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
    const platform::Lock lock(_mutex);
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
    const platform::Lock lock(_mutex);
    _action = action;
    _waiting = false;
    _answered.notify_all();
}

void MwFileOperator::setApplyToAll(bool on)
{
    const platform::Lock lock(_mutex);
    _applyToAll = on;
}

MwFileOperator::Progress MwFileOperator::progress() const
{
    return {_doneBytes, _totalBytes, _doneFiles, _sources.size()};
}

std::string MwFileOperator::currentPath() const
{
    const platform::Lock lock(_mutex);
    return _currentPath;
}

// A callback may delete the operator, and the function that makes it with it: nothing follows.
void MwFileOperator::_onUpdate()
{
    _updateOnItsWay = false;
    if (const auto tell = _callbacks.onUpdate; tell && !_finished)
        tell();
}

void MwFileOperator::_onClash(const std::string& path)
{
    if (const auto ask = _callbacks.onClash; ask && !_finished && !_cancelRequested)
        ask(path);
}

void MwFileOperator::_onFinish()
{
    if (_finished)
        return;
    _join();
    _finished = true;
    if (const auto tell = _callbacks.onFinished; tell)
        tell();
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
    _tellFinish();
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
    _tellFinish();
}

void MwFileOperator::_renameFile()
{
    const auto& [path, mediaId, newPath] = _sources.front();
    _renamed = MwFileRenamer::rename(path, newPath);
    if (_renamed == MwFileRenamer::Outcome::DONE)
        _moved.push_back({path, newPath});
    _tellFinish();
}

bool MwFileOperator::_moveFile(MwFileMover& mover, const std::string& path)
{
    {
        const platform::Lock lock(_mutex);
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
    platform::Lock lock(_mutex);
    if (_applyToAll && _action != MwClashAction::NONE)
        return _action;
    _waiting = true;
    _mailbox.post([this, path] { _onClash(path); });
    _answered.wait(lock, [this]() REQUIRES(_mutex) { return !_waiting || _cancelRequested; });
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
        _mailbox.post([this] { _onUpdate(); });
}

void MwFileOperator::_tellFinish()
{
    _mailbox.post([this] { _onFinish(); });
}
