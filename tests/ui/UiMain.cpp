#include <gtest/gtest.h>

#include "UiEnvironment.h"

int main(int argc, char** argv)
{
    ::testing::InitGoogleTest(&argc, argv);
    const ui::Environment environment(argc, argv);
    return RUN_ALL_TESTS();
}
