#include "Commands.h"

#include <Ecore.h>
#include <doctor.h>

#include <cstdio>

int tool::doctor(const Arguments&)
{
    ecore_init();
    const auto print = [](const char* service, const char* found, const char* fallback, void*) {
        std::printf("%-18s %s%s%s\n", service, found, *fallback != '\0' ? " -> " : "", fallback);
    };
    platform_doctor(print, nullptr);
    ecore_shutdown();
    return OK;
}
