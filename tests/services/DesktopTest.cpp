#include "bluetooth.h"
#include "host/BusInLoop.h"
#include "host/Notifier.h"
#include "media_key.h"
#include "notification.h"
#include "notification_control.h"
#include "remote_player.h"
#include "tovanic_log_manager.h"
#include "vconf.h"

#include "support/DbusMock.h"
#include "support/PrivateBus.h"
#include "support/RunUntil.h"

#include <gtest/gtest.h>

#include <cstring>
#include <thread>

namespace {

using support::BusKind;
using support::DbusMock;
using support::PrivateBus;
using support::Program;
using support::runUntil;

constexpr auto PLAYER = "org.mpris.MediaPlayer2.mewlo_lite";
constexpr auto RECORDER_STATE = "memory/mewlo/recorder_state";

class MprisTest : public testing::Test {
protected:
    MprisTest()
    {
        vconf_set_int(RECORDER_STATE, 1);
        vconf_set_str("memory/mewlo/title", "Memo 007");
        bt_initialize();
        bt_avrcp_target_initialize([](bool, const char*, void*) {}, nullptr);
    }
    ~MprisTest() override
    {
        media_key_release();
        bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_STOPPED);
        bt_avrcp_target_deinitialize();
        bt_deinitialize();
        host::closeBuses();
    }
    void reserve()
    {
        ASSERT_EQ(0,
            media_key_reserve(
                [](media_key_e key, media_key_event_e status, void* data) {
                    *static_cast<std::string*>(data)
                        += std::to_string(key) + (status == MEDIA_KEY_STATUS_PRESSED ? "+" : "- ");
                },
                &_events));
    }
    // What a remote control prints; the loop runs meanwhile.
    std::string playerctl(const std::vector<std::string>& words)
    {
        const std::string output = _directory.file("output");
        std::filesystem::remove(output);
        std::vector<std::string> command = {"playerctl"};
        command.insert(command.end(), words.begin(), words.end());
        Program program(command, output);
        EXPECT_TRUE(runUntil([&] { return !program.isRunning(); }, 30));
        std::string text = support::readFile(output);
        while (!text.empty() && text.back() == '\n')
            text.pop_back();
        return text;
    }

    support::TempDir _directory;
    PrivateBus _bus;
    std::string _events;
};

TEST_F(MprisTest, RemoteControlsPressKeysWhileTheyAreReserved)
{
    EXPECT_EQ("", playerctl({"--list-all"}));
    reserve();
    EXPECT_EQ("mewlo_lite", playerctl({"--list-all"}));
    const struct {
        std::vector<std::string> words;
        const char* events;
    } cases[] = {{{"play-pause"}, "7+7- "}, {{"play"}, "0+0- "}, {{"pause"}, "2+2- "}, {{"next"}, "4+4- "},
        {{"previous"}, "3+3- "}, {{"stop"}, "1+1- "}};
    for (const auto& entry : cases) {
        SCOPED_TRACE(entry.words.front());
        _events.clear();
        playerctl(entry.words);
        EXPECT_TRUE(runUntil([&] { return _events == entry.events; })) << _events;
    }
    media_key_release();
    EXPECT_TRUE(runUntil([&] { return playerctl({"--list-all"}).empty(); }));
}

TEST_F(MprisTest, ShowsThePlayerAndTheRecorder)
{
    bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_PAUSED); // before there is anybody to tell
    reserve();
    EXPECT_EQ("Paused", playerctl({"status"}));
    std::thread worker([] { bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_PLAYING); });
    EXPECT_TRUE(runUntil([&] { return playerctl({"status"}) == "Playing"; }));
    worker.join();
    EXPECT_EQ("Memo 007", playerctl({"metadata", "title"}));

    const struct {
        int recorder;
        const char* status;
    } cases[] = {{2, "Playing"}, {3, "Paused"}, {1, "Stopped"}};
    bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_STOPPED);
    for (const auto& entry : cases) {
        vconf_set_int(RECORDER_STATE, entry.recorder);
        EXPECT_TRUE(runUntil([&] { return playerctl({"status"}) == entry.status; })) << entry.recorder;
    }
    vconf_set_int(RECORDER_STATE, 2); // nothing to skip to while recording
    support::runFor(0.05);
    _events.clear();
    playerctl({"next"});
    support::runFor(0.05);
    EXPECT_EQ("", _events);
}

