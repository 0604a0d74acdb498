#include "MwMainLoopPipe.h"

#include <Ecore.h>

#include <utility>

#include "MwLog.h"

namespace {

struct Message {
    MwMainLoopPipe::Closure closure;
    void* data;
};

}

MwMainLoopPipe::~MwMainLoopPipe() { close(); }

void MwMainLoopPipe::open()
{
    if (_pipe == nullptr)
        _pipe = ecore_pipe_add(_pipeCb, nullptr);
}

void MwMainLoopPipe::close()
{
    if (_pipe == nullptr)
        return;
    ecore_pipe_wait(_pipe, 0, 0.0);
    ecore_pipe_del(std::exchange(_pipe, nullptr));
}

void MwMainLoopPipe::call(Closure closure, void* data)
{
    if (_pipe == nullptr) {
        MW_LOGE("_pipe is nullptr");
        return;
    }
    if (eina_main_loop_is()) {
        closure(data);
        return;
    }
    const Message message{closure, data};
    if (ecore_pipe_write(_pipe, &message, sizeof message) == EINA_FALSE)
        MW_LOGE("ecore_pipe_write failed!!!");
}

void MwMainLoopPipe::_pipeCb(void*, void* buffer, unsigned int)
{
    if (buffer == nullptr) {
        MW_LOGE("buffer is nullptr");
        return;
    }
    const Message message = *static_cast<Message*>(buffer);
    message.closure(message.data);
}
