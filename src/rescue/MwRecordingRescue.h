#pragma once

#include <string>
#include <thread>
#include <vector>

class MwModel;

// Puts right at start-up what an earlier run could not finish: rebuilds recordings cut off by a crash or a power cut,
// gives them names, rows and bookmarks, catalogues files that the database does not know, and tells the user. Works on
// a thread of its own so that the window is there at once; made and destroyed on the main loop.
class MwRecordingRescue {
public:
    // The model is borrowed for the life of the object.
    explicit MwRecordingRescue(MwModel& model);
    // Waits for the work to end.
    ~MwRecordingRescue();
    MwRecordingRescue(const MwRecordingRescue&) = delete;
    MwRecordingRescue& operator=(const MwRecordingRescue&) = delete;

    void start();
    // The work itself, on the calling thread. Answers the names of the recordings that were rebuilt.
    static std::vector<std::string> run(MwModel& model);

private:
    MwModel& _model;
    std::thread _thread;
};
