#include <Ecore.h>
#include <Ecore_Evas.h>
#include <Ecore_File.h>
#include <gtest/gtest.h>

#include <cstdlib>

#include "support/TempDir.h"

int main(int argc, char** argv)
{
    ::testing::InitGoogleTest(&argc, argv);
    const support::TempDir home;
    support::useHome(home);
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
