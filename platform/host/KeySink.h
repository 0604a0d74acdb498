// Where a watcher reports what it sees: the name of a state key and its new value. Called on the main loop.
#pragma once

#include <functional>
#include <string>

namespace host {

using KeySink = std::function<void(const std::string& key, const std::string& value)>;

}
