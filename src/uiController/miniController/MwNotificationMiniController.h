#pragma once

#include <string>

#include "MwCancelQuestion.h"
#include "MwMiniController.h"

// A desktop notification with buttons that shows a recording, where no window can be the surface or the user does not
// want one.
class MwNotificationMiniController : public MwMiniController {
public:
    using MwMiniController::MwMiniController;
    ~MwNotificationMiniController() override;

    void create() override { update(); }
    void destroy() override { delete this; }
    void update() override;

private:
    static void _pressedCb(const char* key, void* data);
    void _pressed(const std::string& key);

    MwCancelQuestion _cancelQuestion;
};
