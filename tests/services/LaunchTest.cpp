#include "app.h"
#include "host/BusInLoop.h"
#include "launch/Registry.h"
#include "message_port.h"
#include "vconf.h"

#include "support/PrivateBus.h"
#include "support/RunUntil.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <atomic>
#include <csignal>
#include <cstdlib>
#include <memory>
#include <thread>

namespace {

using support::PrivateBus;
using support::Program;
using support::runUntil;

constexpr auto PEER = "org.example.peer-one";
constexpr auto PEER_BUS_NAME = "org.example.peer_one";
constexpr auto PEER_PROGRAM = TEST_BIN_DIR "/tests/services_peer";

struct Outcome {
    int replies = 0;
    int started = 0;
    int result = 99;
    std::string path;
};

void replyCb(app_control_h, app_control_h reply, app_control_result_e result, void* data)
{
    auto* outcome = static_cast<Outcome*>(data);
    EXPECT_TRUE(eina_main_loop_is());
    if (result == APP_CONTROL_RESULT_APP_STARTED) {
        ++outcome->started;
        return;
    }
    ++outcome->replies;
    outcome->result = result;
    char* path = nullptr;
    app_control_get_extra_data(reply, "path", &path);
    outcome->path = path != nullptr ? path : "";
    std::free(path);
}

class Request {
public:
    explicit Request(const std::string& task, const char* id = PEER)
    {
        app_control_create(&_handle);
        app_control_set_app_id(_handle, id);
        app_control_set_operation(_handle, APP_CONTROL_OPERATION_CREATE_CONTENT);
        app_control_set_launch_mode(_handle, APP_CONTROL_LAUNCH_MODE_GROUP);
        app_control_add_extra_data(_handle, "do", task.c_str());
    }
    ~Request() { app_control_destroy(_handle); }
    Request(const Request&) = delete;
    Request& operator=(const Request&) = delete;

    int send(Outcome& outcome) { return app_control_send_launch_request(_handle, replyCb, &outcome); }
    [[nodiscard]] app_control_h handle() const { return _handle; }

private:
    app_control_h _handle = nullptr;
};

class LaunchTest : public testing::Test {
protected:
    LaunchTest()
    {
        ::setenv("MEWLO_APPS_DIR", _directory.file("apps").c_str(), 1);
        ::setenv("PEER_LOG", log().c_str(), 1);
        ::setenv("MEWLO_HOST", "none", 1);
        writeEntry(PEER, std::string("Exec=") + PEER_PROGRAM);
    }
    ~LaunchTest() override
    {
        host::closeBuses();
        vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 0);
        for (const char* name : {"PEER_PORT", "PEER_TOOLKIT", "PEER_REFUSES", "PEER_ID", "PEER_CALLS"})
            ::unsetenv(name);
    }
    void writeEntry(const std::string& id, const std::string& lines)
    {
        support::writeFile(_directory.file("apps/" + id + ".app"), "[Application]\n" + lines + "\n");
    }
    [[nodiscard]] std::string log() const { return _directory.file("log"); }
    [[nodiscard]] std::string notes() const { return support::readFile(log()); }
    [[nodiscard]] bool waitForNote(const std::string& note) const
    {
        return runUntil([&] { return notes().find(note) != std::string::npos; }, 30);
    }
    static bool waitForReply(const Outcome& outcome)
    {
        return runUntil([&] { return outcome.replies > 0; }, 30);
    }

    support::TempDir _directory;
};

// With and without a session bus alike: a program that we start is reached over its socket.
class SpawnTest : public LaunchTest, public testing::WithParamInterface<bool> {
protected:
    SpawnTest()
    {
        if (GetParam())
            _bus = std::make_unique<PrivateBus>();
    }
    ~SpawnTest() override { host::closeBuses(); }
    std::unique_ptr<PrivateBus> _bus;
};

INSTANTIATE_TEST_SUITE_P(
    Bus, SpawnTest, testing::Bool(), [](const auto& bus) { return bus.param ? "With" : "Without"; });

