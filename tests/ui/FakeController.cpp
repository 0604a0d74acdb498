#include "FakeController.h"

#include <utility>

#include "MwAvrcp.h"
#include "MwMediaKeys.h"
#include "MwRemoteControl.h"
#include "MwSoundSession.h"

class MwAppController::AsyncCmdControl { };

// Never made here.
MwRemoteControl::~MwRemoteControl() = default;
MwMediaKeys::~MwMediaKeys() = default;

MwAppController::MwAppController() = default;

MwAppController::~MwAppController() = default;

bool MwAppController::dispatchCommand(Command command) { return fakes::controller.execute(command); }

bool MwAppController::dispatchCommandAsync(Command command, AsyncCallback callback, void* userData)
{
    if (!fakes::controller.acceptAsync)
        return false;
    fakes::controller.pending.push_back({command, std::move(callback), userData});
    return true;
}

std::string MwAppController::getLastSavedPath() const { return fakes::controller.lastSavedPath; }

void MwAppController::openRecordings() { ++fakes::controller.recordingsOpened; }

namespace fakes {

Controller controller;

bool Controller::execute(MwAppController::Command command)
{
    commands.push_back(command);
    return !onCommand || onCommand(command);
}

void Controller::finish()
{
    for (Pending& each : std::exchange(pending, {})) {
        const bool done = execute(each.command);
        each.callback(each.command, done ? MwAppController::SUCCESS : MwAppController::FAIL, each.userData);
    }
}

}
