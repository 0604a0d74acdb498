#include <gtest/gtest.h>

#include <Elementary.h>

#include <filesystem>

#include <media_content.h>
#include <panekit/WMenuPopupController.h>

#include "MwBookmarkListItem.h"
#include "MwBookmarksContentViewController.h"
#include "PanelScreen.h"
#include "RenameWindow.h"
#include "fakes/Fakes.h"
#include "support/Recordings.h"
#include "support/Screen.h"

using Commands = std::vector<MwAppController::Command>;

namespace {

constexpr auto FILE_NAME = "a.m4a";

// The bookmarks of a recording of two hours: "one", "two" and "three".
class BookmarksScreenTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        _mediaId = _screen.addRecording(FILE_NAME, 7200000);
        media_bookmark_insert_to_db(_mediaId.c_str(), 3725, "three");
        media_bookmark_insert_to_db(_mediaId.c_str(), 5, "one");
        media_bookmark_insert_to_db(_mediaId.c_str(), 65, "two");
        _screen.load(FILE_NAME, PLAY_STATE_PAUSED);
        _top = new MwBookmarksContentViewController(&_screen.model, _screen.controller(), _mediaId);
        _view = _screen.push(_top);
        _list = elm_object_part_content_get(_view, "elm.swallow.list");
    }
    // The texts of a part of all rows.
    std::string rows(const char* part = "elm.text.main.left") const
    {
        std::string all;
        for (Elm_Object_Item* item = elm_genlist_first_item_get(_list); item; item = elm_genlist_item_next_get(item)) {
            const char* text = elm_object_item_part_text_get(item, part);
            all += std::string(text ? text : "-") + " ";
        }
        return all;
    }
    Elm_Object_Item* row(int position) const
    {
        return elm_genlist_nth_item_get(_list, static_cast<unsigned>(position));
    }
    void tap(int position)
    {
        support::settle(_screen.window);
        support::click(elm_object_item_track(row(position)));
        elm_object_item_untrack(row(position));
    }
    bool isChecked(int position) const
    {
        return static_cast<MwBookmarkListItem*>(panekit::WGenlistItem::fromItem(row(position)))->isChecked();
    }
    bool shownChecked(int position) const
    {
        Evas_Object* layout = elm_object_item_part_content_get(row(position), "elm.icon.2");
        Evas_Object* check = layout ? elm_object_part_content_get(layout, "elm.swallow.content") : nullptr;
        if (check)
            edje_object_message_signal_process(elm_layout_edje_get(check));
        return check && elm_check_state_get(check);
    }
    // 0: rename, 1: delete.
    void enterMode(int entry)
    {
        _screen.more();
        ASSERT_TRUE(support::runUntil([this] { return _top->hasAttachedPopup(); }));
        support::runFor(0.3); // until it has the keyboard
        for (int i = 0; i < entry; ++i)
            support::key(_screen.window, "Tab");
        support::key(_screen.window, "Return");
        ASSERT_TRUE(support::runUntil([this] { return title() == "Select bookmarks"; }));
        support::settle(_screen.window);
    }
    std::string title() const
    {
        const char* text = elm_object_item_text_get(_top->getNaviItem());
        return text ? text : "";
    }
    Evas_Object* titleButton(const char* part) const
    {
        return elm_object_item_part_content_get(_top->getNaviItem(), part);
    }
    Evas_Object* renameWindow() const { return ui::renameWindow(_screen.window); }
    void answer(const std::string& name)
    {
        fakes::desktop.lastMessage.clear();
        ui::answerRename(renameWindow(), name);
        support::runUntil([this] { return !fakes::desktop.lastMessage.empty() || !renameWindow(); }, 1.0);
        support::settle(_screen.window);
    }
    // A button of the player panel at the lower edge.
    void pressOfPanel(const char* part)
    {
        support::settle(_screen.window);
        support::click(elm_object_part_content_get(elm_object_part_content_get(_view, "elm.swallow.controller"), part));
        support::settle(_screen.window);
    }
    void addBookmarkAt(unsigned int position)
    {
        _screen.model.setCurrentPlayPosition(position);
        _screen.announce();
        pressOfPanel("bookmark_btn");
    }
    bool hasPanel() const { return elm_object_part_content_get(_view, "elm.swallow.controller") != nullptr; }
    bool isOnTop() const { return _screen.naviframe->getTop() == _top; }

    ui::PanelScreen _screen;
    std::string _mediaId;
    MwBookmarksContentViewController* _top = nullptr;
    Evas_Object* _view = nullptr;
    Evas_Object* _list = nullptr;
};

TEST_F(BookmarksScreenTest, ListsByTimeAndJumps)
{
    EXPECT_EQ("one two three ", rows());
    EXPECT_EQ("00:00:05 00:01:05 01:02:05 ", rows("elm.text.sub.right"));
    EXPECT_EQ("00:00:00", MwBookmarkListItem::timeText(-7));
    EXPECT_EQ("Bookmarks", title());
    EXPECT_TRUE(hasPanel());
    tap(1);
    EXPECT_EQ(Commands{MwAppController::SET_PLAYER_POSITION}, _screen.takeCommands());
    EXPECT_EQ(65000U, _screen.model.getCurrentPlayPosition());
    support::key(_screen.window, "Right");
    EXPECT_EQ(70000U, _screen.model.getCurrentPlayPosition());
    support::key(_screen.window, "space", " ");
    EXPECT_EQ(PLAY_STATE_PLAYING, _screen.model.getPlayerState());
}