TEST_P(SpawnTest, EveryEndOfTheOtherSideGivesOneReply)
{
    const struct {
        const char* task;
        int result;
        const char* path;
    } cases[] = {{"reply", 0, "/tmp/one.m4a"}, {"fail", -1, "/tmp/one.m4a"}, {"clone", 0, "/tmp/one.m4a"},
        {"crash", -1, ""}, {"exit", -1, ""}};
    for (const auto& entry : cases) {
        SCOPED_TRACE(entry.task);
        Outcome outcome;
        ASSERT_EQ(0, Request(entry.task).send(outcome));
        EXPECT_EQ(0, outcome.replies);
        ASSERT_TRUE(waitForReply(outcome));
        EXPECT_EQ(entry.result, outcome.result);
        EXPECT_EQ(entry.path, outcome.path);
        support::runFor(0.05);
        EXPECT_EQ(1, outcome.replies);
    }
    EXPECT_NE(std::string::npos, notes().find("first clone\nreply 0\nreply -4")) << notes();
}

TEST_P(SpawnTest, MissingProgramsAndApplicationsAreErrorsAtOnce)
{
    writeEntry("org.example.missing", "Exec=/nonexistent/program");
    writeEntry("org.example.empty", "Name=Nothing");
    Outcome outcome;
    EXPECT_EQ(APP_CONTROL_ERROR_LAUNCH_FAILED, Request("reply", "org.example.missing").send(outcome));
    for (const char* id : {"org.example.empty", "org.example.unknown", "../../etc/passwd", "org/example"})
        EXPECT_EQ(APP_CONTROL_ERROR_APP_NOT_FOUND, Request("reply", id).send(outcome)) << id;
    app_control_h empty = nullptr;
    app_control_create(&empty);
    EXPECT_EQ(APP_CONTROL_ERROR_INVALID_PARAMETER, app_control_send_launch_request(empty, replyCb, &outcome));
    app_control_destroy(empty);
    support::runFor(0.05);
    EXPECT_EQ(0, outcome.replies);
}

TEST_P(SpawnTest, TerminateEndsThePendingLaunchAndReportsStart)
{
    Outcome outcome;
    Request request("keep");
    app_control_enable_app_started_result_event(request.handle());
    ASSERT_EQ(0, request.send(outcome));
    ASSERT_TRUE(waitForNote("resume"));
    EXPECT_EQ(1, outcome.started);
    EXPECT_EQ(0, outcome.replies);
    ASSERT_EQ(0, app_control_send_terminate_request(request.handle()));
    ASSERT_TRUE(waitForReply(outcome));
    EXPECT_EQ(-1, outcome.result);
    ASSERT_TRUE(waitForNote("end"));
    EXPECT_EQ("create\nfirst keep\nresume\npause\nterminate\nend\n", notes());
    EXPECT_EQ(APP_CONTROL_ERROR_APP_NOT_FOUND, app_control_send_terminate_request(request.handle()));
}

TEST_P(SpawnTest, RequestsFromAWorkerReplyOnTheMainLoop)
{
    Outcome good;
    Outcome bad;
    std::atomic<int> codes{99};
    std::thread worker(
        [&] { codes = Request("reply").send(good) + Request("reply", "org.example.unknown").send(bad); });
    EXPECT_TRUE(waitForReply(good));
    EXPECT_TRUE(waitForReply(bad));
    worker.join();
    EXPECT_EQ(0, codes);
    EXPECT_EQ(0, good.result);
    EXPECT_EQ(-1, bad.result);
}

TEST_P(SpawnTest, ADeadCallerEndsTheTargetAsIfItsWindowWereClosed)
{
    ::setenv("PEER_CALLS", "keep", 1);
    ::setenv("PEER_ID", "org.example.caller", 1);
    Program caller({PEER_PROGRAM});
    ASSERT_TRUE(waitForNote("first keep\nresume"));
    caller.signal(SIGKILL);
    ASSERT_TRUE(waitForNote("end"));
    EXPECT_TRUE(notes().ends_with("first keep\nresume\npause\nterminate\nend\n")) << notes();
}

