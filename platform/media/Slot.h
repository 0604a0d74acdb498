#pragma once

namespace media {

// A callback of the application with the data it wants back; empty ones are not called.
template <typename Function>
struct Slot {
    Function function = nullptr;
    void* userData = nullptr;

    template <typename... Values>
    void operator()(Values... values) const
    {
        if (function != nullptr)
            function(values..., userData);
    }
};

}
