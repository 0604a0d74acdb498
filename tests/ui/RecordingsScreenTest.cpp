#include <gtest/gtest.h>

#include <Elementary.h>

#include "MwSystemMgr.h"
#include "RecordingsScreen.h"
#include "fakes/Fakes.h"
#include "support/Screen.h"

using ui::RecordingsScreen;
using Commands = std::vector<MwAppController::Command>;
using Names = std::vector<std::string>;

namespace {

class RecordingsScreenTest : public ::testing::Test {
protected:
    void SetUp() override { ui::forgetRecordings(); }
};

TEST_F(RecordingsScreenTest, AnEmptyCatalogueSaysSoUntilTheFirstRecording)
{
    RecordingsScreen screen;
    screen.open();
    EXPECT_EQ(nullptr, screen.list());
    EXPECT_TRUE(screen.hasRecordButton());
    EXPECT_EQ(Names{}, screen.menu());
    EXPECT_TRUE(fakes::log.has("No contents"));
    ui::enterRecordings({"Memo.amr"});
    screen.announce(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_EQ(Names{"Memo.amr"}, screen.names());
    EXPECT_EQ((Names{"Delete", "Share", "Rename"}), screen.menu());
}

}
