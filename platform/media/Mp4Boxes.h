#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace media {

// The boxes of an MP4 file in memory.
struct Mp4Box {
    std::string_view type;
    std::string_view content;
    std::string_view whole;
};

// Takes the first box off the bytes; none when they end or are damaged.
inline std::optional<Mp4Box> takeBox(std::string_view& bytes);

inline uint64_t bigEndian(std::string_view bytes, size_t offset, size_t count)
{
    uint64_t value = 0;
    for (size_t i = offset; i < offset + count && i < bytes.size(); ++i)
        value = value << 8 | static_cast<unsigned char>(bytes[i]);
    return value;
}

inline void putBigEndian(std::string& out, uint64_t value, int count)
{
    for (int shift = 8 * (count - 1); shift >= 0; shift -= 8)
        out.push_back(static_cast<char>(value >> shift));
}

inline std::string makeBox(std::string_view type, std::string_view content)
{
    std::string out;
    out.reserve(content.size() + 8);
    putBigEndian(out, content.size() + 8, 4);
    return out.append(type).append(content);
}

inline std::optional<Mp4Box> takeBox(std::string_view& bytes)
{
    if (bytes.size() < 8)
        return {};
    uint64_t size = bigEndian(bytes, 0, 4);
    size_t head = 8;
    if (size == 1 && bytes.size() >= 16) {
        size = bigEndian(bytes, 8, 8);
        head = 16;
    } else if (size == 0) {
        size = bytes.size();
    }
    if (size < head || size > bytes.size())
        return {};
    const Mp4Box box{bytes.substr(4, 4), bytes.substr(head, size - head), bytes.substr(0, size)};
    bytes.remove_prefix(size);
    return box;
}

// The content of the first box of a type side by side in the bytes.
inline std::optional<std::string_view> findBox(std::string_view bytes, std::string_view type)
{
    while (const auto box = takeBox(bytes)) {
        if (box->type == type)
            return box->content;
    }
    return {};
}

}
