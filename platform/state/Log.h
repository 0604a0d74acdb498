// The services' own log lines.
#pragma once

#include "dlog.h"

#define PLATFORM_LOG(priority, format, ...)                                                                            \
    __dlog_print(LOG_ID_MAIN, priority, "MEWLO", "%s: %s(%d) > " format, __FILE_NAME__, __func__,                      \
        __LINE__ __VA_OPT__(, ) __VA_ARGS__)
#define PLATFORM_LOGD(format, ...) PLATFORM_LOG(DLOG_DEBUG, format __VA_OPT__(, ) __VA_ARGS__)
#define PLATFORM_LOGI(format, ...) PLATFORM_LOG(DLOG_INFO, format __VA_OPT__(, ) __VA_ARGS__)
#define PLATFORM_LOGW(format, ...) PLATFORM_LOG(DLOG_WARN, format __VA_OPT__(, ) __VA_ARGS__)
#define PLATFORM_LOGE(format, ...) PLATFORM_LOG(DLOG_ERROR, format __VA_OPT__(, ) __VA_ARGS__)