TEST_F(BookmarksScreenTest, DeletesWhatIsChecked)
{
    enterMode(1);
    EXPECT_EQ("Select bookmarks", title());
    EXPECT_FALSE(hasPanel());
    ASSERT_NE(nullptr, titleButton("title_right_btn"));
    EXPECT_TRUE(elm_object_disabled_get(titleButton("title_right_btn")));
    tap(1);
    tap(3);
    EXPECT_EQ("2 selected", title());
    EXPECT_FALSE(isChecked(0));
    tap(2);
    EXPECT_TRUE(isChecked(0)) << "all were checked one by one";
    EXPECT_TRUE(shownChecked(0));
    tap(2);
    EXPECT_FALSE(isChecked(0));
    EXPECT_FALSE(elm_object_disabled_get(titleButton("title_right_btn")));
    support::click(titleButton("title_right_btn"));
    EXPECT_EQ("two ", rows());
    EXPECT_EQ(1U, ui::PanelScreen::bookmarksOf(_mediaId).size());
    EXPECT_TRUE(hasPanel());
}

TEST_F(BookmarksScreenTest, SelectsAllAndLeavesAnEmptyList)
{
    enterMode(1);
    tap(0);
    EXPECT_EQ("3 selected", title());
    tap(0);
    EXPECT_EQ("Select bookmarks", title());
    tap(0);
    support::settle(_screen.window);
    support::click(titleButton("title_right_btn"));
    EXPECT_EQ("", rows());
    EXPECT_EQ("Bookmarks", title());
    EXPECT_TRUE(isOnTop());
    EXPECT_EQ(nullptr, titleButton("title_more_btn")) << "there is nothing to rename or delete";
}

TEST_F(BookmarksScreenTest, BackLeavesTheModeAndThenTheScreen)
{
    for (const int mode : {0, 1}) {
        enterMode(mode);
        EXPECT_EQ("Select bookmarks", title());
        EXPECT_EQ(nullptr, titleButton("prev_btn"));
        _screen.back();
        EXPECT_EQ("Bookmarks", title());
        EXPECT_EQ("one two three ", rows()) << "without the row that selects all";
    }
    EXPECT_NE(nullptr, titleButton("prev_btn"));
    _screen.back();
    EXPECT_FALSE(isOnTop());
}

TEST_F(BookmarksScreenTest, RenamesInPlaceAndRefusesNamesOfOthers)
{
    enterMode(0);
    tap(1);
    ASSERT_NE(nullptr, renameWindow());
    answer("one");
    EXPECT_EQ("This name is already used.", fakes::desktop.lastMessage);
    ASSERT_NE(nullptr, renameWindow()) << "stays open";
    answer(" ");
    EXPECT_EQ("This name cannot be used.", fakes::desktop.lastMessage);
    EXPECT_EQ("one two three ", rows());
    answer("a<b");
    EXPECT_EQ(nullptr, renameWindow());
    EXPECT_EQ("one ab three ", rows()) << "in its place, without what a name may not have";
    EXPECT_EQ("Bookmarks", title());
    EXPECT_TRUE(hasPanel());
    const auto all = ui::PanelScreen::bookmarksOf(_mediaId);
    ASSERT_EQ(3U, all.size());
    EXPECT_EQ(65U, all[1].markedTime);
}

TEST_F(BookmarksScreenTest, FollowsThePanelAndTheDatabase)
{
    addBookmarkAt(100000);
    EXPECT_EQ("one two Bookmark001 three ", rows());
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_TRUE(isOnTop());
    media_info_delete_from_db(_mediaId.c_str());
    MwSignalMgr::getInstance()->getSystemInfoSignal().emit(MwSignalMgr::MEDIA_DB_UPDATED);
    EXPECT_FALSE(isOnTop());
}

TEST_F(BookmarksScreenTest, AddingABookmarkLeavesTheListInPlace)
{
    for (unsigned int second = 10; second < 40; ++second)
        media_bookmark_insert_to_db(_mediaId.c_str(), second, "x");
    const auto top = [this] {
        int x = 0;
        int y = 0;
        int offset = 0;
        evas_object_geometry_get(_list, &x, &y, nullptr, nullptr);
        return elm_genlist_item_index_get(elm_genlist_at_xy_item_get(_list, x + 50, y + 1, &offset));
    };
    addBookmarkAt(100000);
    ASSERT_EQ(34U, elm_genlist_items_count(_list));
    elm_genlist_item_show(row(12), ELM_GENLIST_ITEM_SCROLLTO_TOP);
    support::settle(_screen.window);
    ASSERT_EQ(13, top());
    addBookmarkAt(200000);
    EXPECT_EQ(13, top());
}

TEST_F(BookmarksScreenTest, AnotherFileOrTrimmingEndsIt)
{
    pressOfPanel("ff_btn");
    EXPECT_FALSE(isOnTop());
    _top = new MwBookmarksContentViewController(&_screen.model, _screen.controller(), _mediaId);
    _view = _screen.push(_top);
    pressOfPanel("trim_btn");
    EXPECT_FALSE(isOnTop());
    EXPECT_TRUE(_screen.model.isTrimMode());
}

}
