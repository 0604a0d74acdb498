// The companions of the recordings list: the private storage's service and the chooser for sharing.
#include "Clipboard.h"
#include "ShareWays.h"
#include "app_control.h"
#include "storage.h"
#include "vconf.h"

#include "support/PrivateBus.h"
#include "support/RunUntil.h"
#include "support/XServer.h"

#include <gtest/gtest.h>

#include <X11/Xatom.h>
#include <X11/Xlib.h>

#include <cstdlib>

#include <sys/stat.h>

namespace {

namespace fs = std::filesystem;
using support::Program;
using support::runUntil;

struct Answer {
    std::vector<int> results;
    std::string extra;
};

class FileCompanionsTest : public testing::Test {
protected:
    FileCompanionsTest()
    {
        ::setenv("MEWLO_APPS_DIR", TEST_APPS_DIR, 1);
        ::setenv("MEWLO_HOST", "none", 1);
        app_control_create(&_request);
        app_control_set_launch_mode(_request, APP_CONTROL_LAUNCH_MODE_GROUP);
    }
    ~FileCompanionsTest() override
    {
        ::setenv("PATH", _path.c_str(), 1);
        app_control_destroy(_request);
    }
    int send()
    {
        _answer = {};
        const auto replied = [](app_control_h, app_control_h reply, app_control_result_e result, void* data) {
            auto* answer = static_cast<Answer*>(data);
            answer->results.push_back(result);
            char* text = nullptr;
            if (reply != nullptr && app_control_get_extra_data(reply, "result", &text) == 0)
                answer->extra = text;
            ::free(text);
        };
        return app_control_send_launch_request(_request, replied, &_answer);
    }
    std::string askPrivateStorage(const char* value)
    {
        app_control_set_app_id(_request, "com.tovanic.setting.private");
        app_control_add_extra_data(_request, "value", value);
        EXPECT_EQ(0, send());
        EXPECT_TRUE(runUntil([this] { return !_answer.results.empty(); }, 30));
        return _answer.extra;
    }
    // A program that writes its arguments, one a line.
    void install(const std::string& name)
    {
        const std::string program = _programs.file(name);
        support::writeFile(program,
            "#!/bin/sh\nprintf '%s\\n' \"$@\" > " + program + ".new && mv " + program + ".new " + program + ".out\n");
        fs::permissions(program, fs::perms::owner_all);
    }

