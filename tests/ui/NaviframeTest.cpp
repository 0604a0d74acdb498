#include <gtest/gtest.h>

#include <Elementary.h>

#include <eext_event.h>
#include <panekit/WContentViewController.h>
#include <panekit/WMenuPopupController.h>
#include <panekit/WNaviframeController.h>
#include <panekit/WPopupController.h>

#include "support/Screen.h"

using panekit::WContentViewController;
using panekit::WMenuPopupController;
using panekit::WNaviframeController;
using panekit::WPopupController;

namespace {

struct Events {
    int created = 0;
    int destroyed = 0;
    int pushed = 0;
    int becameTop = 0;
    int clicks = 0;
};

// A screen that is one big button.
class Screen : public WContentViewController {
public:
    explicit Screen(Events& events)
        : _events(events)
    {
    }
    bool fails = false;
    bool mayPop = true;
    std::function<void()> onClick;

protected:
    Evas_Object* onCreateView(Evas_Object* parent, void*) override
    {
        if (fails)
            return nullptr;
        Evas_Object* layout = elm_layout_add(parent);
        elm_layout_theme_set(layout, "layout", "application", "default");
        Evas_Object* button = elm_button_add(layout);
        evas_object_smart_callback_add(
            button, "clicked",
            [](void* data, Evas_Object*, void*) {
                auto* self = static_cast<Screen*>(data);
                ++self->_events.clicks;
                if (const auto handler = self->onClick; handler)
                    handler();
            },
            this);
        elm_object_part_content_set(layout, "elm.swallow.content", button);
        evas_object_show(layout);
        return layout;
    }
    void onCreated() override { ++_events.created; }
    void onDestroy() override { ++_events.destroyed; }
    void onPushed(Evas_Object*) override { ++_events.pushed; }
    void onBecomeTop() override { ++_events.becameTop; }
    bool onPop() override { return mayPop; }

private:
    Events& _events;
};

class NaviframeTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        _window = elm_win_util_standard_add("test", "test");
        evas_object_resize(_window, 360, 640);
        _naviframe = new WNaviframeController;
        ASSERT_TRUE(_naviframe->create(_window));
        elm_win_resize_object_add(_window, _naviframe->getEvasObject());
        evas_object_show(_window);
    }
    void TearDown() override
    {
        if (_window)
            evas_object_del(_window);
        support::runFor(0.01);
    }
    Screen* push(Events& events)
    {
        auto* screen = new Screen(events);
        EXPECT_TRUE(_naviframe->push(screen));
        support::runFor(0.1);
        support::settle(_window);
        return screen;
    }
    Evas_Object* _window = nullptr;
    WNaviframeController* _naviframe = nullptr;
};

TEST_F(NaviframeTest, TheTopScreenGetsTheInputAndLeavesWithPopOut)
{
    Events first;
    Events second;
    Screen* below = push(first);
    Screen* above = push(second);
    EXPECT_EQ(above, _naviframe->getTop());
    EXPECT_FALSE(below->isTop());
    EXPECT_EQ(_window, above->getWindow());
    support::click(_naviframe->getEvasObject());
    EXPECT_EQ(0, first.clicks);
    EXPECT_EQ(1, second.clicks);

    // Out of its own button's callback, as screens do.
    above->onClick = [above] { above->popOut(); };
    support::click(_naviframe->getEvasObject());
    support::settle(_window);
    EXPECT_EQ(1, second.destroyed);
    EXPECT_EQ(below, _naviframe->getTop());
    EXPECT_EQ(2, first.becameTop);
    support::click(_naviframe->getEvasObject());
    EXPECT_EQ(1, first.clicks);
}

TEST_F(NaviframeTest, AScreenWithoutViewIsDestroyedAndOneThatRefusesStays)
{
    Events events;
    auto* failing = new Screen(events);
    failing->fails = true;
    EXPECT_FALSE(_naviframe->push(failing));
    EXPECT_FALSE(_naviframe->push(nullptr));
    EXPECT_EQ(nullptr, _naviframe->getTop());

    push(events);
    Events refusing;
    Screen* screen = push(refusing);
    screen->mayPop = false;
    screen->popOut();
    EXPECT_EQ(screen, _naviframe->getTop());
    EXPECT_EQ(0, refusing.destroyed);
}

TEST_F(NaviframeTest, TheLastScreenAsksTheHandler)
{
    Events events;
    Screen* screen = push(events);
    int asked = 0;
    bool answer = false;
    _naviframe->setOnLastItemPop([&] {
        ++asked;
        return answer;
    });
    screen->popOut();
    EXPECT_EQ(1, asked);
    EXPECT_EQ(0, events.destroyed);
    answer = true;
    screen->popOut();
    EXPECT_EQ(2, asked);
    EXPECT_EQ(1, events.destroyed);
    EXPECT_EQ(nullptr, _naviframe->getTop());
}

