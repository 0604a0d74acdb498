#pragma once

#include <cstdint>
#include <string>

// Where moved files go and what they are called there. Questions only; any thread.
namespace MwFilePlaces {

// One chunk of a copy, in bytes.
constexpr size_t CHUNK = 16384;

// The recordings directory below a root, and the path of a file in it.
std::string directoryBelow(const std::string& root);
std::string destinationOf(const std::string& source, const std::string& directory);
// The first path of the kind "Name_001.ext" that is free in the directory.
std::string freePath(const std::string& source, const std::string& directory);
// Whether anything has that name, a link that leads nowhere included.
bool isTaken(const std::string& path);
// Bytes; 0 when there is no such file.
uint64_t _get_file_size(const std::string& path);
// After how many chunks the progress is reported, so that the messages stay few.
unsigned int chunksPerReport(uint64_t totalBytes);

}
