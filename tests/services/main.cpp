// Every case runs in a process of its own with private directories, without the buses of the machine.
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <Ecore.h>

#include <cstdlib>

int main(int argc, char** argv)
{
    testing::InitGoogleTest(&argc, argv);
    const support::TempDir home;
    support::useHome(home);
    ::setenv("DBUS_SESSION_BUS_ADDRESS", ("unix:path=" + home.file("no-session-bus")).c_str(), 1);
    ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + home.file("no-system-bus")).c_str(), 1);
    for (const char* name : {"MEWLO_DEVICE_ROOT", "MEWLO_CARD_ROOT", "MEWLO_PRIVATE_ROOT", "DISPLAY", "MEWLO_APPS_DIR"})
        ::unsetenv(name);
    ::setenv("ECORE_NO_SYSTEM_MODULES", "1", 1);
    ecore_init();
    const int result = RUN_ALL_TESTS();
    ecore_shutdown();
    return result;
}
