// Which programs serve which application ids: key files <id>.app with a group [Application] and the keys
//   Exec=        program and arguments; %u URI, %f first path, %F all paths, %d storage root of the device
//   Reply=       protocol (speaks launch requests), exit (its exit status is the result), none
//   Operations=  operations it serves, separated by semicolons
//   Name=        for people
// A program without a slash is looked for beside the running one, then in PATH. Any thread.
#pragma once

#include "launch/AppControl.h"

#include <optional>
#include <string>
#include <vector>

namespace platform {

enum class ReplyKind { PROTOCOL, EXIT, NONE };

struct AppEntry {
    std::string id;
    std::string exec;
    std::vector<std::string> operations;
    ReplyKind reply = ReplyKind::PROTOCOL;
};

std::optional<AppEntry> findApp(const std::string& id);
std::optional<AppEntry> findAppByOperation(const std::string& operation);
// The words to run, the program resolved to a path where one was found; empty when the line is not usable.
std::vector<std::string> commandOf(const AppEntry& entry, const app_control_s& request);

}
