#pragma once

#include <app_control.h>

#include <functional>
#include <memory>

#include "MwHandle.h"

// Asks the user, outside the program's window, whether the recording is to be thrown away. Main loop only.
class MwCancelQuestion {
public:
    enum class Answer { DISCARD, GO_ON, NONE };

    MwCancelQuestion() = default;
    // Takes an open question from the screen.
    ~MwCancelQuestion();
    MwCancelQuestion(const MwCancelQuestion&) = delete;
    MwCancelQuestion& operator=(const MwCancelQuestion&) = delete;

    // False when nobody can be asked. Without effect while a question is open. The callback may delete this object.
    bool ask(std::function<void(Answer answer)> answered);
    [[nodiscard]] bool isOpen() const { return static_cast<bool>(_popupAppControl); }

private:
    void _reply(app_control_result_e result);

    std::function<void(Answer answer)> _answered;
    MwHandle<app_control_h, app_control_destroy> _popupAppControl;
    std::shared_ptr<void> _alive = std::make_shared<int>(0);
};
