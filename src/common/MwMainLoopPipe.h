#pragma once

struct _Ecore_Pipe;

// Carries closures from any thread to the main loop, in the order written, each run once. Opened and closed on the main
// loop by its owner.
class MwMainLoopPipe {
public:
    using Closure = void (*)(void* data);

    MwMainLoopPipe() = default;
    ~MwMainLoopPipe();
    MwMainLoopPipe(const MwMainLoopPipe&) = delete;
    MwMainLoopPipe& operator=(const MwMainLoopPipe&) = delete;

    void open();
    // What is still on its way runs first.
    void close();
    // Runs closure(data) at once on the main loop, else soon. Without an open pipe the call is logged and dropped.
    void call(Closure closure, void* data);

private:
    static void _pipeCb(void* data, void* buffer, unsigned int size);

    _Ecore_Pipe* _pipe = nullptr;
};
