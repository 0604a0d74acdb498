#include <Mutex.h>
#include <video_edit.h>

#include <dlog.h>

#include <fcntl.h>

#include <atomic>
#include <cerrno>
#include <memory>
#include <optional>
#include <thread>
#include <utility>

#include "media/SoundCut.h"

namespace {

int toError(int number)
{
    switch (number) {
    case 0:
        return VIDEO_EDIT_ERROR_NONE;
    case EINVAL:
        return VIDEO_EDIT_ERROR_INVALID_PARAMETER;
    case ENOTSUP:
        return VIDEO_EDIT_ERROR_NOT_SUPPORTED;
    case EBADMSG:
        return VIDEO_EDIT_ERROR_DAMAGED;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
        return VIDEO_EDIT_ERROR_OUT_OF_STORAGE;
    case ECANCELED:
        return VIDEO_EDIT_ERROR_CANCELLED;
    default:
        return VIDEO_EDIT_ERROR_IO;
    }
}

// The engine of the process: what was prepared, and the thread that exports it.
class Engine {
public:
    int init()
    {
        const platform::Lock lock(_mutex);
        if (_state != VIDEO_EDIT_STATE_NONE)
            return VIDEO_EDIT_ERROR_INVALID_STATE;
        _state = VIDEO_EDIT_STATE_INITIALIZED;
        return VIDEO_EDIT_ERROR_NONE;
    }

    int deinit()
    {
        cancel();
        const platform::Lock lock(_mutex);
        if (std::exchange(_state, VIDEO_EDIT_STATE_NONE) == VIDEO_EDIT_STATE_NONE)
            return VIDEO_EDIT_ERROR_INVALID_STATE;
        _cut.reset();
        errorCallback = nullptr;
        stateCallback = nullptr;
        return VIDEO_EDIT_ERROR_NONE;
    }

    int prepare(const video_edit_clip_s& clip)
    {
        const platform::Lock lock(_mutex);
        if (_state != VIDEO_EDIT_STATE_INITIALIZED)
            return VIDEO_EDIT_ERROR_INVALID_STATE;
        int error = 0;
        _cut = media::SoundCut::open(clip.path, error);
        if (!_cut)
            return toError(error);
        _range = {clip.start, clip.end};
        _state = VIDEO_EDIT_STATE_PREPARED;
        return VIDEO_EDIT_ERROR_NONE;
    }

    int unprepare()
    {
        join();
        const platform::Lock lock(_mutex);
        if (_state == VIDEO_EDIT_STATE_NONE || _state == VIDEO_EDIT_STATE_INITIALIZED)
            return VIDEO_EDIT_ERROR_INVALID_STATE;
        _cut.reset();
        _state = VIDEO_EDIT_STATE_INITIALIZED;
        return VIDEO_EDIT_ERROR_NONE;
    }

    int start(const char* path)
    {
        const platform::Lock lock(_mutex);
        if (_state != VIDEO_EDIT_STATE_PREPARED)
            return VIDEO_EDIT_ERROR_INVALID_STATE;
        media::FileDescriptor target(::open(path, O_RDWR | O_CLOEXEC | O_NOFOLLOW));
        if (!target)
            return toError(errno);
        watch.cancelled = false;
        watch.percent = 0;
        _state = VIDEO_EDIT_STATE_EXPORTING;
        _thread = std::thread([this, held = std::move(target)] { _export(held.get()); });
        return VIDEO_EDIT_ERROR_NONE;
    }

    int cancel()
    {
        watch.cancelled = true;
        join();
        const platform::Lock lock(_mutex);
        if (_state == VIDEO_EDIT_STATE_EXPORTING)
            _state = VIDEO_EDIT_STATE_PREPARED;
        return VIDEO_EDIT_ERROR_NONE;
    }

    media::ExportWatch watch;
    std::atomic<video_edit_error_received_cb> errorCallback = nullptr;
    std::atomic<video_edit_state_changed_cb> stateCallback = nullptr;

private:
    void join()
    {
        std::thread finished;
        {
            const platform::Lock lock(_mutex);
            finished = std::move(_thread);
        }
        if (finished.joinable())
            finished.join();
    }

    void _export(int target)
    {
        const int result = toError(_cut->write(_range, target, watch));
        if (watch.cancelled)
            return;
        if (result != VIDEO_EDIT_ERROR_NONE) {
            __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "MEWLO", "the recording cannot be cut: %d", result);
            if (const auto callback = errorCallback.load())
                callback(result);
            return;
        }
        {
            const platform::Lock lock(_mutex);
            _state = VIDEO_EDIT_STATE_END_OF_STREAM;
        }
        if (const auto callback = stateCallback.load())
            callback(VIDEO_EDIT_STATE_END_OF_STREAM);
    }

    platform::Mutex _mutex;
    int _state GUARDED_BY(_mutex) = VIDEO_EDIT_STATE_NONE;
    std::thread _thread GUARDED_BY(_mutex);
    std::unique_ptr<media::SoundCut> _cut; // of the thread while it runs
    media::SoundCut::Range _range;
};

Engine& engine()
{
    static Engine instance;
    return instance;
}

}

extern "C" {

int video_edit_init(void) { return engine().init(); }

int video_edit_deinit(void) { return engine().deinit(); }

int video_edit_set_error_received_cb(video_edit_error_received_cb callback)
{
    engine().errorCallback = callback;
    return VIDEO_EDIT_ERROR_NONE;
}

int video_edit_set_state_changed_cb(video_edit_state_changed_cb callback)
{
    engine().stateCallback = callback;
    return VIDEO_EDIT_ERROR_NONE;
}

int video_edit_prepare(int project, const video_edit_project_s* record)
{
    if (project != VIDEO_EDIT_PROJECT_SOUND || record == nullptr || record->clip == nullptr
        || record->clip->path == nullptr || record->clip->start < 0 || record->clip->end <= record->clip->start)
        return VIDEO_EDIT_ERROR_INVALID_PARAMETER;
    return engine().prepare(*record->clip);
}

int video_edit_unprepare(void) { return engine().unprepare(); }

int video_edit_export(const char* path)
{
    return path != nullptr ? engine().start(path) : VIDEO_EDIT_ERROR_INVALID_PARAMETER;
}

int video_edit_export_cancel(void) { return engine().cancel(); }

int video_edit_get_progress(int* percent)
{
    if (percent == nullptr)
        return VIDEO_EDIT_ERROR_INVALID_PARAMETER;
    *percent = engine().watch.percent;
    return VIDEO_EDIT_ERROR_NONE;
}
}
