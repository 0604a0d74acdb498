#include <gtest/gtest.h>

#include <Elementary.h>

#include <filesystem>

#include <vconf.h>

#include "MwDetailsContentViewController.h"
#include "MwDetailsTexts.h"
#include "MwStorageRoots.h"
#include "PanelScreen.h"
#include "support/Recordings.h"
#include "support/Screen.h"

namespace {

std::string value(Evas_Object* list, unsigned int row)
{
    const char* text = elm_object_item_part_text_get(elm_genlist_nth_item_get(list, row), "elm.text.multiline");
    return text ? text : "";
}

int height(Evas_Object* list, unsigned int row)
{
    int pixels = 0;
    Elm_Object_Item* item = elm_genlist_nth_item_get(list, row);
    evas_object_geometry_get(elm_object_item_track(item), nullptr, nullptr, nullptr, &pixels);
    elm_object_item_untrack(item);
    return pixels;
}

TEST(DetailsTextTest, SizesAndLengths)
{
    const std::pair<double, const char*> sizes[] = {{0, "0.0 B"}, {1023, "1023.0 B"}, {1536, "1.5 KB"},
        {3 << 20, "3.0 MB"}, {2.5 * (1 << 30), "2.5 GB"}, {1024.0 * (1 << 30), ""}};
    for (const auto& [bytes, text] : sizes)
        EXPECT_EQ(text, mwSizeText(bytes));
    const std::pair<int, const char*> lengths[] = {{400, "00:01"}, {0, "--:--"}, {-1, "--:--"}, {61999, "01:01"},
        {3599999, "59:59"}, {3600000, "01:00:00"}, {360061000, "100:01:01"}};
    for (const auto& [duration, text] : lengths)
        EXPECT_EQ(text, mwLengthText(duration));
}

TEST(DetailsTextTest, LocationsCarryTheNameOfTheirStorage)
{
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    EXPECT_EQ("/Device storage/Sounds/Mewlo/a.m4a", mwLocationText(mwDeviceRoot() + "/Sounds/Mewlo/a.m4a"));
    EXPECT_EQ("/Memory card/Sounds/Mewlo/a.m4a", mwLocationText(mwCardRoot() + "/Sounds/Mewlo/a.m4a"));
    EXPECT_EQ("/Private/a.m4a", mwLocationText(mwPrivateRoot() + "/a.m4a"));
    EXPECT_EQ("/somewhere/else", mwLocationText("/somewhere/else/a.m4a"));
    EXPECT_EQ(mwDeviceRoot() + "2", mwLocationText(mwDeviceRoot() + "2/a.m4a")) << "another folder beside";
    EXPECT_EQ("", mwLocationText(""));
    EXPECT_EQ("", mwLocationText("a.m4a"));
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
}

TEST(DetailsScreenTest, ShowsWholeTextsAndFollowsTheRegion)
{
    ui::PanelScreen screen;
    vconf_set_str("db/menu_widget/regionformat", "en_GB");
    vconf_set_str("db/setting/timezone", "UTC");
    const std::string name = "A conversation <about> everything & nothing in the old harbour.m4a";
    screen.addRecording(name, 400, std::string(1536, 'x'));
    MwFileInfo info = screen.model.getRecordedFileList().front();
    info.modifiedTime = 1700032380;
    Evas_Object* view = screen.push(new MwDetailsContentViewController(&screen.model, screen.controller(), info));
    Evas_Object* list = elm_object_part_content_get(view, "elm.swallow.content");
    EXPECT_EQ(5U, elm_genlist_items_count(list));
    EXPECT_NE(std::string::npos, value(list, 0).find("&lt;about&gt; everything &amp; nothing"));
    EXPECT_TRUE(value(list, 1).starts_with("Wed, 15 Nov 2023")) << value(list, 1);
    EXPECT_EQ("00:01", value(list, 3));
    EXPECT_EQ("1.5 KB", value(list, 4));
    EXPECT_GT(height(list, 2), height(list, 3) + 20) << "a long path takes more lines";
    vconf_set_str("db/menu_widget/regionformat", "en_US");
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::REGION_FORMAT_CHANGED);
    support::settle(screen.window);
    EXPECT_TRUE(value(list, 1).starts_with("Wed, Nov 15, 2023")) << value(list, 1);
}

TEST(DetailsScreenTest, LeavesWithItsFile)
{
    ui::PanelScreen screen;
    screen.addRecording("a.m4a", 1000);
    const MwFileInfo info = screen.model.getRecordedFileList().front();
    const auto* below = screen.naviframe->getTop();
    screen.push(new MwDetailsContentViewController(&screen.model, screen.controller(), info));
    const auto updated = [] {
        MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
        support::runFor(0.05);
    };
    updated();
    EXPECT_NE(below, screen.naviframe->getTop());
    screen.back();
    EXPECT_EQ(below, screen.naviframe->getTop());
    screen.push(new MwDetailsContentViewController(&screen.model, screen.controller(), info));
    ASSERT_NE(below, screen.naviframe->getTop());
    std::filesystem::remove(info.path);
    updated();
    EXPECT_EQ(below, screen.naviframe->getTop());
}

}
