#include <Ecore.h>
#include <Ecore_Evas.h>
#include <Ecore_File.h>
#include <gtest/gtest.h>

#include <cstdlib>

#include "support/TempDir.h"

// Every program runs in a home of its own, so that keys, preferences and recordings of the user stay untouched.
int main(int argc, char** argv)
{
    ::testing::InitGoogleTest(&argc, argv);
    const support::TempDir home;
    for (const char* name : {"HOME", "XDG_RUNTIME_DIR", "XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_STATE_HOME",
             "MEWLO_DEVICE_ROOT", "MEWLO_CARD_ROOT", "MEWLO_PRIVATE_ROOT"}) {
        const std::string path = home.file(name);
        std::filesystem::create_directories(path);
        std::filesystem::permissions(path, std::filesystem::perms::owner_all);
        ::setenv(name, path.c_str(), 1);
    }
    ::setenv("ECORE_NO_SYSTEM_MODULES", "1", 1);
    ecore_init();
    ecore_file_init();
    ecore_evas_init();
    const int result = RUN_ALL_TESTS();
    ecore_evas_shutdown();
    ecore_file_shutdown();
    ecore_shutdown();
    return result;
}