TEST_F(MprisTest, ShowsAndMovesThePlaceInARecording)
{
    static int position;
    static std::vector<int> seeks;
    position = 4000;
    seeks.clear();
    const remote_player_callbacks_s callbacks = {[](remote_player_track_s* track, void*) {
                                                     std::strcpy(track->title, "Talk");
                                                     track->duration = 60000;
                                                     return true;
                                                 },
        [](void*) { return position; }, [](int milliseconds, void*) { seeks.push_back(milliseconds); }};
    ASSERT_EQ(0, remote_player_set_callbacks(&callbacks, nullptr));
    reserve();
    EXPECT_EQ("Memo 007", playerctl({"metadata", "title"})) << "nothing is played";
    playerctl({"position", "9"});
    EXPECT_TRUE(seeks.empty());

    bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_PLAYING);
    EXPECT_TRUE(runUntil([&] { return playerctl({"metadata", "title"}) == "Talk"; }));
    EXPECT_EQ("60000000", playerctl({"metadata", "mpris:length"}));
    EXPECT_EQ("4.0", playerctl({"position"}).substr(0, 3));
    playerctl({"position", "9"});
    playerctl({"position", "2.5+"});
    playerctl({"position", "30-"});
    EXPECT_EQ((std::vector<int>{9000, 6500, 0}), seeks);
    _events.clear();
    playerctl({"position", "90+"}); // beyond the end is the next one
    EXPECT_TRUE(runUntil([&] { return _events == "4+4- "; })) << _events;

    vconf_set_int(RECORDER_STATE, 2);
    EXPECT_TRUE(runUntil([&] { return playerctl({"metadata", "title"}) == "Memo 007"; }));
    playerctl({"position", "9"});
    EXPECT_EQ(3u, seeks.size()) << "a recording cannot be moved in";
    EXPECT_EQ("4.0", playerctl({"position"}).substr(0, 3)) << "but its time counts";
    remote_player_set_callbacks(nullptr, nullptr);
}

TEST_F(MprisTest, AReceiverMayReleaseTheKeysInItsCallback)
{
    static int calls = 0;
    ASSERT_EQ(0,
        media_key_reserve(
            [](media_key_e, media_key_event_e, void*) {
                ++calls;
                media_key_release();
            },
            nullptr));
    const std::string answer = playerctl({"stop"});
    EXPECT_TRUE(runUntil([] { return calls == 1; })) << calls << " calls, " << answer;
    support::runFor(0.05);
    EXPECT_EQ(1, calls);
    EXPECT_NE(0, media_key_reserve(nullptr, nullptr));
}

TEST_F(MprisTest, AReleaseCancelsAReservationOnItsWay)
{
    std::thread([this] { media_key_reserve([](media_key_e, media_key_event_e, void*) {}, &_events); }).join();
    media_key_release();
    support::runFor(0.05);
    EXPECT_EQ("", playerctl({"--list-all"}));
    std::thread([this] { media_key_reserve([](media_key_e, media_key_event_e, void*) {}, &_events); }).join();
    EXPECT_TRUE(runUntil([&] { return playerctl({"--list-all"}) == "mewlo_lite"; }));
}

TEST_F(MprisTest, LosesItsBusWithoutHarm)
{
    reserve();
    _bus.stop();
    support::runFor(0.1);
    bt_avrcp_target_notify_player_state(BT_AVRCP_PLAYER_STATE_PLAYING);
    vconf_set_int(RECORDER_STATE, 2);
    support::runFor(0.1);
    EXPECT_EQ(0, media_key_release());
    EXPECT_EQ(nullptr, host::sessionBus());
}

TEST(NotifierTest, ReplacesItsNotification)
{
    if (!DbusMock::isInstalled())
        GTEST_SKIP() << "python3-dbusmock is missing";
    const PrivateBus bus;
    constexpr auto SERVICE = "org.freedesktop.Notifications";
    constexpr auto PATH = "/org/freedesktop/Notifications";
    DbusMock daemon(bus, BusKind::SESSION, SERVICE, {SERVICE, PATH, SERVICE});
    // The second one must name the first one's number.
    daemon.control(PATH, "AddMethod", "sssss", SERVICE, "Notify", "susssasa{sv}i", "u",
        "if args[4] == 'second' and args[1] != 42: raise Exception('not replaced')\n"
        "if args[6].get('transient') != True: raise Exception('stays')\n"
        "ret = dbus.UInt32(42)");
    host::Notifier notifier;
    std::string failed;
    const auto fail = [&](const std::string& text) { failed += text; };
    EXPECT_TRUE(notifier.show("first", fail));
    ASSERT_TRUE(runUntil([&] { return daemon.callsOf(PATH, "Notify") == 1; }, 20));
    support::runFor(0.1);
    EXPECT_TRUE(notifier.show("second", fail));
    ASSERT_TRUE(runUntil([&] { return daemon.callsOf(PATH, "Notify") == 2; }, 20));
    support::runFor(0.1);
    EXPECT_EQ("", failed);
    host::closeBuses();
}

