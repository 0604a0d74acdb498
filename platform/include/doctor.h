// What the services found on this machine. Main loop, after ecore_init; asks the buses and waits for their answers.
#pragma once

extern "C" {
// One line per service: its name, what was found, and what takes its place when nothing was (empty when found).
// Answers the number of services that were not found.
int platform_doctor(
    void (*line)(const char* service, const char* found, const char* fallback, void* user_data), void* user_data);
}
