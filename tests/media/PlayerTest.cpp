#include "RecorderFixture.h"

#include "support/Amr.h"

#include <player.h>
#include <vconf.h>

#include <chrono>
#include <cmath>
#include <csignal>
#include <utility>

using support::runFor;
using support::runUntil;

namespace {

// Much less than a sound server or a decoder may hang, and enough for a slow machine.
constexpr auto SOON = std::chrono::milliseconds(500);

// A player that notes what it tells.
class PlayerHandle {
public:
    PlayerHandle()
    {
        EXPECT_EQ(0, player_create(&handle));
        player_set_completed_cb(
            handle, [](void* data) { ++static_cast<PlayerHandle*>(data)->completed; }, this);
        player_set_interrupted_cb(
            handle,
            [](player_interrupted_code_e code, void* data) {
                auto* self = static_cast<PlayerHandle*>(data);
                self->interruptions.push_back(code);
                self->stateWhenInterrupted = self->state();
            },
            this);
        player_set_error_cb(
            handle, [](int, void* data) { ++static_cast<PlayerHandle*>(data)->errors; }, this);
    }
    ~PlayerHandle() { destroy(); }
    PlayerHandle(const PlayerHandle&) = delete;
    PlayerHandle& operator=(const PlayerHandle&) = delete;

    void destroy()
    {
        if (handle != nullptr)
            player_destroy(std::exchange(handle, nullptr));
    }
    int open(const std::string& path) const
    {
        const int error = player_set_uri(handle, path.c_str());
        return error != 0 ? error : player_prepare(handle);
    }
    int play(const std::string& path) const
    {
        const int error = open(path);
        return error != 0 ? error : player_start(handle);
    }
    int seek(int position)
    {
        return player_set_play_position(
            handle, position, false, [](void* data) { ++static_cast<PlayerHandle*>(data)->seeksDone; }, this);
    }
    [[nodiscard]] player_state_e state() const
    {
        player_state_e state = PLAYER_STATE_NONE;
        player_get_state(handle, &state);
        return state;
    }
    [[nodiscard]] int position() const
    {
        int position = -1;
        player_get_play_position(handle, &position);
        return position;
    }

    player_h handle = nullptr;
    int completed = 0;
    int errors = 0;
    int seeksDone = 0;
    std::vector<player_interrupted_code_e> interruptions;
    player_state_e stateWhenInterrupted = PLAYER_STATE_NONE;
};

}

class PlayerTest : public testing::Test {
protected:
    ~PlayerTest() override { runFor(0.02); }

    std::string recording(int seconds, bool isAmr)
    {
        const std::string path = directory.file(std::to_string(seconds) + (isAmr ? ".amr" : ".m4a"));
        if (!std::filesystem::exists(path))
            makeRecording(path, seconds, isAmr);
        return path;
    }

    // At once, or a little later on a slow machine.
    static bool isRefused(PlayerHandle& player, const std::string& path, int error)
    {
        const int errors = player.errors;
        const size_t interruptions = player.interruptions.size();
        const int result = player.open(path);
        if (result != 0)
            return result == error && player.state() == PLAYER_STATE_IDLE;
        const bool isTold
            = runUntil([&] { return player.errors > errors || player.interruptions.size() > interruptions; });
        (void)player_unprepare(player.handle);
        return isTold;
    }

    support::PulseServer server;
    support::TempDir directory;
};

TEST_F(PlayerTest, PlaysOurFormatsToTheEnd)
{
    for (const bool isAmr : {false, true}) {
        SCOPED_TRACE(isAmr);
        PlayerHandle player;
        ASSERT_EQ(0, player.open(recording(1, isAmr)));
        EXPECT_EQ(PLAYER_STATE_READY, player.state());
        int duration = 0;
        ASSERT_EQ(0, player_get_duration(player.handle, &duration));
        EXPECT_NEAR(1000, duration, 70);
        ASSERT_EQ(0, player_start(player.handle));
        const auto begin = std::chrono::steady_clock::now();
        int last = 0;
        EXPECT_TRUE(runUntil([&] {
            EXPECT_GE(player.position(), last) << "the position never goes back";
            last = player.position();
            return player.completed > 0;
        }));
        EXPECT_GE(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(800));
        EXPECT_GE(last, 800);
        EXPECT_EQ(0, player_stop(player.handle));
        EXPECT_EQ(0, player_unprepare(player.handle));
        EXPECT_EQ(PLAYER_STATE_IDLE, player.state());
        EXPECT_EQ(1, player.completed);
    }
}

