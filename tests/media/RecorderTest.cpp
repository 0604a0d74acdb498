#include "RecorderFixture.h"

#include <preference.h>
#include <vconf.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <functional>
#include <thread>

using support::runFor;
using support::runUntil;

namespace {

constexpr size_t WINDOW = 2048;

double correlation(const short* a, const short* b, size_t count)
{
    double ab = 0, aa = 0, bb = 0;
    for (size_t i = 0; i < count; ++i) {
        ab += a[i] * static_cast<double>(b[i]);
        aa += a[i] * static_cast<double>(a[i]);
        bb += b[i] * static_cast<double>(b[i]);
    }
    return aa > 0 && bb > 0 ? ab / std::sqrt(aa * bb) : 0;
}

// Where in the played noise a window of the recording comes from; -1 when nowhere near.
long placeOf(const short* window, size_t count, const std::vector<short>& played, long from, long to)
{
    double best = 0.5;
    long place = -1;
    const long end = std::min(to, static_cast<long>(played.size() - count));
    for (long i = std::max(0L, from); i <= end; ++i)
        if (const double likeness = correlation(window, &played[static_cast<size_t>(i)], count); likeness > best) {
            best = likeness;
            place = i;
        }
    return place;
}

}

TEST_F(RecorderTest, KeepsItsTimeLineToTheSampleOverManyPauses)
{
    support::writeNoise(directory.file("noise.wav"), 30);
    const auto voice = server.speak(directory.file("noise.wav"));
    RecorderHandle recorder(temporary);
    ASSERT_EQ(0, recorder.prepareAndStart());
    for (unsigned i = 1; i <= 20; ++i) {
        ASSERT_TRUE(recorder.recordUntil(i * 60));
        ASSERT_EQ(0, recorder_pause(recorder.handle));
        EXPECT_EQ(RECORDER_STATE_PAUSED, recorder.state());
        runFor(0.03);
        ASSERT_EQ(0, recorder_start(recorder.handle));
    }
    ASSERT_TRUE(recorder.recordUntil(1500));
    ASSERT_EQ(0, recorder_commit(recorder.handle));
    const auto elapsed = static_cast<double>(recorder.told.elapsed.back());
    const double duration = probedDuration(temporary);
    EXPECT_GE(duration, elapsed);
    EXPECT_LE(duration, elapsed + 100); // what the encoder works ahead, and the last status
    EXPECT_TRUE(decodesCleanly(temporary));
    EXPECT_EQ(0u, recorder.told.elapsed.front());
}

// Compares recordings with the noise that was played while they ran. A loaded machine may tear the played noise itself,
// so that a comparison has three attempts; a recorder that loses sound fails them all.
class NoiseTest : public RecorderTest {
protected:
    static constexpr int ATTEMPTS = 3;

    void record(const std::function<void(RecorderHandle&)>& session)
    {
        support::writeNoise(directory.file("noise.wav"), 8);
        const auto voice = server.speak(directory.file("noise.wav"));
        RecorderHandle recorder(temporary);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(1000));
        session(recorder);
        ASSERT_EQ(0, recorder_commit(recorder.handle));
        EXPECT_EQ(RECORDER_STATE_READY, recorder.state());
        _played = support::decode(directory.file("noise.wav"));
        _recorded = support::decode(temporary);
    }
    // How far the played noise is ahead of the recording there.
    long lineAt(size_t at) const
    {
        return at + WINDOW <= _recorded.size()
            ? placeOf(&_recorded[at], WINDOW / 8, _played, 0, 150000) - static_cast<long>(at)
            : -1;
    }
    bool isOnLine(size_t at, long line) const
    {
        const long expected = static_cast<long>(at) + line;
        return at + WINDOW <= _recorded.size()
            && placeOf(&_recorded[at], WINDOW, _played, expected - 50, expected + 50) == expected;
    }

private:
    std::vector<short> _played;
    std::vector<short> _recorded;
};

TEST_F(NoiseTest, JoinsAPauseWithoutGapOrRepetition)
{
    bool isExact = false;
    for (int attempt = 0; attempt < ATTEMPTS && !isExact; ++attempt) {
        size_t joint = 0;
        ASSERT_NO_FATAL_FAILURE(record([&](RecorderHandle& recorder) {
            ASSERT_EQ(0, recorder_pause(recorder.handle));
            joint = recorder.told.elapsed.back() * 441 / 10;
            runFor(0.7);
            ASSERT_EQ(0, recorder_start(recorder.handle));
            ASSERT_TRUE(recorder.recordUntil(2000));
        }));
        const long before = lineAt(30000);
        const long after = lineAt(70000);
        // One jump of the length of the pause; both halves on their own line, close up to the joint.
        isExact = std::abs(static_cast<double>(after - before) - 0.7 * 44100) < 0.15 * 44100
            && isOnLine(joint - WINDOW, before) && isOnLine(joint + 6000, after);
    }
    EXPECT_TRUE(isExact);
}

