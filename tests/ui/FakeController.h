#pragma once

#include <functional>
#include <string>
#include <vector>

#include "MwAppController.h"

namespace fakes {

// What stands behind MwAppController in screen tests: commands are recorded and answered, nothing is recorded.
struct Controller {
    std::vector<MwAppController::Command> commands;
    // Answers whether a command succeeds; sets the model's state as the controller would.
    std::function<bool(MwAppController::Command)> onCommand;
    bool acceptAsync = true;
    int recordingsOpened = 0;
    std::string lastSavedPath;

    // Delivers the results of the asynchronous commands so far.
    void finish();

    struct Pending {
        MwAppController::Command command;
        MwAppController::AsyncCallback callback;
        void* userData;
    };
    std::vector<Pending> pending;
    bool execute(MwAppController::Command command);
};

extern Controller controller;

}
