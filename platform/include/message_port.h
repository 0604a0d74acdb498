// Message ports: short bundles to a named port of a running application. Main loop; sends never wait for the peer.
#pragma once

#include <app_control.h>

enum message_port_error_e {
    MESSAGE_PORT_ERROR_NONE = 0,
    MESSAGE_PORT_ERROR_INVALID_PARAMETER = -22,
    MESSAGE_PORT_ERROR_PORT_NOT_FOUND = -2,
    MESSAGE_PORT_ERROR_IO_ERROR = -5,
};
typedef void (*message_port_message_cb)(int port_id, const bundle* message, void* user_data);

extern "C" {
int message_port_check_remote_port(const char* app_id, const char* port);
int message_port_send_message(const char* app_id, const char* port, bundle* message);
// Opens a port of this application; answers its positive id or an error.
int message_port_register(const char* port, message_port_message_cb callback, void* user_data);
}
