#pragma once

#include <string>

// What a list shows of texts that come from files: any bytes become markup of one line that says what was meant and
// does nothing. Any thread.
std::string mwDisplayMarkup(const std::string& text);

// A file's name without its extension; a name that begins with its only dot stays whole.
std::string mwWithoutExtension(const std::string& fileName);
