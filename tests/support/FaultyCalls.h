#pragma once

#include <functional>
#include <string>
#include <string_view>

#include <sys/types.h>

// The system's calls that change files, made to fail or to kill: this file's own versions stand in front of the C
// library's for everything in the test program, SQLite included. Counts only what happens below a directory. Without
// effect under the thread sanitizer.
namespace support::faults {

enum class Effect { COUNT, FAIL, KILL };

// The call of that number (from 1) gets the effect, and each before it none.
void arm(const std::string& below, int number, Effect effect, int error = 0);
void disarm();
// Calls since arm().
int count();

// What has been done to a file: written at a place, cut to a length, flushed.
enum class Deed { WRITTEN, CUT, FLUSHED };
// Told every deed after arm(), on the thread that did it. None: an empty function.
void observe(std::function<void(Deed deed, const std::string& path, off_t at, std::string_view data)> observer);

}
