#include "state/Trees.h"

#include "state/Directories.h"

#include <charconv>

namespace platform {

namespace {

    std::string below(const std::string& directory, const char* name)
    {
        return directory.empty() ? std::string() : directory + name;
    }

}

// Never destroyed: worker threads may still read while the process ends.
KeyTree& stateTree()
{
    static auto* tree = new KeyTree(
        below(runtimeDirectory(), "/state"), below(configDirectory(), "/state"), KeyTree::Durability::MEMORY);
    return *tree;
}

KeyTree& preferenceTree()
{
    static auto* tree = new KeyTree(below(configDirectory(), "/preferences"), "", KeyTree::Durability::DISK);
    return *tree;
}

std::optional<int> parseInt(const std::optional<std::string>& text)
{
    if (!text)
        return std::nullopt;
    int value = 0;
    const char* end = text->data() + text->size();
    const auto [stop, error] = std::from_chars(text->data(), end, value);
    return error == std::errc() && stop == end ? std::optional(value) : std::nullopt;
}

std::optional<bool> parseBool(const std::optional<std::string>& text)
{
    if (text == "1" || text == "true")
        return true;
    if (text == "0" || text == "false")
        return false;
    return std::nullopt;
}

}
