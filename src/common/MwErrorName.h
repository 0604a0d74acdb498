// Names of service error codes for the log.
#pragma once

#include <algorithm>
#include <span>

#include "MwLog.h"

struct MwErrorName {
    int code;
    const char* name;
};

#define MW_ERROR_NAME(code)                                                                                            \
    {                                                                                                                  \
        code, #code                                                                                                    \
    }

// Logs the name of an error; a success logs nothing.
inline void mwPrintError(std::span<const MwErrorName> names, int code)
{
    if (code == 0)
        return;
    const auto found
        = std::find_if(names.begin(), names.end(), [&](const MwErrorName& error) { return error.code == code; });
    if (found != names.end())
        MW_LOGE("%s", found->name);
    else
        MW_LOGE("Unknown error : [%d]", code);
}

// Logs a failed call, its code and the code's name; answers whether the call succeeded.
inline bool mwSucceededByName(std::span<const MwErrorName> names, int code, const char* call)
{
    if (code == 0)
        return true;
    MW_LOGE("%s failed : [%d]!!!", call, code);
    mwPrintError(names, code);
    return false;
}
