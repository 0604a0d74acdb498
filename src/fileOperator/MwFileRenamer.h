#pragma once

#include <string>

// Gives a recording another path on the same file system, together with its row.
namespace MwFileRenamer {

enum class Outcome { DONE, TAKEN, FAILED };

// Never replaces. When the row cannot follow, the file has its former name again. May wait for others; not on the main
// loop.
[[nodiscard]] Outcome rename(const std::string& from, const std::string& to);

}
