// Names of this application and of others.
#pragma once

#include <string>

namespace platform {

const std::string& appId();
void setAppId(const std::string& id); // before anything else, see app_set_id
bool isAppId(const std::string& id);
// Of the id "com.tovanic.mewlo-lite" the bus name com.tovanic.mewlo_lite.
std::string busNameOf(const std::string& appId);
// An open port is a bus name of its own, so that asking for it never waits for its owner.
std::string portNameOf(const std::string& appId, const std::string& port);

constexpr auto OBJECT_PATH = "/com/tovanic/AppControl";
constexpr auto INTERFACE = "com.tovanic.AppControl1";

std::string executableDirectory(); // of the running program, without a slash at the end
std::string resourceDirectory(); // ends in a slash; empty when there is none

}
