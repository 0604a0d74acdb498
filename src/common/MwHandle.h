#pragma once

#include <type_traits>
#include <utility>

// Owns one C handle and destroys it exactly once.
template <typename Handle, auto Destroy>
class MwHandle {
public:
    MwHandle() = default;
    explicit MwHandle(Handle handle)
        : _handle(handle)
    {
    }
    MwHandle(MwHandle&& other) noexcept
        : _handle(other.release())
    {
    }
    MwHandle& operator=(MwHandle&& other) noexcept
    {
        if (this != &other) {
            close();
            _handle = other.release();
        }
        return *this;
    }
    ~MwHandle() { close(); }

    explicit operator bool() const { return _handle != Handle{}; }
    [[nodiscard]] Handle get() const { return _handle; }
    // For create(&handle).
    [[nodiscard]] Handle* out()
    {
        close();
        return &_handle;
    }
    [[nodiscard]] Handle release() { return std::exchange(_handle, Handle{}); }
    // Destroys now; answers the service's code, for the log line.
    int close()
    {
        const Handle handle = release();
        if (handle == Handle{})
            return 0;
        if constexpr (std::is_void_v<decltype(Destroy(handle))>) {
            Destroy(handle);
            return 0;
        } else {
            return static_cast<int>(Destroy(handle));
        }
    }

private:
    Handle _handle{};
};
