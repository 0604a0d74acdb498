// Logging of the application: one line with file, function and line; green information, magenta tracing, red failures.
#pragma once

#include <dlog.h>

#include <cassert>

#define MW_LOG(priority, colour, format, ...)                                                                          \
    __dlog_print(LOG_ID_MAIN, priority, "MEWLO", "%s: %s(%d) > " colour format "\033[0m", __FILE_NAME__, __func__,     \
        __LINE__ __VA_OPT__(, ) __VA_ARGS__)
#define MW_LOGI(format, ...) MW_LOG(DLOG_INFO, "\033[32m", format __VA_OPT__(, ) __VA_ARGS__)
#define MW_LOGW(format, ...) MW_LOG(DLOG_WARN, "\033[35m", format __VA_OPT__(, ) __VA_ARGS__)
#define MW_LOGE(format, ...) MW_LOG(DLOG_ERROR, "\033[31m", "* Critical * " format __VA_OPT__(, ) __VA_ARGS__)

// Calls a service function and answers whether it succeeded; a failure is logged with its name and code.
#define MW_CALL(function, ...)                                                                                         \
    mwSucceeded(static_cast<int>(function(__VA_ARGS__)), #function, __FILE_NAME__, __func__, __LINE__)

// For members that must exist: the log line survives where assert is compiled out.
#define WASSERT(condition)                                                                                             \
    do {                                                                                                               \
        if (!(condition))                                                                                              \
            MW_LOGE("WASSERT! %s", #condition);                                                                        \
        assert(condition);                                                                                             \
    } while (false)

inline bool mwSucceeded(int code, const char* call, const char* file, const char* function, int line)
{
    if (code != 0)
        __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "MEWLO", "%s: %s(%d) > \033[31m* Critical * %s failed : [%d]!!!\033[0m",
            file, function, line, call, code);
    return code == 0;
}
