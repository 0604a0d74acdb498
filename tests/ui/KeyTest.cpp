#include <gtest/gtest.h>

#include <Ecore_Input.h>
#include <Elementary.h>

#include <cstdlib>

#include <eext_event.h>

#include "UiEnvironment.h"
#include "support/Screen.h"

namespace {

struct Presses {
    int back = 0;
    int more = 0;
};

void countBack(void* data, Evas_Object*, void*) { ++static_cast<Presses*>(data)->back; }
void countMore(void* data, Evas_Object*, void*) { ++static_cast<Presses*>(data)->more; }

class KeyTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        _window = elm_win_util_standard_add("test", "test");
        evas_object_resize(_window, 200, 200);
        evas_object_show(_window);
        _lower = add();
        _upper = add();
    }
    void TearDown() override { evas_object_del(_window); }
    Evas_Object* add()
    {
        Evas_Object* button = elm_button_add(_window);
        elm_win_resize_object_add(_window, button);
        evas_object_show(button);
        support::settle(_window);
        return button;
    }
    Evas_Object* _window = nullptr;
    Evas_Object* _lower = nullptr;
    Evas_Object* _upper = nullptr;
};

TEST_F(KeyTest, TheLastRegisteredVisibleObjectWins)
{
    Presses lower;
    Presses upper;
    eext_object_event_callback_add(_lower, EEXT_CALLBACK_BACK, countBack, &lower);
    eext_object_event_callback_add(_upper, EEXT_CALLBACK_BACK, countBack, &upper);
    eext_object_event_callback_add(_lower, EEXT_CALLBACK_MORE, countMore, &lower);
    for (const char* key : {"Escape", "XF86Back"})
        support::key(_window, key);
    EXPECT_EQ(2, upper.back);
    EXPECT_EQ(0, lower.back);
    for (const char* key : {"Menu", "F10", "a", "Left"}) // without Alt the arrow means nothing
        support::key(_window, key);
    EXPECT_EQ(2, lower.more);
    evas_object_hide(_upper);
    support::key(_window, "Escape");
    EXPECT_EQ(1, lower.back);
    evas_object_show(_upper);
    evas_object_del(_upper);
    support::key(_window, "Escape");
    EXPECT_EQ(2, lower.back);
    EXPECT_EQ(2, upper.back);
}

TEST_F(KeyTest, RegistrationsEndWithTheirObject)
{
    Presses presses;
    const auto deleteObject = [](void*, Evas_Object* object, void*) { evas_object_del(object); };
    eext_object_event_callback_add(_upper, EEXT_CALLBACK_BACK, deleteObject, nullptr);
    eext_object_event_callback_add(_upper, EEXT_CALLBACK_BACK, countBack, &presses);
    support::key(_window, "Escape");
    EXPECT_EQ(0, presses.back); // went with its object
    eext_object_event_callback_add(_lower, EEXT_CALLBACK_BACK, countBack, &presses);
    support::key(_window, "Escape");
    EXPECT_EQ(1, presses.back);
}

TEST_F(KeyTest, TheFocusMarkShowsWithTheKeyboardAndGoesWithAClick)
{
    const auto isShown = [] {
        int alpha = 0;
        edje_color_class_get("mewlo/focus", nullptr, nullptr, nullptr, &alpha, nullptr, nullptr, nullptr, nullptr,
            nullptr, nullptr, nullptr, nullptr);
        return alpha == 255;
    };
    const auto happen = [](int type, auto* event) {
        ecore_event_add(type, event, nullptr, nullptr);
        support::runFor(0.02);
    };
    const auto press = [happen](const char* name) {
        auto* event = static_cast<Ecore_Event_Key*>(std::calloc(1, sizeof(Ecore_Event_Key)));
        event->key = event->keyname = name;
        happen(ECORE_EVENT_KEY_DOWN, event);
    };
    const auto click
        = [happen] { happen(ECORE_EVENT_MOUSE_BUTTON_DOWN, std::calloc(1, sizeof(Ecore_Event_Mouse_Button))); };
    eext_window_arm(_window);
    click();
    EXPECT_FALSE(isShown());
    press("Alt_L"); // on the way to another window
    press("a");
    EXPECT_FALSE(isShown());
    press("Tab");
    EXPECT_TRUE(isShown());
    ui::useTheme(true);
    EXPECT_TRUE(isShown());
    click();
    EXPECT_FALSE(isShown());
    ui::useTheme(false);
    EXPECT_FALSE(isShown());
}

TEST_F(KeyTest, EachWindowHasItsOwnKeys)
{
    Presses first;
    Presses second;
    Evas_Object* other = elm_win_add(_window, "other", ELM_WIN_DIALOG_BASIC);
    evas_object_show(other);
    eext_object_event_callback_add(_lower, EEXT_CALLBACK_BACK, countBack, &first);
    eext_object_event_callback_add(other, EEXT_CALLBACK_BACK, countBack, &second);
    support::key(other, "Escape");
    EXPECT_EQ(0, first.back);
    EXPECT_EQ(1, second.back);
    evas_object_del(other);
    support::key(_window, "Escape");
    EXPECT_EQ(1, first.back);
}

}
