#pragma once

#include <app_control.h>

#include "MwHandle.h"

class MwModel;

// Takes launch requests into the model, or answers those that get nothing. A take that is under way, and the request
// that it is for, stay what they are: a request for a recording waits for its end, any other one changes nothing. Main
// loop only.
class MwLaunchRequests {
public:
    explicit MwLaunchRequests(MwModel& model);

    enum Result { TAKEN, WAITS, IGNORED, REFUSED };
    // REFUSED has been answered.
    Result receive(app_control_h request);
    // To be called after each change of the recorder: the request that waits is taken once the take is over.
    void recorderUpdated();

private:
    Result _receiveDuringTake(app_control_h request);
    void _take(app_control_h request);

    MwModel& _model;
    MwHandle<app_control_h, app_control_destroy> _waiting;
};
