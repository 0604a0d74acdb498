#include <gtest/gtest.h>

#include <Eina.h>

#include <cstring>
#include <string>

#include "UiEnvironment.h"

namespace {

std::string toolkitErrors;

// Selections do not exist without a display, which the toolkit mentions as a failed safety check.
void printCb(const Eina_Log_Domain* domain, Eina_Log_Level level, const char* file, const char* function, int line,
    const char* format, void* data, va_list arguments)
{
    if (level <= EINA_LOG_LEVEL_ERR && std::strcmp(domain->name, "eina_safety") != 0)
        toolkitErrors += std::string(domain->name) + ": " + function + "\n";
    eina_log_print_cb_stderr(domain, level, file, function, line, format, data, arguments);
}

// What the toolkit prints as an error is a fault of ours: a case that causes it fails.
class ErrorListener : public ::testing::EmptyTestEventListener {
    void OnTestStart(const ::testing::TestInfo&) override { toolkitErrors.clear(); }
    void OnTestEnd(const ::testing::TestInfo&) override { EXPECT_EQ("", toolkitErrors); }
};

}

int main(int argc, char** argv)
{
    ::testing::InitGoogleTest(&argc, argv);
    ::testing::UnitTest::GetInstance()->listeners().Append(new ErrorListener);
    const ui::Environment environment(argc, argv);
    eina_log_print_cb_set(printCb, nullptr);
    return RUN_ALL_TESTS();
}
