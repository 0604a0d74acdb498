#include <gtest/gtest.h>

#include <Elementary.h>

#include <string>

#include "UiEnvironment.h"
#include "desktop/Toast.h"
#include "launch/Toolkit.h"
#include "support/Screen.h"

namespace {

constexpr auto LONG_TEXT = "A recording that was cut off could not be restored. Its data is kept.";

struct Box {
    int x = 0, y = 0, width = 0, height = 0;
};

class ToastTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        _window = elm_win_util_standard_add("test", "test");
        _button = elm_button_add(_window);
        evas_object_size_hint_weight_set(_button, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        elm_win_resize_object_add(_window, _button);
        evas_object_show(_button);
        resize(360, 640);
        evas_object_show(_window);
        platform::setMainWindow(_window);
        support::settle(_window);
    }
    void TearDown() override { evas_object_del(_window); }
    void resize(int width, int height)
    {
        evas_object_resize(_window, width, height);
        support::settle(_window);
    }
    Evas_Object* toast() const { return evas_object_name_find(evas_object_evas_get(_window), "mewlo/toast"); }
    std::string text() const { return edje_object_part_text_get(toast(), "text"); }
    Box box() const
    {
        Box found;
        evas_object_geometry_get(toast(), &found.x, &found.y, &found.width, &found.height);
        return found;
    }
    Evas_Object* _window = nullptr;
    Evas_Object* _button = nullptr;
};

TEST_F(ToastTest, StandsAboveTheLowestButtonsInAnyWindowAndLength)
{
    const struct {
        int width;
        int height;
    } sizes[] = {{360, 640}, {360, 480}, {240, 430}, {1100, 640}};
    for (const char* shown : {"Saved", "Calls are rejected while recording.", LONG_TEXT}) {
        ASSERT_TRUE(platform::showToast(shown));
        for (const auto& size : sizes) {
            SCOPED_TRACE(std::string(shown) + " " + std::to_string(size.width) + "x" + std::to_string(size.height));
            resize(size.width, size.height);
            const Box plate = box();
            EXPECT_NEAR(size.width, plate.x + plate.width + plate.x, 1);
            EXPECT_GE(plate.x, 20);
            EXPECT_EQ(size.height - 113, plate.y + plate.height);
            EXPECT_LT(plate.height, 120);
            int textHeight = 0;
            evas_object_textblock_size_formatted_get(
                edje_object_part_object_get(toast(), "text"), nullptr, &textHeight);
            EXPECT_GE(plate.height, textHeight + 19); // and its padding
        }
    }
}

TEST_F(ToastTest, TakesTheWordsAsTheyAreAndTheNextReplacesIt)
{
    ASSERT_TRUE(platform::showToast("<b>not markup</b> & more"));
    EXPECT_EQ("&lt;b&gt;not markup&lt;/b&gt; &amp; more", text());
    ASSERT_TRUE(platform::showToast("next"));
    EXPECT_EQ("next", text());
    EXPECT_LT(box().width, 150);
    evas_object_del(toast());
    EXPECT_EQ(nullptr, toast());
}

TEST_F(ToastTest, TakesNeitherClicksNorFocusAndGoesAfterThreeSeconds)
{
    int clicks = 0;
    evas_object_smart_callback_add(
        _button, "clicked", [](void* data, Evas_Object*, void*) { ++*static_cast<int*>(data); }, &clicks);
    elm_object_focus_set(_button, EINA_TRUE);
    Evas_Object* focused = elm_object_focused_object_get(_window);
    ASSERT_TRUE(platform::showToast("Voice 001 saved"));
    resize(360, 300); // the button's middle is below the plate now
    support::click(_button);
    EXPECT_EQ(1, clicks);
    EXPECT_EQ(focused, elm_object_focused_object_get(_window));
    support::runFor(2.5);
    EXPECT_NE(nullptr, toast());
    EXPECT_TRUE(support::runUntil([this] { return toast() == nullptr; }, 10.0));
    support::settle(_window);
}

TEST_F(ToastTest, GoesWithItsWindow)
{
    Evas_Object* other = elm_win_util_standard_add("other", "other");
    evas_object_resize(other, 360, 640);
    evas_object_show(other);
    platform::setMainWindow(other);
    ASSERT_TRUE(platform::showToast("soon gone"));
    evas_object_del(other);
    platform::raiseMainWindow(); // there is none
    EXPECT_FALSE(platform::showToast("no window"));
    platform::setMainWindow(_window);
    EXPECT_TRUE(platform::showToast("here"));
}

}