TEST_F(PlayerTest, PausesResumesAndStops)
{
    PlayerHandle player;
    EXPECT_EQ(PLAYER_ERROR_INVALID_STATE, player_start(player.handle));
    EXPECT_EQ(PLAYER_ERROR_INVALID_STATE, player_stop(player.handle));
    ASSERT_EQ(0, player.play(recording(20, false)));
    EXPECT_EQ(PLAYER_ERROR_INVALID_STATE, player_start(player.handle));
    EXPECT_TRUE(runUntil([&] { return player.position() > 200; }));
    ASSERT_EQ(0, player_pause(player.handle));
    EXPECT_EQ(PLAYER_ERROR_INVALID_STATE, player_pause(player.handle));
    const int held = player.position();
    runFor(0.2);
    EXPECT_NEAR(held, player.position(), 30);
    ASSERT_EQ(0, player_start(player.handle));
    EXPECT_TRUE(runUntil([&] { return player.position() > held + 100; }));
    ASSERT_EQ(0, player_stop(player.handle));
    EXPECT_EQ(0, player.position());
    ASSERT_EQ(0, player_start(player.handle)) << "from the beginning again";
    EXPECT_TRUE(runUntil([&] { return player.position() > 100; }));
    EXPECT_LT(player.position(), held + 100);
}

TEST_F(PlayerTest, AnswersABurstOfSeeksOnce)
{
    for (const bool isAmr : {false, true}) {
        SCOPED_TRACE(isAmr);
        PlayerHandle player;
        ASSERT_EQ(0, player.play(recording(20, isAmr)));
        EXPECT_TRUE(runUntil([&] { return player.position() > 100; }));
        for (int i = 1; i <= 20; ++i) {
            ASSERT_EQ(0, player.seek(i * 500));
            EXPECT_EQ(i * 500, player.position()) << "the target, while it is on its way";
        }
        EXPECT_TRUE(runUntil([&] { return player.seeksDone > 0; }));
        EXPECT_TRUE(runUntil([&] { return player.position() > 10100; }));
        EXPECT_EQ(1, player.seeksDone);

        ASSERT_EQ(0, player_pause(player.handle));
        ASSERT_EQ(0, player.seek(5000));
        EXPECT_TRUE(runUntil([&] { return player.seeksDone == 2; }));
        EXPECT_NEAR(5000, player.position(), 25);
        EXPECT_EQ(PLAYER_ERROR_INVALID_PARAMETER, player.seek(-1));
        ASSERT_EQ(0, player.seek(3600000));
        int end = 0;
        player_get_duration(player.handle, &end);
        EXPECT_EQ(end, player.position());
        ASSERT_EQ(0, player_start(player.handle));
        EXPECT_TRUE(runUntil([&] { return player.completed == 1; }));
        EXPECT_EQ(3, player.seeksDone);
    }
}

TEST_F(PlayerTest, RefusesWhatItCannotPlay)
{
    const std::string good = support::readFile(recording(1, false));
    support::writeFile(directory.file("empty.m4a"), "");
    support::writeFile(directory.file("text.m4a"), "this is not sound");
    support::writeFile(directory.file("cut.m4a"), good.substr(0, good.size() / 2));
    support::writeFile(directory.file("head.amr"), "#!AMR\n");
    PlayerHandle player;
    EXPECT_EQ(PLAYER_ERROR_NO_SUCH_FILE, player.open(directory.file("missing.m4a")));
    for (const char* name : {"empty.m4a", "text.m4a", "cut.m4a", "head.amr"}) {
        SCOPED_TRACE(name);
        EXPECT_TRUE(isRefused(player, directory.file(name), PLAYER_ERROR_NOT_SUPPORTED_FILE));
    }
    EXPECT_EQ(0, player.play(recording(1, false))) << "the same player takes a good file";
    EXPECT_TRUE(runUntil([&] { return player.completed == 1; }));
    server.kill();
    PlayerHandle silent;
    EXPECT_TRUE(isRefused(silent, recording(1, false), PLAYER_ERROR_CONNECTION_FAILED));
}

