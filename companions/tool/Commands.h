// The subcommands of mewlo-tool. Each gets what follows its name and answers the exit status.
#pragma once

#include <string>
#include <vector>

namespace tool {

using Arguments = std::vector<std::string>;

int record(const Arguments& arguments);
int request(const Arguments& arguments);
int list(const Arguments& arguments);
int trim(const Arguments& arguments);
int state(const Arguments& arguments);
int preference(const Arguments& arguments);
int locks(const Arguments& arguments);
int usage(const Arguments& arguments);
int privateStorage(const Arguments& arguments);
int doctor(const Arguments& arguments);

constexpr int OK = 0, FAILED = 1, WRONG_USE = 2;

// The value behind an option such as "--format"; empty when it is not given.
std::string option(const Arguments& arguments, const std::string& name);
// A whole text that is a decimal number.
bool parseNumber(const std::string& text, long& number);
// A text that stays on its line and in its column: backslash, newline, tab and other control characters as in C
// (\\ \n \t \ooo).
std::string escaped(const std::string& text);

}
