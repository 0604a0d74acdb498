#pragma once

#include "support/PulseServer.h"
#include "support/RunUntil.h"
#include "support/TempDir.h"

#include <recorder.h>
#include <recorder_leftover.h>

#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <vector>

// What a recorder told, in order of arrival.
struct Told {
    std::vector<unsigned long long> elapsed;
    std::vector<recorder_recording_limit_type_e> limits;
    std::vector<recorder_policy_e> interruptions;
    std::vector<int> errors;
    std::vector<recorder_state_e> states;
    std::optional<recorder_state_e> stateWhenInterrupted;
    std::string fileWhenEnded; // its size when a limit or an interruption arrived
};

// A recorder with its temporary file in a directory of its own.
class RecorderHandle {
public:
    explicit RecorderHandle(std::string path);
    ~RecorderHandle() { destroy(); }
    RecorderHandle(const RecorderHandle&) = delete;
    RecorderHandle& operator=(const RecorderHandle&) = delete;

    void useAmr();
    int prepareAndStart();
    [[nodiscard]] recorder_state_e state() const;
    void destroy();
    // Runs the main loop until that much sound was recorded.
    [[nodiscard]] bool recordUntil(unsigned long long elapsedMs, double limit = 15) const;

    recorder_h handle = nullptr;
    Told told;
    std::string path;
};

struct Leftover {
    recorder_leftover_e outcome;
    std::string path;
    recorder_file_format_e format;
    int duration;
    std::string sidecar;
};
std::vector<Leftover> rescue(const std::string& temporaryPath);

// A recording of that many seconds (a tone), made faster than it plays.
void makeRecording(const std::string& path, int seconds, bool isAmr);

// Milliseconds by an independent program, -1 when it does not read the file.
double probedDuration(const std::string& path);
// Mono samples of an MP4 as our player's chain hands them to the speaker.
std::vector<short> heard(const std::string& path);
// Whether an independent program decodes all of it without complaint.
bool decodesCleanly(const std::string& path);
std::vector<std::string> filesIn(const std::string& directory);

class RecorderTest : public testing::Test {
protected:
    RecorderTest();
    ~RecorderTest() override;

    support::PulseServer server;
    support::TempDir directory;
    std::string temporary = directory.file(".mw_temp");
};

// Without a sound server: an artificial source in place of the microphone.
class SourceTest : public testing::Test {
protected:
    SourceTest();
    ~SourceTest() override;
    static void useSource(const std::string& description);

    support::TempDir directory;
    std::string temporary = directory.file(".mw_temp");
};
