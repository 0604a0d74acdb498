#pragma once

#include <string>

// What the details screen says of a recording.

// "/Device storage/Sounds/Mewlo/Voice 001.m4a": the storage by its name in place of its root.
std::string mwLocationText(const std::string& path);
// "1.5 KB". Bytes; empty from a terabyte on.
std::string mwSizeText(double bytes);
// "00:07", from an hour on "01:00:07". Milliseconds; a second at least.
std::string mwLengthText(int duration);
