#pragma once

#include <app_control.h>
#include <panekit/WTimer.h>

#include <functional>
#include <memory>

#include "MwHandle.h"

// Asks the private storage's service to open the storage, and hands it back if it was closed before. Main loop only.
class MwPrivateStorage {
public:
    MwPrivateStorage() = default;
    // Hands it back, and forgets what runs.
    ~MwPrivateStorage();
    MwPrivateStorage(const MwPrivateStorage&) = delete;
    MwPrivateStorage& operator=(const MwPrivateStorage&) = delete;

    // Answers later, and once, whether it is open; nobody waits longer than ten seconds for the service. Another open
    // takes the place of the one that runs. The callback may do anything but delete this object.
    void open(std::function<void(bool open)> opened);
    [[nodiscard]] bool isOpening() const { return static_cast<bool>(_privateModeRequest); }
    // Nobody waits for this one. Without effect when it was not opened here.
    void handBack();
    // Closes it whoever has opened it.
    void close();
    // What runs is not answered any more.
    void cancel();

private:
    bool _requestPrivateModeAppControl(bool mount);
    void _privateModeReply(app_control_h reply, app_control_result_e result);
    void _answer(bool open);

    std::function<void(bool open)> _opened;
    bool _wasClosed = false;
    bool _isOpenedHere = false;
    MwHandle<app_control_h, app_control_destroy> _privateModeRequest;
    panekit::WTimer::Weak _patience;
    std::shared_ptr<void> _alive = std::make_shared<int>(0);
};
