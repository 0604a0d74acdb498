#pragma once

#include <app_control.h>

class MwModel;

// Reads one launch request into the model. Created for one request. Main loop only.
class MwRequestParser {
public:
    virtual ~MwRequestParser() = default;

    // False only without a request or a model.
    bool parse(app_control_h request, MwModel* model);

private:
    static void _resetData(MwModel* model);
    static void _parseMainData(app_control_h request, MwModel* model);
    static void _parseExtraData(app_control_h request, MwModel* model);
};
