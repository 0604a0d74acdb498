#include "storage.h"

#include "state/Log.h"
#include "storage/Roots.h"

#include <cerrno>
#include <charconv>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;
constexpr int NOT_SUPPORTED = -2;

// Some file systems count in fragments; callers multiply by the block size.
void useFragmentsAsBlocks(struct statvfs& size) { size.f_bsize = size.f_frsize; }

// A variable with a number of bytes lowers the answer, to try out a full storage.
void applyCap(struct statvfs& size, const char* variable)
{
    const char* text = std::getenv(variable);
    if (text == nullptr)
        return;
    unsigned long long cap = 0;
    if (std::from_chars(text, text + std::strlen(text), cap).ec != std::errc()) {
        PLATFORM_LOGE("%s: %s is no number", variable, text);
        return;
    }
    if (cap >= static_cast<unsigned long long>(size.f_bavail) * size.f_frsize)
        return;
    size.f_blocks *= size.f_frsize;
    size.f_bsize = size.f_frsize = 1;
    size.f_bavail = size.f_bfree = cap;
}

int sizeOf(const char* root, const char* variable, struct statvfs* size)
{
    if (size == nullptr)
        return INVALID_PARAMETER;
    if (::statvfs(root, size) != 0) {
        PLATFORM_LOGW("%s: %s", root, std::strerror(errno));
        return NOT_SUPPORTED;
    }
    useFragmentsAsBlocks(*size);
    applyCap(*size, variable);
    return NONE;
}

}

int storage_get_internal_memory_size(struct statvfs* size)
{
    return sizeOf(storage_device_root(), "MEWLO_FREE_BYTES_DEVICE", size);
}

int storage_get_external_memory_size(struct statvfs* size)
{
    return sizeOf(storage_card_root(), "MEWLO_FREE_BYTES_CARD", size);
}

const char* storage_device_root(void)
{
    static const auto* root = new std::string(platform::resolveDeviceRoot());
    return root->c_str();
}

const char* storage_card_root(void)
{
    thread_local std::string root;
    root = platform::resolveCardRoot();
    return root.c_str();
}

const char* storage_private_root(void)
{
    static const auto* root = new std::string(platform::resolvePrivateRoot(storage_device_root()));
    return root->c_str();
}