TEST_F(LaunchTest, ExitStatusAndPlainProgramsAnswerAsTheirEntriesSay)
{
    writeEntry("org.example.good", "Reply=exit\nExec=sh -c 'exit 0'");
    writeEntry("org.example.bad", "Reply=exit\nExec=sh -c 'exit 3'");
    writeEntry("org.example.long", "Reply=exit\nExec=sleep 100");
    writeEntry("org.example.plain", "Reply=none\nOperations=org.example/open;\nExec=touch %f");
    Outcome good;
    Outcome bad;
    Outcome ended;
    EXPECT_EQ(0, Request("", "org.example.good").send(good));
    EXPECT_EQ(0, Request("", "org.example.bad").send(bad));
    Request endless("", "org.example.long");
    EXPECT_EQ(0, endless.send(ended));
    EXPECT_TRUE(waitForReply(good) && waitForReply(bad));
    EXPECT_EQ(0, good.result);
    EXPECT_EQ(-1, bad.result);
    EXPECT_EQ(0, app_control_send_terminate_request(endless.handle()));
    EXPECT_TRUE(waitForReply(ended));
    EXPECT_EQ(-1, ended.result);

    Outcome plain; // by operation, without an id
    Request open("", "");
    app_control_set_operation(open.handle(), "org.example/open");
    const std::string made = _directory.file("made; touch here");
    app_control_add_extra_data(open.handle(), APP_CONTROL_DATA_PATH, made.c_str());
    EXPECT_EQ(0, open.send(plain));
    EXPECT_TRUE(runUntil([&] { return plain.started == 1 && std::filesystem::exists(made); }, 30));
    EXPECT_EQ(0, plain.replies);
}

TEST_F(LaunchTest, RunningTargetGetsLaterRequestsOverTheBus)
{
    const PrivateBus bus;
    Program peer({PEER_PROGRAM});
    ASSERT_TRUE(bus.waitForName(PEER_BUS_NAME));
    ASSERT_TRUE(waitForNote("resume"));
    Request single("stay");
    app_control_set_launch_mode(single.handle(), APP_CONTROL_LAUNCH_MODE_SINGLE);
    Outcome outcome;
    ASSERT_EQ(0, single.send(outcome));
    ASSERT_TRUE(waitForReply(outcome));
    EXPECT_EQ(0, outcome.result);
    ASSERT_TRUE(waitForNote("reply 0")); // the reply may be here before the peer has noted that it was sent
    EXPECT_EQ("create\nfirst \nresume\nagain stay\nreply 0\n", notes());

    Outcome killed;
    Request keep("keep");
    app_control_set_launch_mode(keep.handle(), APP_CONTROL_LAUNCH_MODE_SINGLE);
    ASSERT_EQ(0, keep.send(killed));
    ASSERT_TRUE(waitForNote("again keep"));
    peer.signal(SIGKILL);
    ASSERT_TRUE(waitForReply(killed));
    EXPECT_EQ(-1, killed.result);
}

TEST_F(LaunchTest, SecondOrdinaryStartHandsOverAndEndsAtOnce)
{
    const PrivateBus bus;
    Program first({PEER_PROGRAM});
    ASSERT_TRUE(waitForNote("resume"));
    Program second({PEER_PROGRAM, "--mime", "audio/AMR"});
    EXPECT_EQ(0, second.wait());
    ASSERT_TRUE(waitForNote("again"));
    EXPECT_TRUE(first.isRunning());
    EXPECT_EQ(0U, notes().find("create\nfirst \nresume\n")) << notes();
    first.signal(SIGTERM);
    EXPECT_EQ(0, first.wait());
    EXPECT_NE(std::string::npos, notes().find("pause\nterminate\nend\n"));
}

TEST_F(LaunchTest, WithoutABusTwoInstancesRunAndBadWordsAreRefused)
{
    Program first({PEER_PROGRAM});
    Program second({PEER_PROGRAM});
    ASSERT_TRUE(runUntil(
        [&] {
            const std::string text = notes();
            return text.find("resume") != text.rfind("resume");
        },
        30));
    EXPECT_TRUE(first.isRunning() && second.isRunning());
    EXPECT_EQ(2, Program({PEER_PROGRAM, "--nonsense"}).wait());
    EXPECT_EQ(2, Program({PEER_PROGRAM, "--app-control-fd=0x"}).wait());
    EXPECT_EQ(2, Program({PEER_PROGRAM, "--app-control-fd=99"}).wait());
    EXPECT_EQ(0, Program({PEER_PROGRAM, "--help"}).wait());
}

TEST_F(LaunchTest, ActivatedProgramWaitsForItsRequest)
{
    const PrivateBus bus;
    Program peer({PEER_PROGRAM, "--bus-activated"});
    ASSERT_TRUE(waitForNote("create"));
    const std::string output = _directory.file("busctl");
    Program caller({"busctl", "--address=" + bus.address(), "call", PEER_BUS_NAME, "/com/tovanic/AppControl",
                       "com.tovanic.AppControl1", "Launch", "a{sas}", "1", "do", "1", "reply"},
        output);
    EXPECT_EQ(0, caller.wait());
    EXPECT_EQ("ia{sas} 0 1 \"path\" 1 \"/tmp/one.m4a\"\n", support::readFile(output));
    EXPECT_EQ(0, peer.wait());
    EXPECT_EQ("create\nfirst reply\nreply 0\nterminate\nend\n", notes());
}

