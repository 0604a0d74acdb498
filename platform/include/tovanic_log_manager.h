// The usage log: one JSON line per record below the user's state directory, local only. Any thread.
#pragma once

#include <app_control.h>

typedef struct tovanic_log_manager_s* tovanic_log_manager_h;
typedef void (*tovanic_log_manager_cb)(int request, int result, void* user_data);
#define TOVANIC_LOG_MANAGER_URI "content://com.tovanic.usagelog/feature"

extern "C" {
int tovanic_log_manager_create(tovanic_log_manager_h* manager);
int tovanic_log_manager_insert(tovanic_log_manager_h manager, const char* uri, bundle* record,
    tovanic_log_manager_cb callback, void* user_data, int* request);
int tovanic_log_manager_destroy(tovanic_log_manager_h manager);
}