    support::TempDir _programs;
    const std::string _path = ::getenv("PATH");
    app_control_h _request = nullptr;
    Answer _answer;
};

TEST_F(FileCompanionsTest, PrivateStorageOpensForItsOwnerOnlyAndCloses)
{
    int open = -1;
    EXPECT_EQ("Success", askPrivateStorage("on"));
    EXPECT_EQ(std::vector<int>{APP_CONTROL_RESULT_SUCCEEDED}, _answer.results);
    struct stat status { };
    ASSERT_EQ(0, ::stat(storage_private_root(), &status));
    EXPECT_EQ(0700U, status.st_mode & 07777);
    EXPECT_EQ(0, vconf_get_bool("memory/setting/personal", &open));
    EXPECT_EQ(1, open);
    EXPECT_EQ("Success", askPrivateStorage("off"));
    EXPECT_EQ(0, vconf_get_bool("memory/setting/personal", &open));
    EXPECT_EQ(0, open);
    EXPECT_EQ("Fail", askPrivateStorage("maybe"));
    EXPECT_EQ(APP_CONTROL_RESULT_FAILED, _answer.results.at(0));

    const std::string home = ::getenv("XDG_DATA_HOME");
    support::writeFile(_programs.file("file"), "");
    ::setenv("XDG_DATA_HOME", _programs.file("file").c_str(), 1); // no directory can be made there
    EXPECT_EQ("Fail", askPrivateStorage("on"));
    ::setenv("XDG_DATA_HOME", home.c_str(), 1);
}

TEST_F(FileCompanionsTest, ToolOffersThePrivateStorageInLaterSessionsToo)
{
    EXPECT_EQ(0, Program({TEST_BIN_DIR "/mewlo-tool", "private", "setup"}).wait());
    int method = 0;
    EXPECT_EQ(0, vconf_get_int("db/setting/personal_unlock_method", &method));
    EXPECT_EQ(1, method);
    fs::remove_all(::getenv("XDG_RUNTIME_DIR") + std::string("/com.tovanic.mewlo-lite")); // the session ends
    EXPECT_NE(0, vconf_get_int("db/setting/personal_unlock_method", &method));
    ::setenv("MEWLO_HOST", "private", 1);
    EXPECT_EQ("Success", askPrivateStorage("on")); // any application of ours brings it back
    EXPECT_EQ(0, vconf_get_int("db/setting/personal_unlock_method", &method));
    EXPECT_EQ(1, method);
}

TEST_F(FileCompanionsTest, ToolRefusesWhatItDoesNotKnowAndTellsWhatItCannotWrite)
{
    struct {
        const char* words;
        int status;
        const char* output; // null: anything
    } const cases[] = {
        {"list --wrong", 2, ""},
        {"list extra", 2, ""},
        {"locks extra", 2, ""},
        {"doctor --wrong", 2, ""},
        {"usage extra", 2, ""},
        {"record 1 extra", 2, ""},
        {"record 1 --format", 2, ""},
        {"request --wrong 1", 2, ""},
        {"state list extra", 2, ""},
        {"", 2, ""},
        {"--version", 0, nullptr},
        {"--help > /dev/full", 1, ""},
        {"state set memory/x \"$(printf 'a\\nb')\"", 0, ""},
        {"state | grep memory/x", 0, "memory/x=a\\nb\n"},
    };
    for (const auto& [words, status, output] : cases) {
        SCOPED_TRACE(words);
        const std::string file = _programs.file("output");
        support::writeFile(file, ""); // programs append
        const std::string line = std::string(TEST_BIN_DIR "/mewlo-tool ") + words;
        EXPECT_EQ(status, Program({"sh", "-c", "exec 2>/dev/null; " + line}, file).wait());
        if (output != nullptr) {
            EXPECT_EQ(output, support::readFile(file));
        }
    }
}

TEST_F(FileCompanionsTest, OffersWhatIsInstalledAndAlwaysTheClipboard)
{
    const std::vector<std::string> paths = {"/music/a b.m4a", "/music/ö.m4a"};
    ::setenv("PATH", _programs.path().c_str(), 1);
    const auto none = share::waysFor(paths);
    ASSERT_EQ(1U, none.size());
    EXPECT_TRUE(none[0].command.empty());
    for (const char* program : {"xdg-email", "blueman-sendto", "xdg-open"})
        install(program);
    const auto all = share::waysFor(paths);
    ASSERT_EQ(4U, all.size());
    EXPECT_EQ((std::vector<std::string>{"xdg-email", "--attach", paths[0], "--attach", paths[1]}), all[0].command);
    EXPECT_EQ((std::vector<std::string>{"blueman-sendto", paths[0], paths[1]}), all[1].command);
    EXPECT_EQ((std::vector<std::string>{"xdg-open", "/music/"}), all[2].command);
    EXPECT_EQ("file:///music/a%20b.m4a\r\nfile:///music/%C3%B6.m4a\r\n", share::uriListOf(paths));
    app_control_set_uri(_request, "/no/such/file.m4a");
    EXPECT_TRUE(share::pathsOf(_request).empty());
}

class ShareWindowTest : public FileCompanionsTest {
protected:
    void SetUp() override
    {
        if (!_server.isUp())
            GTEST_SKIP() << "Xvfb is missing";
        _manager = std::make_unique<Program>(std::vector<std::string>{"openbox", "--sm-disable"});
        if (!runUntil([this] { return xdotool({"get_desktop"}) == 0; }, 20))
            GTEST_SKIP() << "openbox or xdotool is missing";
        for (const char* program : {"xdg-email", "bluetooth-sendto", "xdg-open"})
            install(program);
        ::setenv("PATH", (_programs.path() + ":" + _path).c_str(), 1);
        for (const char* name : {"a.m4a", "b.m4a"}) {
            support::writeFile(_files.file(name), name);
            _paths.push_back(_files.file(name));
        }
    }
    static int xdotool(const std::vector<std::string>& words)
    {
        std::vector<std::string> command = {"xdotool"};
        command.insert(command.end(), words.begin(), words.end());
        return Program(command).wait(30);
    }
    void share()
    {
        const char* paths[] = {_paths[0].c_str(), _paths[1].c_str()};
        app_control_set_operation(_request, APP_CONTROL_OPERATION_MULTI_SHARE);
        app_control_set_uri(_request, paths[0]);
        app_control_add_extra_data_array(_request, APP_CONTROL_DATA_PATH, paths, 2);
        app_control_enable_app_started_result_event(_request);
        ASSERT_EQ(0, send());
        ASSERT_TRUE(runUntil([this] { return !_answer.results.empty(); }, 30));
        EXPECT_EQ(APP_CONTROL_RESULT_APP_STARTED, _answer.results[0]);
        ASSERT_TRUE(runUntil(
            [] {
                return xdotool({"search", "--onlyvisible", "--name", "^Share$", "windowfocus", "--sync"}) == 0;
            },
            30));
    }
    // Presses keys until the condition holds: the window may not have drawn its first frame yet.
    static bool pressUntil(const char* key, const std::function<bool()>& condition)
    {
        for (int i = 0; i < 20 && !condition(); ++i) {
            xdotool({"key", key});
            runUntil(condition, 1);
        }
        return condition();
    }

