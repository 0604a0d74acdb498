#include "MwFilePlaces.h"

#include <algorithm>
#include <sys/stat.h>

#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr uint64_t FEW_BYTES = 1048576;
constexpr uint64_t MANY_BYTES = 12328960;

constexpr size_t LONGEST_NAME = 255; // bytes, on every file system we meet
constexpr size_t LONGEST_COUNTER = 8;

std::string nameOf(const std::string& path) { return path.substr(path.rfind('/') + 1); }

// Cut so that a counter still fits; not inside a character.
std::string shortened(std::string stem, size_t room)
{
    if (stem.size() <= room)
        return stem;
    while (room > 0 && (static_cast<unsigned char>(stem[room]) & 0xC0) == 0x80)
        --room;
    stem.resize(room);
    return stem;
}

}

namespace MwFilePlaces {

std::string directoryBelow(const std::string& root) { return root + "/" + RECORDINGS_DIRECTORY; }

std::string destinationOf(const std::string& source, const std::string& directory)
{
    return directory + "/" + nameOf(source);
}

std::string freePath(const std::string& source, const std::string& directory)
{
    const std::string name = nameOf(source);
    const size_t dot = name.rfind('.');
    const std::string extension = dot != std::string::npos ? name.substr(dot) : std::string();
    const size_t longest = LONGEST_NAME - LONGEST_COUNTER;
    const std::string stem = shortened(name.substr(0, dot), longest - std::min(longest, extension.size()));
    for (int counter = 1;; ++counter) {
        std::string path = mwFormat("%s/%s_%03d%s", directory.c_str(), stem.c_str(), counter, extension.c_str());
        if (!isTaken(path))
            return path;
    }
}

bool isTaken(const std::string& path)
{
    struct stat status { };
    return ::lstat(path.c_str(), &status) == 0;
}

uint64_t _get_file_size(const std::string& path)
{
    struct stat status { };
    return ::stat(path.c_str(), &status) == 0 ? static_cast<uint64_t>(status.st_size) : 0;
}

unsigned int chunksPerReport(uint64_t totalBytes)
{
    if (totalBytes <= FEW_BYTES)
        return 1;
    return totalBytes <= MANY_BYTES ? 8 : 64;
}

}