TEST(NotifierTest, ReportsWhenNobodyShowsIt)
{
    host::Notifier notifier;
    std::string failed;
    const auto fail = [&](const std::string& text) { failed += text; };
    host::closeBuses();
    EXPECT_FALSE(notifier.show("no bus", fail));
    const PrivateBus bus;
    host::closeBuses();
    EXPECT_TRUE(notifier.show("no daemon", fail));
    EXPECT_TRUE(runUntil([&] { return failed == "no daemon"; }));
    host::closeBuses();
}

// A notification service that gives the next number to each new notification and keeps what it is told in files.
class NotificationService {
public:
    NotificationService(const PrivateBus& bus, const std::string& capabilities, const support::TempDir& directory)
        : _told(directory.file("told"))
        , _daemon(bus, BusKind::SESSION, NAME, {"--template", written(directory.file("service.py"), capabilities)})
    {
    }
    [[nodiscard]] bool hasHeard(const std::string& text) const
    {
        return runUntil([&] { return support::readFile(_told).ends_with(text + "\n"); }, 20);
    }
    [[nodiscard]] std::string heard() const { return support::readFile(_told); }
    void press(unsigned int id, const char* key)
    {
        _daemon.control(PATH, "EmitSignal", "sssav", NAME, "ActionInvoked", "us", 2, "u", id, "s", key);
    }
    void close(unsigned int id)
    {
        _daemon.control(PATH, "EmitSignal", "sssav", NAME, "NotificationClosed", "uu", 2, "u", id, "u", 2U);
    }

private:
    static constexpr auto NAME = "org.freedesktop.Notifications";
    static constexpr auto PATH = "/org/freedesktop/Notifications";

    // It can answer as soon as it has its name.
    [[nodiscard]] std::string written(const std::string& file, const std::string& capabilities) const
    {
        std::string program = R"PY(
BUS_NAME = MAIN_IFACE = "org.freedesktop.Notifications"
MAIN_OBJ = "/org/freedesktop/Notifications"
SYSTEM_BUS = False
def load(mock, parameters):
    tell = 'open("TOLD", "a").write'
    mock.AddMethods(MAIN_IFACE, [
        ("GetCapabilities", "", "as", 'ret = "CAPABILITIES".split()'),
        ("CloseNotification", "u", "", tell + '(f"closed {args[0]}\\n")'),
        ("Notify", "susssasa{sv}i", "u", """
n = args[1] or len(self.GetMethodCalls("Notify")) + 100
h = args[6]
lasts = h["resident"] and h["suppress-sound"] and h["urgency"] == 0 and args[7] == 0
""" + tell + """(f"{args[1]}:{n} {args[3]}|{args[4]}|{' '.join(args[5])}|{bool(lasts)}\\n")
ret = dbus.UInt32(n)""")])
)PY";
        for (const auto& [word, value] : {std::pair("TOLD", _told), {"CAPABILITIES", capabilities}})
            program.replace(program.find(word), std::strlen(word), value);
        support::writeFile(file, program);
        return file;
    }

    std::string _told;
    DbusMock _daemon;
};

class NotificationControlTest : public testing::Test {
protected:
    NotificationControlTest() { host::closeBuses(); }
    ~NotificationControlTest() override
    {
        notification_control_unwatch();
        host::closeBuses();
    }
    void SetUp() override
    {
        if (!DbusMock::isInstalled())
            GTEST_SKIP() << "python3-dbusmock is missing";
        ASSERT_EQ(0, notification_control_watch([](void* self) { ++static_cast<Self*>(self)->_changes; }, this));
    }
    int post(const char* text)
    {
        const notification_control_action_s actions[] = {{"pause", "Pause"}, {"stop", "Stop"}};
        return notification_control_post(
            "Voice <1>", text, actions, 2,
            [](const char* key, void* self) { static_cast<Self*>(self)->_pressed += std::string(key) + " "; }, this);
    }
    static bool becomes(bool supported)
    {
        return runUntil([=] { return notification_control_is_supported() == supported; }, 20);
    }

    using Self = NotificationControlTest;
    const PrivateBus _bus;
    support::TempDir _directory;
    int _changes = 0;
    std::string _pressed;
};

TEST_F(NotificationControlTest, IsOneThatChangesInPlaceAndActs)
{
    EXPECT_NE(0, post("nobody is there"));
    NotificationService service(_bus, "body body-markup actions", _directory);
    ASSERT_TRUE(becomes(true));
    ASSERT_EQ(0, post("records"));
    ASSERT_EQ(0, post("records <b>")); // before the first one has its number
    ASSERT_TRUE(service.hasHeard("101:101 Voice <1>|records &lt;b&gt;|pause Pause stop Stop|True")) << service.heard();
    service.press(100, "stop");
    service.press(101, "pause");
    EXPECT_TRUE(runUntil([&] { return _pressed == "pause "; })) << "not that of another program";
    service.close(101);
    support::runFor(0.1);
    ASSERT_EQ(0, post("rests"));
    ASSERT_TRUE(service.hasHeard("0:103 Voice <1>|rests|pause Pause stop Stop|True")) << service.heard();
    notification_control_withdraw();
    ASSERT_TRUE(service.hasHeard("closed 103")) << service.heard();
    ASSERT_EQ(0, post("on its way"));
    notification_control_unwatch();
    ASSERT_TRUE(service.hasHeard("closed 104")) << service.heard();
}

