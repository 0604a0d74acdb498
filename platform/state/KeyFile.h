// One value in one file: read whole, replaced atomically. Any thread, any number of processes.
#pragma once

#include <optional>
#include <string>

namespace platform {

// Without the line end that a shell appends.
std::optional<std::string> readKeyFile(const std::string& path);
// Durable: neither the old nor the new value is lost by a power cut.
bool replaceKeyFile(const std::string& path, const std::string& value, bool durable);
// What killed writers left behind, older than a minute.
void removeStaleTemporaries(const std::string& root);

}
