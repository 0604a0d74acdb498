// Control windows on a virtual X server, with and without a window manager.
#include "minicontrol.h"

#include "host/X11Desktop.h"
#include "launch/Toolkit.h"
#include "preference.h"
#include "vconf.h"

#include "support/RunUntil.h"
#include "support/XServer.h"

#include <gtest/gtest.h>

#include <Ecore_X.h>
#include <Elementary.h>

#include <fstream>

namespace {

using host::X11Desktop;
using support::Program;
using support::runUntil;

int requests = 0;

bool xdotool(const std::vector<std::string>& words)
{
    std::vector<std::string> command = {"xdotool"};
    command.insert(command.end(), words.begin(), words.end());
    Program program(command);
    return runUntil([&] { return !program.isRunning(); }, 30);
}

// With this parameter, under a window manager.
class MinicontrolTest : public testing::TestWithParam<bool> {
protected:
    void SetUp() override
    {
        if (!_server.isUp())
            GTEST_SKIP() << "Xvfb is missing";
        ::setenv("ELM_ENGINE", "x11", 1);
        ASSERT_GT(elm_init(0, nullptr), 0);
        elm_policy_set(ELM_POLICY_QUIT, ELM_POLICY_QUIT_NONE);
        vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 0);
        for (const char* key : {"PanelControlX", "PanelControlY"})
            preference_set_int(key, key == std::string("PanelControlX") ? 500 : 0);
        _main = elm_win_util_standard_add("program", "program");
        evas_object_resize(_main, 200, 200);
        evas_object_show(_main);
        platform::setMainWindow(_main);
        if (GetParam())
            startManager();
        ASSERT_TRUE(runUntil([this] { return X11Desktop::isInView(elm_win_xwindow_get(_main)); }));
        requests = 0;
    }
    void TearDown() override
    {
        if (!_main)
            return;
        platform::setMainWindow(nullptr);
        evas_object_del(_main);
        elm_shutdown();
        ::unsetenv("ELM_ENGINE");
    }
    void startManager()
    {
        _manager = std::make_unique<Program>(std::vector<std::string>{"openbox", "--sm-disable"});
        ASSERT_TRUE(runUntil([] {
            Ecore_X_Window window = 0;
            return ecore_x_window_prop_window_get(
                       ecore_x_window_root_first_get(), ECORE_X_ATOM_NET_SUPPORTING_WM_CHECK, &window, 1)
                > 0;
        }));
    }
    static Evas_Object* createControl(minicontrol_viewer_e viewer)
    {
        Evas_Object* window
            = minicontrol_create_window("control", viewer, [](minicontrol_provider_event_e event, bundle*) {
                  requests += event == MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE;
              });
        evas_object_resize(window, 300, 60);
        evas_object_show(window);
        return window;
    }
    void minimise(bool on)
    {
        if (GetParam())
            elm_win_iconified_set(_main, on);
        else // nobody manages it: as good as gone
            on ? evas_object_hide(_main) : evas_object_show(_main);
    }
    static bool isOnScreen(Evas_Object* window) { return ecore_x_window_visible_get(elm_win_xwindow_get(window)) != 0; }
    static bool comes(Evas_Object* window)
    {
        return runUntil([=] { return isOnScreen(window) && minicontrol_is_seen(window); }, 5);
    }
    static bool goes(Evas_Object* window)
    {
        return runUntil([=] { return !isOnScreen(window) && !minicontrol_is_seen(window); }, 5);
    }
    static bool isAt(Evas_Object* window, int x, int y)
    {
        return runUntil(
            [=] {
                int left = 0;
                int top = 0;
                ecore_x_pointer_xy_get(elm_win_xwindow_get(window), &left, &top);
                int pointerX = 0;
                int pointerY = 0;
                ecore_x_pointer_xy_get(ecore_x_window_root_first_get(), &pointerX, &pointerY);
                return pointerX - left == x && pointerY - top == y;
            },
            5);
    }

    support::XServer _server; // 640 by 480
    std::unique_ptr<Program> _manager;
    Evas_Object* _main = nullptr;
};

TEST_P(MinicontrolTest, ThePanelsWindowIsThereWhileTheProgramIsNot)
{
    ASSERT_TRUE(minicontrol_is_supported(MINICONTROL_VIEWER_PANEL));
    Evas_Object* window = createControl(MINICONTROL_VIEWER_PANEL);
    int changes = 0;
    evas_object_smart_callback_add(
        window, MINICONTROL_SEEN_CHANGED, [](void* data, Evas_Object*, void*) { ++*static_cast<int*>(data); },
        &changes);
    EXPECT_TRUE(goes(window)) << "its program is in front";
    minimise(true);
    EXPECT_TRUE(comes(window));
    EXPECT_EQ(1, changes % 2);
    EXPECT_TRUE(isAt(window, 170, 0)) << "at the top, in the middle";
    evas_object_hide(window);
    EXPECT_TRUE(goes(window)) << "its owner does not want it";
    evas_object_show(window);
    EXPECT_TRUE(comes(window));
    vconf_set_int("memory/device/display_state", 2);
    EXPECT_TRUE(runUntil([=] { return !minicontrol_is_seen(window); })) << "the display is off";
    vconf_set_int("memory/device/display_state", 0);
    EXPECT_TRUE(comes(window));
    minimise(false);
    EXPECT_TRUE(goes(window));
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 1);
    EXPECT_TRUE(comes(window));
    evas_object_resize(window, 900, 60);
    EXPECT_TRUE(isAt(window, 0, 0));
    int width = 0;
    evas_object_geometry_get(window, nullptr, nullptr, &width, nullptr);
    EXPECT_EQ(640, width) << "no wider than the screen";
    evas_object_del(window);
}