TEST_F(LaunchTest, ABundleOfManyNamesIsMadeInNoTime)
{
    constexpr int MANY = 50000;
    bundle* many = bundle_create();
    const auto begin = std::chrono::steady_clock::now();
    for (int round = 0; round < 2; ++round)
        for (int i = 0; i < MANY; ++i)
            ASSERT_EQ(0, bundle_add_str(many, std::to_string(i).c_str(), round == 0 ? "old" : "new"));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2));
    EXPECT_STREQ("new", bundle_get_str(many, "49999"));
    EXPECT_EQ(nullptr, bundle_get_str(many, "50000"));
    bundle_free(many);
}

TEST_F(LaunchTest, MessagePortsDeliverAndAreMissedFromAnyThread)
{
    const PrivateBus bus;
    ::setenv("PEER_PORT", "mewlo_indicator_port", 1);
    Program peer({PEER_PROGRAM});
    ASSERT_TRUE(waitForNote("resume"));
    bundle* message = bundle_create();
    bundle_add_str(message, "mewlo_indicator_data", "recording");
    EXPECT_EQ(0, message_port_check_remote_port(PEER, "mewlo_indicator_port"));
    EXPECT_EQ(MESSAGE_PORT_ERROR_PORT_NOT_FOUND, message_port_check_remote_port(PEER, "other_port"));
    EXPECT_EQ(MESSAGE_PORT_ERROR_PORT_NOT_FOUND, message_port_send_message("com.tovanic.indicator", "x", message));
    EXPECT_EQ(0, message_port_send_message(PEER, "mewlo_indicator_port", message));
    ASSERT_TRUE(waitForNote("message recording"));
    bundle_add_str(message, "mewlo_indicator_data", "paused");
    std::atomic<int> code{99};
    std::thread worker([&] { code = message_port_send_message(PEER, "mewlo_indicator_port", message); });
    EXPECT_TRUE(waitForNote("message paused"));
    worker.join();
    EXPECT_EQ(0, code);
    bundle_free(message);
}

TEST_F(LaunchTest, ABusThatDiesNeitherEndsNorBlocksTheProgram)
{
    PrivateBus bus;
    Program peer({PEER_PROGRAM});
    ASSERT_TRUE(waitForNote("resume"));
    ASSERT_NE(nullptr, host::sessionBus());
    bus.stop();
    EXPECT_TRUE(runUntil([] { return host::sessionBus() == nullptr; }));
    Outcome outcome; // a new program is still reachable
    ASSERT_EQ(0, Request("reply").send(outcome));
    ASSERT_TRUE(waitForReply(outcome));
    EXPECT_EQ(0, outcome.result);
    EXPECT_TRUE(peer.isRunning());
    const std::string stat = support::readFile("/proc/" + std::to_string(peer.id()) + "/stat");
    EXPECT_NE(std::string::npos, stat.find(") S ")) << "it spins: " << stat;
}

TEST_F(LaunchTest, LifecycleFollowsWindowAndLock)
{
    ::setenv("PEER_TOOLKIT", "1", 1);
    ::setenv("ELM_ENGINE", "buffer", 1);
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 1);
    Program peer({PEER_PROGRAM});
    ASSERT_TRUE(waitForNote("first"));
    support::runFor(0.1);
    EXPECT_EQ("create\nfirst \n", notes()); // locked: not resumed
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 0);
    ASSERT_TRUE(waitForNote("resume"));
    vconf_set_int(VCONFKEY_IDLE_LOCK_STATE, 1);
    ASSERT_TRUE(waitForNote("pause"));
    peer.signal(SIGINT);
    EXPECT_EQ(0, peer.wait());
    EXPECT_EQ("create\nfirst \nresume\npause\nterminate\nend\n", notes()); // paused already: no second pause
}

TEST_F(LaunchTest, ARefusedCreateEndsWithoutTerminate)
{
    ::setenv("PEER_REFUSES", "1", 1);
    EXPECT_EQ(1, Program({PEER_PROGRAM}).wait());
    EXPECT_EQ("create\nend\n", notes());
}

}