TEST_F(NaviframeTest, TheWindowTakesItsScreensWithIt)
{
    Events first;
    Events second;
    push(first);
    auto* menu = new WMenuPopupController;
    menu->create(_window, _naviframe->getEvasObject());
    push(second)->attachPopup(menu); // ends after its screen
    evas_object_del(std::exchange(_window, nullptr));
    ASSERT_TRUE(support::runUntil([&] { return first.destroyed == 1 && second.destroyed == 1; }));
}

TEST_F(NaviframeTest, OneAttachedPopupAtATimeThatClosesWithTheScreen)
{
    Events first;
    Events second;
    push(first);
    Screen* screen = push(second);
    int closed = 0;
    const auto attach = [&] {
        auto* popup = new WPopupController;
        popup->setOnDestroyed([&] { ++closed; });
        popup->create(_window);
        screen->attachPopup(popup);
    };
    attach();
    attach();
    EXPECT_EQ(1, closed);
    EXPECT_TRUE(screen->hasAttachedPopup());
    WPopupController::topmost()->destroy();
    EXPECT_FALSE(screen->hasAttachedPopup());
    EXPECT_EQ(2, closed);
    attach();
    screen->popOut();
    EXPECT_EQ(3, closed);
    EXPECT_EQ(nullptr, WPopupController::topmost());
}

class PopupTest : public NaviframeTest { };

TEST_F(PopupTest, ButtonsKeysAndDestructionInItsOwnHandler)
{
    std::string done;
    const auto open = [&] {
        auto* popup = new WPopupController;
        popup->setTitle("Title", WPopupController::Text::Plain);
        popup->setContent("Text", WPopupController::Text::Plain);
        popup->addButton("A", [&](WPopupController* self) {
            done += "a";
            self->destroy();
        });
        popup->addButton("B", nullptr); // without a handler a button closes
        popup->setOnDestroyed([&] { done += "x"; });
        EXPECT_TRUE(popup->create(_window));
        EXPECT_FALSE(popup->create(_window));
        support::runFor(0.3); // until it has slid in
        support::settle(_window);
        return popup;
    };
    WPopupController* popup = open();
    EXPECT_EQ("Title", support::text(popup->getEvasObject(), "title,text"));
    EXPECT_EQ("Text", support::text(popup->getEvasObject()));
    support::click(elm_object_part_content_get(popup->getEvasObject(), "button1"));
    EXPECT_EQ("ax", done);
    support::click(elm_object_part_content_get(open()->getEvasObject(), "button2"));
    EXPECT_EQ("axx", done);
    open();
    support::key(_window, "Escape");
    EXPECT_EQ("axxx", done);
    EXPECT_EQ(nullptr, WPopupController::topmost());
}

TEST_F(PopupTest, TheBackHandlerReplacesClosingAndTheMenuKeyStopsHere)
{
    Events events;
    int more = 0;
    Screen* screen = push(events);
    screen->setMoreButton([&] { more += 10; });
    screen->setMoreButton([&] { ++more; }); // takes the place of the first
    int back = 0;
    auto* popup = new WPopupController;
    popup->setOnBack([&](WPopupController*) { ++back; });
    popup->create(_window);
    support::settle(_window);
    support::key(_window, "Escape");
    support::key(_window, "Menu");
    EXPECT_EQ(1, back);
    EXPECT_EQ(0, more);
    EXPECT_EQ(popup, WPopupController::topmost());
    popup->destroy();
    support::key(_window, "Menu");
    EXPECT_EQ(1, more);
}

TEST_F(PopupTest, TheWindowTakesThePopupWithIt)
{
    int closed = 0;
    auto* popup = new WPopupController;
    popup->setOnDestroyed([&] { ++closed; });
    popup->create(_window);
    evas_object_del(std::exchange(_window, nullptr));
    EXPECT_EQ(1, closed);
    // One that was never opened ends the same way.
    auto* unopened = new WPopupController;
    unopened->setOnDestroyed([&] { ++closed; });
    EXPECT_FALSE(unopened->create(nullptr));
    unopened->destroy();
    EXPECT_EQ(2, closed);
}

TEST_F(PopupTest, TheMenuClosesBeforeItsActionAndOnEveryOtherWayOut)
{
    std::string done;
    const auto open = [&] {
        auto* menu = new WMenuPopupController;
        menu->addItem("First", [&] { done += "1"; });
        menu->addItem("Second", [&] { done += "2"; });
        menu->setOnDestroyed([&] { done += "x"; });
        EXPECT_TRUE(menu->create(_window, _naviframe->getEvasObject()));
        support::settle(_window);
        return menu;
    };
    WMenuPopupController* menu = open();
    EXPECT_EQ((std::vector<std::string>{"First", "Second"}), menu->labels());
    menu->choose(5);
    menu->choose(1);
    EXPECT_EQ("x2", done);
    for (const char* key : {"Escape", "Menu"}) {
        done.clear();
        open();
        support::key(_window, key);
        EXPECT_EQ("x", done) << key;
    }
    done.clear();
    open();
    support::runFor(0.3);
    support::key(_window, "Return"); // the first entry has the keyboard
    EXPECT_EQ("x1", done);
}

}