TEST_F(NotificationControlTest, FollowsTheServiceThatIsThere)
{
    for (const bool hasActions : {true, false, true}) {
        const support::TempDir directory;
        const NotificationService service(_bus, hasActions ? "actions" : "body", directory);
        if (!hasActions) {
            support::runFor(0.1);
            EXPECT_NE(0, post("no actions"));
            continue;
        }
        ASSERT_TRUE(becomes(true));
        EXPECT_EQ(0, post("plain <b>"));
        EXPECT_TRUE(service.hasHeard("0:101 Voice <1>|plain <b>|pause Pause stop Stop|True")) << service.heard();
        EXPECT_EQ("", _pressed);
    }
    EXPECT_TRUE(becomes(false)) << "it has ended";
    EXPECT_EQ(4, _changes);
    EXPECT_NE(0, post("nobody is there"));
}

TEST(StatusMessageTest, IsRememberedFromAnyThread)
{
    EXPECT_NE(0, notification_status_message_post(nullptr));
    std::thread([] { notification_status_message_post("from a worker"); }).join();
    EXPECT_STREQ("from a worker", notification_status_message_last());
    EXPECT_EQ(0, notification_status_message_post(""));
    EXPECT_STREQ("", notification_status_message_last());
}

class UsageLogTest : public testing::Test {
protected:
    UsageLogTest()
    {
        ::setenv("XDG_STATE_HOME", _directory.path().c_str(), 1);
        tovanic_log_manager_create(&_manager);
    }
    ~UsageLogTest() override { tovanic_log_manager_destroy(_manager); }
    int insert(const std::string& feature, const std::string& extra)
    {
        bundle* record = bundle_create();
        bundle_add_str(record, "app_id", "com.tovanic.mewlo-lite");
        bundle_add_str(record, "feature", feature.c_str());
        bundle_add_str(record, "extra", extra.c_str());
        const int result
            = tovanic_log_manager_insert(_manager, TOVANIC_LOG_MANAGER_URI, record, nullptr, nullptr, nullptr);
        bundle_free(record);
        return result;
    }
    [[nodiscard]] std::string log() const { return support::readFile(_directory.file("mewlo-lite/usage.jsonl")); }

    support::TempDir _directory;
    tovanic_log_manager_h _manager = nullptr;
};

TEST_F(UsageLogTest, WritesOneJsonLineForARecord)
{
    EXPECT_EQ(0, insert("RECO", "Normal Mode"));
    EXPECT_EQ(0, insert("Rena", "quote \" back\\slash\nline \xc3\xa4"));
    const std::string text = log();
    EXPECT_NE(
        std::string::npos, text.find(R"("app_id":"com.tovanic.mewlo-lite","feature":"RECO","extra":"Normal Mode"})"));
    EXPECT_NE(std::string::npos, text.find("\"extra\":\"quote \\\" back\\\\slash\\u000aline \xc3\xa4\"}\n"));
    EXPECT_EQ(2, std::count(text.begin(), text.end(), '\n'));
    EXPECT_TRUE(text.starts_with("{\"time\":\"20"));
    bundle* record = bundle_create();
    EXPECT_NE(0, tovanic_log_manager_insert(_manager, "content://elsewhere", record, nullptr, nullptr, nullptr));
    bundle_free(record);
}

TEST_F(UsageLogTest, TurnsAtOneMegabyteAndLosesNoLine)
{
    support::writeFile(_directory.file("mewlo-lite/usage.jsonl"), std::string(1024 * 1024 - 150, 'x') + "\n");
    std::vector<std::thread> writers;
    for (int i = 0; i < 4; ++i)
        writers.emplace_back([this] {
            for (int n = 0; n < 50; ++n)
                EXPECT_EQ(0, insert("SAVE", "x"));
        });
    for (auto& writer : writers)
        writer.join();
    const std::string old = support::readFile(_directory.file("mewlo-lite/usage.jsonl.1"));
    const std::string now = log();
    EXPECT_GE(old.size(), 1024U * 1024U);
    EXPECT_LT(now.size(), 100U * 1024U);
    EXPECT_EQ(201, std::count(old.begin(), old.end(), '\n') + std::count(now.begin(), now.end(), '\n'));
}

TEST_F(UsageLogTest, AnUnwritablePlaceIsAnError)
{
    support::writeFile(_directory.file("mewlo-lite"), "a file where the directory should be");
    EXPECT_NE(0, insert("RECO", ""));
}

}