// The first of these files once aborted the program, the second one held it for seconds.
TEST_F(PlayerTest, DamagedFilesAbortNothingAndHoldNobody)
{
    for (const char* name : {"aborts.amr", "stalls.amr"}) {
        for (int i = 0; i < (std::string(name) == "aborts.amr" ? 60 : 3); ++i) {
            SCOPED_TRACE(i);
            PlayerHandle player;
            const auto begin = std::chrono::steady_clock::now();
            const int error = player.play(std::string(MEWLO_TEST_DATA "/") + name);
            EXPECT_LT(std::chrono::steady_clock::now() - begin, SOON);
            runFor(i % 2 == 0 ? 0 : 0.02);
            if (error == 0 && i == 0) {
                EXPECT_TRUE(runUntil([&] { return player.errors + player.completed > 0; }));
            }
            const auto end = std::chrono::steady_clock::now();
            player.destroy();
            EXPECT_LT(std::chrono::steady_clock::now() - end, SOON);
        }
    }
    PlayerHandle good;
    EXPECT_EQ(0, good.play(recording(1, false)));
    EXPECT_TRUE(runUntil([&] { return good.completed == 1; }));
}

TEST_F(PlayerTest, AHangingSoundServerHoldsNobody)
{
    const std::string file = recording(20, false);
    for (const bool isPlaying : {false, true}) {
        SCOPED_TRACE(isPlaying);
        PlayerHandle player;
        if (isPlaying) {
            ASSERT_EQ(0, player.play(file));
            EXPECT_TRUE(runUntil([&] { return player.position() > 100; }));
        }
        server.signal(SIGSTOP);
        const auto begin = std::chrono::steady_clock::now();
        (void)(isPlaying ? player_pause(player.handle) : player.play(file));
        (void)player.position();
        player.destroy();
        EXPECT_LT(std::chrono::steady_clock::now() - begin, 2 * SOON);
        server.signal(SIGCONT);
    }
    PlayerHandle later;
    EXPECT_TRUE(runUntil([&] { return later.play(file) == 0; }));
    EXPECT_TRUE(runUntil([&] { return later.position() > 100; }));
}

TEST_F(PlayerTest, PlaysFilesOfOthers)
{
    const std::string sine = "ffmpeg -v error -f lavfi -i sine=d=1 -c:a aac ";
    (void)support::outputOf(sine + "-f adts " + directory.file("frames.m4a"));
    (void)support::outputOf(sine + "-f mp3 -c:a libmp3lame " + directory.file("other.m4a"));
    (void)support::outputOf(sine + "-movflags frag_keyframe+empty_moov " + directory.file("fragments.m4a"));
    support::writeFile(directory.file("tail.m4a"), support::readFile(recording(1, false)) + "and more");
    support::writeFile(directory.file("wide.amr"), support::wideAmr(50));
    for (const char* name : {"frames.m4a", "other.m4a", "fragments.m4a", "tail.m4a", "wide.amr"}) {
        SCOPED_TRACE(name);
        PlayerHandle player;
        ASSERT_EQ(0, player.play(directory.file(name)));
        int duration = -1;
        EXPECT_EQ(0, player_get_duration(player.handle, &duration)) << "unknown is no failure";
        EXPECT_TRUE(runUntil([&] { return player.completed + player.errors > 0; }));
        EXPECT_EQ(1, player.completed);
    }
}

TEST_F(PlayerTest, StepsOverADamagedStretch)
{
    std::string content = support::readFile(recording(1, false));
    content.replace(content.size() / 2, 3000, std::string(3000, '\xA5'));
    support::writeFile(directory.file("damaged.m4a"), content);
    PlayerHandle player;
    ASSERT_EQ(0, player.play(directory.file("damaged.m4a")));
    EXPECT_TRUE(runUntil([&] { return player.completed + player.errors > 0; }));
    EXPECT_EQ(1, player.completed);
}