TEST_F(NoiseTest, CommittedFileHasEverythingUpToTheStop)
{
    bool isExact = false;
    for (int attempt = 0; attempt < ATTEMPTS && !isExact; ++attempt) {
        size_t end = 0;
        ASSERT_NO_FATAL_FAILURE(record([&](RecorderHandle& recorder) {
            ASSERT_EQ(0, recorder_pause(recorder.handle)); // the commit comes while paused
            runFor(0.05);
            end = recorder.told.elapsed.back() * 441 / 10;
        }));
        // Its very last part is there.
        isExact = isOnLine(end - WINDOW, lineAt(20000));
    }
    EXPECT_TRUE(isExact);
}

TEST_F(NoiseTest, IsHeardFromTheFirstSampleToTheLast)
{
    double elapsed = 0;
    ASSERT_NO_FATAL_FAILURE(record([&](RecorderHandle& recorder) {
        ASSERT_EQ(0, recorder_pause(recorder.handle));
        runFor(0.05);
        elapsed = static_cast<double>(recorder.told.elapsed.back());
    }));
    constexpr double FRAME = 1024;
    const std::vector<short> played = heard(temporary);
    EXPECT_NEAR(elapsed * 44.1, static_cast<double>(played.size()), FRAME);
    ASSERT_GT(played.size(), 20000 + WINDOW);
    EXPECT_EQ(20000, placeOf(&played[20000], WINDOW, support::decode(temporary), 19000, 21000));
}

TEST_F(RecorderTest, MeasuresTheInputLevel)
{
    support::writeTone(directory.file("tone.wav"), 10, 0.1);
    const auto voice = server.speak(directory.file("tone.wav"));
    RecorderHandle recorder(temporary);
    ASSERT_EQ(0, recorder.prepareAndStart());
    ASSERT_TRUE(recorder.recordUntil(1000));
    double level = 0;
    ASSERT_EQ(0, recorder_get_audio_level(recorder.handle, &level));
    EXPECT_NEAR(-20, level, 1);
    // Callbacks come every 20 ms.
    EXPECT_GE(recorder.told.elapsed.size(), 20u);
    EXPECT_EQ(0, recorder_cancel(recorder.handle));
    EXPECT_EQ(std::vector<std::string>{"tone.wav"}, filesIn(directory.path()));
    EXPECT_EQ(RECORDER_STATE_READY, recorder.state());
    EXPECT_EQ(0, recorder_unprepare(recorder.handle));
    EXPECT_EQ(RECORDER_STATE_CREATED, recorder.state());
}

TEST_F(RecorderTest, PausedRecorderLeavesTheMicrophoneToOthers)
{
    bool inRecording = true;
    RecorderHandle recorder(temporary);
    ASSERT_EQ(0, recorder.prepareAndStart());
    EXPECT_EQ(0, recorder_is_in_recording(0, &inRecording));
    EXPECT_FALSE(inRecording) << "our own recording does not count";
    ASSERT_EQ(0, recorder_pause(recorder.handle));
    EXPECT_TRUE(
        runUntil([&] { return server.control("list source-outputs").find("Corked: yes") != std::string::npos; }));
    {
        const auto other = server.recordElsewhere();
        EXPECT_TRUE(runUntil([&] { return recorder_is_in_recording(0, &inRecording) == 0 && inRecording; }));
        EXPECT_EQ(0, recorder_is_in_recording(1, &inRecording));
        EXPECT_FALSE(inRecording);
    }
    EXPECT_TRUE(runUntil([&] { return recorder_is_in_recording(0, &inRecording) == 0 && !inRecording; }));
    EXPECT_EQ(0, recorder_commit(recorder.handle));
}

TEST_F(RecorderTest, OnlyARecorderIsAnotherRecorder)
{
    const struct {
        std::vector<std::string> properties;
        bool isRecorder;
    } others[] = {{{}, true}, {{"application.process.binary=browser"}, false},
        {{"application.process.binary=browser", "media.role=production"}, true}, {{"resample.peaks=true"}, false}};
    for (const auto& other : others) {
        std::vector<std::string> command{"parecord", "--device=micsrc", "--raw"};
        for (const std::string& property : other.properties)
            command.push_back("--property=" + property);
        command.emplace_back("/dev/null");
        SCOPED_TRACE(command[command.size() - 2]);
        const support::Program program(command);
        ASSERT_TRUE(runUntil([&] { return !server.control("list short source-outputs").empty(); }));
        const auto answer = [] {
            bool isRecording = false;
            (void)recorder_is_in_recording(0, &isRecording);
            return isRecording;
        };
        if (other.isRecorder) {
            EXPECT_TRUE(runUntil(answer));
        } else {
            runFor(0.2);
            EXPECT_FALSE(answer());
        }
        // The old rule, by choice: whoever listens; but a level meter never.
        preference_set_boolean(PREFERENCE_STRICT_RECORDERS, true);
        EXPECT_EQ(other.properties != std::vector<std::string>{"resample.peaks=true"}, answer());
        preference_set_boolean(PREFERENCE_STRICT_RECORDERS, false);
    }
    vconf_set_int("memory/telephony/call_status", 1);
    RecorderHandle recorder(temporary);
    EXPECT_EQ(RECORDER_ERROR_SOUND_POLICY_BY_CALL, recorder.prepareAndStart()) << "a call that the modem knows of";
    vconf_set_int("memory/telephony/call_status", 0);
    EXPECT_EQ(0, recorder.prepareAndStart());
}

