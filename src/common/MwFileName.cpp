#include "MwFileName.h"

#include <algorithm>

bool mwIsFileName(const std::string& name, const std::string& ending)
{
    constexpr size_t LONGEST = 255; // bytes
    const auto isControl = [](char each) { return static_cast<unsigned char>(each) < ' ' || each == '\x7f'; };
    return name.find_first_not_of(' ') != std::string::npos && name.front() != '.'
        && name.find('/') == std::string::npos && std::none_of(name.begin(), name.end(), isControl)
        && name.size() + ending.size() <= LONGEST;
}