TEST_F(PlayerTest, PausesForCallsAlarmsAndNotifications)
{
    support::writeTone(directory.file("ring.wav"), 20, 0.2);
    PlayerHandle player;
    ASSERT_EQ(0, player.play(recording(20, false)));
    for (const auto& [role, code] : {std::pair{"phone", PLAYER_INTERRUPTED_BY_CALL},
             {"alarm", PLAYER_INTERRUPTED_BY_ALARM}, {"notification", PLAYER_INTERRUPTED_BY_NOTIFICATION}}) {
        SCOPED_TRACE(role);
        player.interruptions.clear();
        {
            const auto ring = server.playAs(role, directory.file("ring.wav"));
            ASSERT_TRUE(runUntil([&] { return !player.interruptions.empty(); }));
            EXPECT_EQ(std::vector{code}, player.interruptions);
            EXPECT_EQ(PLAYER_STATE_PAUSED, player.stateWhenInterrupted);
        }
        EXPECT_TRUE(runUntil([&] { return player.interruptions.size() == 2; }));
        EXPECT_EQ(PLAYER_INTERRUPTED_COMPLETED, player.interruptions.back());
        ASSERT_EQ(0, player_start(player.handle));
        runFor(0.05);
    }
}

// Whoever knows of a call, a stream or the modem, pauses once; the sound server need not ask for it.
TEST_F(PlayerTest, PausesForCallsThatNobodyAsksItToPauseFor)
{
    server.unload("module-role-cork");
    support::writeTone(directory.file("ring.wav"), 20, 0.2);
    PlayerHandle player;
    ASSERT_EQ(0, player.play(recording(20, false)));
    const auto expectPause = [&](player_interrupted_code_e code) {
        EXPECT_TRUE(runUntil([&] { return !player.interruptions.empty(); }));
        EXPECT_EQ(std::vector{code}, player.interruptions);
        EXPECT_EQ(PLAYER_STATE_PAUSED, player.stateWhenInterrupted);
    };
    const auto expectEnd = [&] {
        EXPECT_TRUE(runUntil([&] { return player.interruptions.size() == 2; }));
        EXPECT_EQ(PLAYER_INTERRUPTED_COMPLETED, player.interruptions.back());
        player.interruptions.clear();
        EXPECT_EQ(0, player_start(player.handle));
    };
    for (const auto& [role, code] :
        {std::pair{"phone", PLAYER_INTERRUPTED_BY_CALL}, {"alarm", PLAYER_INTERRUPTED_BY_ALARM}}) {
        SCOPED_TRACE(role);
        {
            const auto ring = server.playAs(role, directory.file("ring.wav"));
            expectPause(code);
        }
        expectEnd();
    }
    vconf_set_int("memory/telephony/call_status", 1);
    expectPause(PLAYER_INTERRUPTED_BY_CALL);
    vconf_set_int("memory/telephony/call_status", 0);
    expectEnd();
}

TEST_F(PlayerTest, PausesWhenTheHeadsetIsUnplugged)
{
    const std::string headset
        = server.load("module-null-sink sink_name=headset norewinds=1 sink_properties=device.form_factor=headphone");
    ASSERT_FALSE(headset.empty());
    PlayerHandle player;
    (void)server.control("set-default-sink headset");
    ASSERT_EQ(0, player.play(recording(20, false)));
    EXPECT_TRUE(runUntil([&] { return player.position() > 200; }));
    EXPECT_TRUE(player.interruptions.empty());
    (void)server.control("set-default-sink spk");
    ASSERT_TRUE(runUntil([&] { return !player.interruptions.empty(); }));
    EXPECT_EQ(std::vector{PLAYER_INTERRUPTED_BY_EARJACK_UNPLUG}, player.interruptions);
    EXPECT_EQ(PLAYER_STATE_PAUSED, player.stateWhenInterrupted);
    EXPECT_EQ(0, player_start(player.handle)) << "goes on through the loudspeaker when asked to";
}

TEST_F(PlayerTest, ReportsALostLoudspeakerAndMayBeDestroyedThen)
{
    PlayerHandle player;
    ASSERT_EQ(0, player.play(recording(20, false)));
    static PlayerHandle* toDestroy = &player;
    toDestroy = &player;
    static bool isTold = false;
    isTold = false;
    player_set_interrupted_cb(
        player.handle,
        [](player_interrupted_code_e code, void*) {
            isTold = code == PLAYER_INTERRUPTED_BY_RESOURCE_CONFLICT && toDestroy->state() != PLAYER_STATE_PAUSED;
            toDestroy->destroy();
        },
        nullptr);
    EXPECT_TRUE(runUntil([&] { return player.position() > 200; }));
    server.kill();
    EXPECT_TRUE(runUntil([] { return isTold; }));
    EXPECT_EQ(nullptr, player.handle);
}