    support::XServer _server;
    std::unique_ptr<Program> _manager;
    support::TempDir _files;
    std::vector<std::string> _paths;
};

TEST_F(ShareWindowTest, SendsByTheChosenWayAndEscapeSharesNothing)
{
    share();
    EXPECT_TRUE(pressUntil("Escape", [this] { return _answer.results.size() == 2; }));
    EXPECT_EQ(APP_CONTROL_RESULT_FAILED, _answer.results.at(1));
    EXPECT_FALSE(fs::exists(_programs.file("xdg-email.out")));

    share();
    EXPECT_TRUE(pressUntil("Return", [this] { return _answer.results.size() == 2; }));
    EXPECT_EQ(APP_CONTROL_RESULT_SUCCEEDED, _answer.results.at(1));
    EXPECT_TRUE(runUntil([this] { return fs::exists(_programs.file("xdg-email.out")); }));
    EXPECT_EQ("--attach\n" + _paths[0] + "\n--attach\n" + _paths[1] + "\n",
        support::readFile(_programs.file("xdg-email.out")));
}

TEST_F(ShareWindowTest, AsksWhetherARecordingIsToBeDiscarded)
{
    const std::string title = "^Discard recording$";
    struct {
        const char* name;
        std::vector<std::string> act;
        int result;
    } const cases[] = {
        {"escape", {"key", "Escape"}, APP_CONTROL_RESULT_FAILED},
        {"the safe answer has the keyboard", {"key", "Return"}, APP_CONTROL_RESULT_FAILED},
        {"confirmed", {"key", "Tab", "Return"}, APP_CONTROL_RESULT_SUCCEEDED},
        {"killed", {"search", "--onlyvisible", "--name", title, "windowkill"}, APP_CONTROL_RESULT_FAILED},
    };
    for (const auto& [name, act, result] : cases) {
        SCOPED_TRACE(name);
        app_control_set_app_id(_request, "com.tovanic.mewlo-lite.popupapp");
        ASSERT_EQ(0, send());
        ASSERT_TRUE(runUntil(
            [&] {
                return xdotool({"search", "--onlyvisible", "--name", title, "windowfocus", "--sync"}) == 0;
            },
            30));
        support::runFor(0.7); // its first frame; before it the window takes no keys
        xdotool(act);
        ASSERT_TRUE(runUntil([this] { return !_answer.results.empty(); }, 20));
        EXPECT_EQ(std::vector<int>{result}, _answer.results);
        ASSERT_TRUE(runUntil([&] { return xdotool({"search", "--onlyvisible", "--name", title}) != 0; }, 20));
    }
}

TEST_F(ShareWindowTest, ClipboardHoldsTheFilesUntilSomebodyElseTakesIt)
{
    Program holder({TEST_BIN_DIR "/mewlo-share", share::HOLD_OPTION, _paths[0], _paths[1]});
    Display* display = XOpenDisplay(nullptr);
    ASSERT_NE(nullptr, display);
    const Atom clipboard = XInternAtom(display, "CLIPBOARD", False);
    const Atom property = XInternAtom(display, "PASTED", False);
    const Window window = XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, 1, 1, 0, 0, 0);
    ASSERT_TRUE(runUntil([&] { return XGetSelectionOwner(display, clipboard) != None; }, 20));
    const auto paste = [&](const char* target) {
        XConvertSelection(display, clipboard, XInternAtom(display, target, False), property, window, CurrentTime);
        XEvent event;
        while (XNextEvent(display, &event) == 0 && event.type != SelectionNotify) { }
        Atom type = None;
        int format = 0;
        unsigned long count = 0;
        unsigned long rest = 0;
        unsigned char* data = nullptr;
        if (event.xselection.property == None)
            return std::string("refused");
        XGetWindowProperty(
            display, window, property, 0, 4096, True, AnyPropertyType, &type, &format, &count, &rest, &data);
        const std::string text = data != nullptr && format == 8 ? reinterpret_cast<char*>(data) : "";
        XFree(data);
        return text;
    };
    EXPECT_EQ(_paths[0] + "\n" + _paths[1], paste("UTF8_STRING"));
    EXPECT_EQ(share::uriListOf(_paths), paste("text/uri-list"));
    EXPECT_EQ("refused", paste("image/png"));
    XSetSelectionOwner(display, clipboard, window, CurrentTime);
    XFlush(display);
    EXPECT_EQ(0, holder.wait());
    XCloseDisplay(display);
}

}
