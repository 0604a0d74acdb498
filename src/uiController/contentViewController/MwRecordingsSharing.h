#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <app_control.h>

#include "MwHandle.h"

// Hands recordings to another program that the user chooses. One request at a time: another takes its place, and the
// one that runs is dropped with this object. Main loop only.
class MwRecordingsSharing {
public:
    // started: another program has taken the recordings.
    explicit MwRecordingsSharing(std::function<void()> started);
    ~MwRecordingsSharing();
    MwRecordingsSharing(const MwRecordingsSharing&) = delete;
    MwRecordingsSharing& operator=(const MwRecordingsSharing&) = delete;

    // False when there is nothing to share, or nothing to share with, which the user is told.
    bool share(const std::vector<std::string>& pathList);
    // Takes back a request that nobody has answered yet, with what it shows.
    void cancel();

private:
    using Request = MwHandle<app_control_h, app_control_destroy>;

    static bool _fill(app_control_h request, const std::vector<std::string>& pathList);
    void _shareReply(int result);
    void _destroyShareRequest(bool terminate);

    std::function<void()> _started;
    Request _shareRequest;
    std::shared_ptr<void> _token = std::make_shared<int>(0);
};