TEST_P(MinicontrolTest, TheLockScreensWindowIsThereWhileItIsLocked)
{
    Evas_Object* window = createControl(MINICONTROL_VIEWER_LOCKSCREEN);
    minimise(true);
    support::runFor(0.1);
    EXPECT_FALSE(isOnScreen(window));
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 1);
    EXPECT_TRUE(comes(window));
    EXPECT_TRUE(isAt(window, 170, 336)) << "in the middle, low";
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 0);
    EXPECT_TRUE(goes(window));
    evas_object_del(window);
}

TEST_P(MinicontrolTest, StaysWhereItIsDraggedAndAsksBeforeItCloses)
{
    minimise(true);
    Evas_Object* window = createControl(MINICONTROL_VIEWER_PANEL);
    ASSERT_TRUE(comes(window));
    ASSERT_TRUE(xdotool({"mousemove", "320", "30", "mousedown", "1", "mousemove", "300", "100", "mousemove", "230",
        "240", "mouseup", "1"}));
    EXPECT_TRUE(isAt(window, 80, 210));
    EXPECT_TRUE(runUntil([] {
        int x = 500;
        preference_get_int("PanelControlX", &x);
        return x != 500;
    })) << "kept when the button is let go";
    evas_object_del(window);
    window = createControl(MINICONTROL_VIEWER_PANEL);
    ASSERT_TRUE(comes(window));
    EXPECT_TRUE(isAt(window, 80, 210)) << "the next one as well";
    ecore_x_window_delete_request_send(elm_win_xwindow_get(window));
    EXPECT_TRUE(runUntil([] { return requests == 1; }));
    EXPECT_TRUE(isOnScreen(window));
    evas_object_del(window);
}

TEST_P(MinicontrolTest, LeavesAFullScreenWindowOfAnotherProgramAlone)
{
    if (!GetParam())
        GTEST_SKIP() << "nobody to ask what is active";
    minimise(true);
    Evas_Object* window = createControl(MINICONTROL_VIEWER_PANEL);
    ASSERT_TRUE(comes(window));
    {
        Program other({"xmessage", "film"});
        ASSERT_TRUE(xdotool({"search", "--sync", "--onlyvisible", "--name", "xmessage", "windowactivate", "--sync"}));
        EXPECT_TRUE(isOnScreen(window));
        const auto toggle = [] {
            Ecore_X_Window active = 0;
            ecore_x_window_prop_window_get(ecore_x_window_root_first_get(), ECORE_X_ATOM_NET_ACTIVE_WINDOW, &active, 1);
            ecore_x_netwm_state_request_send(active, ecore_x_window_root_first_get(), ECORE_X_WINDOW_STATE_FULLSCREEN,
                ECORE_X_WINDOW_STATE_UNKNOWN, EINA_TRUE);
        };
        toggle();
        EXPECT_TRUE(goes(window));
    }
    EXPECT_TRUE(comes(window)) << "the film is over";
    evas_object_del(window);
}

TEST_P(MinicontrolTest, LeavesNothingBehind)
{
    if (GetParam())
        GTEST_SKIP() << "a window manager has no part in it";
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "a sanitizer keeps what is freed";
#endif
    const auto pages = [] {
        long size = 0;
        long resident = 0;
        std::ifstream("/proc/self/statm") >> size >> resident;
        return resident;
    };
    // How many pages more after so many windows; the toolkit keeps something of each itself.
    const auto growth = [&](const auto& make) {
        constexpr int MANY = 350;
        const long before = pages();
        for (int i = 0; i < MANY; ++i) {
            evas_object_del(make());
            ecore_main_loop_iterate();
        }
        support::runFor(0.05);
        return pages() - before;
    };
    const auto plain = [] {
        Evas_Object* window = elm_win_add(nullptr, "plain", ELM_WIN_BASIC);
        evas_object_resize(window, 300, 60);
        return window;
    };
    const auto control = [] { return createControl(MINICONTROL_VIEWER_PANEL); };
    growth(control);
    const long usual = growth(plain);
    EXPECT_LT(growth(control), usual + 350) << "less than four kilobytes each";
}

INSTANTIATE_TEST_SUITE_P(
    Desktops, MinicontrolTest, testing::Bool(), [](const auto& test) { return test.param ? "Managed" : "Bare"; });

}
