#pragma once

#include <string>

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

}