TEST_F(RecorderTest, OperationsWorkOnAThreadWhileTheMainLoopWaits)
{
    RecorderHandle recorder(temporary);
    int error = -1;
    std::thread([&] {
        error = recorder.prepareAndStart();
        std::this_thread::sleep_for(std::chrono::milliseconds(300));
        error = error != 0 ? error : recorder_pause(recorder.handle);
        error = error != 0 ? error : recorder_start(recorder.handle);
        error = error != 0 ? error : recorder_commit(recorder.handle);
    }).join();
    EXPECT_EQ(0, error);
    EXPECT_TRUE(recorder.told.elapsed.empty()) << "callbacks belong to the main loop";
    EXPECT_TRUE(runUntil([&] { return recorder.told.states.size() == 5; }));
    EXPECT_EQ(0u, recorder.told.elapsed.front());
    recorder.destroy();
    const size_t count = recorder.told.elapsed.size();
    runFor(0.1);
    EXPECT_EQ(count, recorder.told.elapsed.size());
}

TEST_F(RecorderTest, RefusesDuringCallsAndAlarms)
{
    support::writeTone(directory.file("ring.wav"), 20, 0.2);
    for (const auto& [role, error] : {std::pair<std::string, int>{"phone", RECORDER_ERROR_SOUND_POLICY_BY_CALL},
             {"alarm", RECORDER_ERROR_SOUND_POLICY_BY_ALARM}}) {
        SCOPED_TRACE(role);
        RecorderHandle recorder(temporary);
        {
            const auto ring = server.playAs(role, directory.file("ring.wav"));
            EXPECT_TRUE(runUntil([&] {
                const int answer = recorder_prepare(recorder.handle);
                if (answer == 0)
                    recorder_unprepare(recorder.handle);
                return answer == error;
            }));
            EXPECT_EQ(RECORDER_STATE_CREATED, recorder.state());
        }
        EXPECT_TRUE(runUntil([&] { return recorder_prepare(recorder.handle) == 0; }));
    }
}

TEST_F(RecorderTest, CompletesTheFileBeforeItReportsAnInterruption)
{
    support::writeTone(directory.file("ring.wav"), 20, 0.2);
    support::Program ring;
    struct Case {
        const char* name;
        std::function<void()> happen;
        recorder_policy_e policy;
    };
    for (const auto& [name, happen, policy] :
        {Case{"call", [&] { ring = server.playAs("phone", directory.file("ring.wav")); }, RECORDER_POLICY_SOUND},
            Case{"suspended", [&] { (void)server.control("suspend-source micsrc 1"); }, RECORDER_POLICY_DEVICE_LOST},
            Case{"server killed", [&] { server.kill(); }, RECORDER_POLICY_DEVICE_LOST}}) {
        SCOPED_TRACE(name);
        RecorderHandle recorder(temporary);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(800));
        happen();
        ASSERT_TRUE(runUntil([&] { return !recorder.told.interruptions.empty(); }, 10));
        EXPECT_EQ(std::vector{policy}, recorder.told.interruptions);
        EXPECT_EQ(RECORDER_STATE_READY, recorder.told.stateWhenInterrupted);
        EXPECT_EQ(std::to_string(support::readFile(temporary).size()), recorder.told.fileWhenEnded);
        EXPECT_GE(probedDuration(temporary), 800);
        EXPECT_TRUE(decodesCleanly(temporary));
        EXPECT_EQ(0, recorder_commit(recorder.handle)) << "a stop that crosses the interruption finds the file";
        EXPECT_EQ(0, recorder_unprepare(recorder.handle));
        ring = {};
        (void)server.control("suspend-source micsrc 0");
        EXPECT_TRUE(runUntil([] {
            bool ignored = false;
            return recorder_is_in_recording(0, &ignored) == 0;
        }));
    }
}

TEST_F(RecorderTest, FailsToStartWithoutAWorkingMicrophone)
{
    setenv("PULSE_SOURCE", "no-such-source", 1);
    {
        RecorderHandle recorder(temporary);
        const auto begin = std::chrono::steady_clock::now();
        EXPECT_EQ(RECORDER_ERROR_DEVICE, recorder.prepareAndStart());
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
        EXPECT_EQ(RECORDER_STATE_READY, recorder.state());
        EXPECT_TRUE(filesIn(directory.path()).empty());
    }
    unsetenv("PULSE_SOURCE");
    (void)server.control("suspend-source micsrc 1");
    RecorderHandle recorder(temporary);
    EXPECT_EQ(RECORDER_ERROR_DEVICE, recorder.prepareAndStart());
    EXPECT_TRUE(filesIn(directory.path()).empty());
    (void)server.control("suspend-source micsrc 0");
    EXPECT_EQ(0, recorder_start(recorder.handle)) << "the next attempt is a new one";
    server.kill();
    RecorderHandle other(temporary);
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_NE(0, recorder_prepare(other.handle));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(1));
}
