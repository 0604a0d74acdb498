#include "callmgr.h"

#include "host/PulseWatch.h"
#include "state/Trees.h"
#include <StateKeys.h>

struct cm_client_s { };

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;

}

int cm_init(cm_client_h* client)
{
    if (client == nullptr)
        return INVALID_PARAMETER;
    *client = new cm_client_s;
    return NONE;
}

int cm_get_call_status(cm_client_h client, cm_call_status_e* status)
{
    if (client == nullptr || status == nullptr)
        return INVALID_PARAMETER;
    *status = static_cast<cm_call_status_e>(platform::stateInt(platform::KEY_CALL_STATUS).value_or(0));
    // A call of a program on this machine is one as well.
    if (*status == CM_CALL_STATUS_IDLE && host::PulseWatch::instance().snapshot().hasCall)
        *status = static_cast<cm_call_status_e>(1);
    return NONE;
}

int cm_deinit(cm_client_h client)
{
    delete client;
    return client != nullptr ? NONE : INVALID_PARAMETER;
}
