#include <gtest/gtest.h>

#include <Elementary.h>

#include "MwRenamePopupController.h"
#include "fakes/Fakes.h"
#include "support/Screen.h"

namespace {

class RenamePopupTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        _parent = elm_win_util_standard_add("test", "test");
        evas_object_resize(_parent, 360, 640);
        evas_object_show(_parent);
    }
    void TearDown() override
    {
        _popup.reset();
        evas_object_del(_parent);
    }
    void open(const char* name)
    {
        _popup = std::make_unique<MwRenamePopupController>(name);
        _popup->setResponseCb(
            [this](void* userData, const char* text, int response) {
                EXPECT_EQ(this, userData);
                _answers.push_back(std::to_string(response) + ":" + (text ? text : "-"));
            },
            this);
        ASSERT_TRUE(_popup->create(_parent, nullptr));
        support::runFor(0.02);
    }
    // Until the popup has slid in and takes taps.
    void waitForTaps()
    {
        support::runFor(0.3);
        support::settle(_popup->getWindow());
    }
    void type(const std::string& text)
    {
        elm_entry_entry_insert(_popup->getEntry(), text.c_str());
        support::runFor(0.02);
    }
    std::string entered() const
    {
        char* utf8 = elm_entry_markup_to_utf8(elm_entry_entry_get(_popup->getEntry()));
        const std::string text = utf8 ? utf8 : "";
        std::free(utf8);
        return text;
    }
    bool canRename() const { return !elm_object_disabled_get(_popup->getRenameButton()); }

    Evas_Object* _parent = nullptr;
    std::unique_ptr<MwRenamePopupController> _popup;
    std::vector<std::string> _answers;
};

TEST_F(RenamePopupTest, OffersTheNameSelectedAndEnablesOnlyAChangedVisibleOne)
{
    open("Voice 1 & co");
    EXPECT_EQ("Voice 1 & co", entered());
    EXPECT_FALSE(canRename());
    elm_entry_select_none(_popup->getEntry()); // as happens when a window gets the keyboard
    evas_object_smart_callback_call(_popup->getWindow(), "focus,in", nullptr);
    const auto isSelected = [this] {
        const char* selection = elm_entry_selection_get(_popup->getEntry());
        return selection != nullptr && *selection != '\0';
    };
    EXPECT_TRUE(support::runUntil(isSelected));
    type("x"); // takes the place of the selection
    EXPECT_EQ("x", entered());
    EXPECT_TRUE(canRename());
    elm_entry_entry_set(_popup->getEntry(), "   ");
    support::runFor(0.02);
    EXPECT_FALSE(canRename());
    elm_entry_entry_set(_popup->getEntry(), "Voice 1 &amp; co");
    support::runFor(0.02);
    EXPECT_FALSE(canRename());
}

TEST_F(RenamePopupTest, RefusesWhatNoFileNameMayHave)
{
    const struct {
        const char* typed;
        const char* kept;
        bool reported;
    } cases[] = {{"a/b", "a", true}, {"/b", "", true}, {"a:b", "a", true}, {"a*", "a", true}, {"a?", "a", true},
        {"a\"b", "a", true}, {"a&lt;b", "a", true}, {"a&gt;b", "a", true}, {"a|b", "a", true}, {"a\\b", "a", true},
        {"Übung 3 &amp; Ende", "Übung 3 & Ende", false}};
    for (const auto& each : cases) {
        SCOPED_TRACE(each.typed);
        open("");
        fakes::calls.clear();
        type(each.typed);
        EXPECT_EQ(each.kept, entered());
        EXPECT_EQ(each.reported ? 1U : 0U, fakes::calls.count("post This character"));
    }
}

TEST_F(RenamePopupTest, KeepsFiftyCharactersNotBytes)
{
    open("");
    std::string longName;
    for (int i = 0; i < 60; ++i)
        longName += "ü";
    type(longName);
    EXPECT_EQ(longName.substr(0, 100), entered());
    EXPECT_EQ(1U, fakes::calls.count("post A name can have 50 characters"));
    type("x");
    EXPECT_EQ(longName.substr(0, 100), entered());
}

TEST_F(RenamePopupTest, AnswersByButtonAndReturnKey)
{
    open("Voice 001");
    waitForTaps();
    support::click(_popup->getRenameButton()); // disabled
    EXPECT_TRUE(_answers.empty());
    support::key(_popup->getWindow(), "Return", "\r"); // neither
    support::runFor(0.02);
    EXPECT_TRUE(_answers.empty());
    type("Interview");
    support::key(_popup->getWindow(), "Return", "\r");
    support::settle(_popup->getWindow());
    support::click(_popup->getRenameButton());
    support::click(_popup->getCancelButton());
    support::key(_popup->getWindow(), "Escape"); // taken, but without effect
    EXPECT_EQ((std::vector<std::string>{"1:Interview", "1:Interview", "0:-"}), _answers);
    EXPECT_NE(nullptr, _popup->getWindow());
}

TEST_F(RenamePopupTest, MayBeDeletedInItsAnswerAndHearsOfAClosedWindow)
{
    open("Voice 001");
    _popup->setResponseCb([this](void*, const char*, int) { _popup.reset(); }, nullptr);
    waitForTaps();
    support::click(_popup->getCancelButton());
    EXPECT_EQ(nullptr, _popup);

    open("Voice 001");
    evas_object_del(_popup->getWindow());
    ASSERT_TRUE(support::runUntil([&] { return !_answers.empty(); }));
    EXPECT_EQ((std::vector<std::string>{"0:-"}), _answers);
    EXPECT_EQ(nullptr, _popup->getWindow());
    _popup->destory(); // again, without effect
    MwRenamePopupController unopened(nullptr);
    EXPECT_FALSE(unopened.create(nullptr, nullptr));
}

}
