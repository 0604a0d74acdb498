#pragma once

#include <string>

// Whether a recording may be called that, with its ending: something can be seen of it, it hides no file and leads
// nowhere else, and every file system takes it.
bool mwIsFileName(const std::string& name, const std::string& ending);
