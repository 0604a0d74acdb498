// Telephone calls. The status is the number of live calls, 0 when idle.
#pragma once

typedef struct cm_client_s* cm_client_h;
enum cm_call_status_e : int { CM_CALL_STATUS_IDLE = 0 };

extern "C" {
int cm_init(cm_client_h* client);
int cm_get_call_status(cm_client_h client, cm_call_status_e* status);
int cm_deinit(cm_client_h client);
}
