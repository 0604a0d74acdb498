#include "RecorderFixture.h"

#include "media/FileDuration.h"
#include "media/Mp4Index.h"

#include <sys/stat.h>
#include <sys/wait.h>

#include <chrono>
#include <csignal>
#include <functional>

using support::readFile;
using support::runUntil;
using support::writeFile;

namespace {

constexpr auto SOON
    = std::chrono::seconds(2); // far above what anything here takes, far below a time limit of the server's

std::chrono::steady_clock::duration timeOf(const std::function<void()>& action)
{
    const auto begin = std::chrono::steady_clock::now();
    action();
    return std::chrono::steady_clock::now() - begin;
}

}

TEST_F(RecorderTest, AHangingSoundServerHoldsNeitherFileNorCaller)
{
    struct Case {
        const char* name;
        std::function<int(recorder_h)> end;
    };
    for (const auto& [name, end] : {Case{"stop", recorder_commit},
             Case{"stop while paused",
                 [](recorder_h recorder) {
                     EXPECT_EQ(0, recorder_pause(recorder));
                     return recorder_commit(recorder);
                 }},
             Case{"end of the program", recorder_destroy}}) {
        SCOPED_TRACE(name);
        RecorderHandle recorder(temporary);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(500));
        server.signal(SIGSTOP);
        EXPECT_LT(timeOf([&] { EXPECT_EQ(0, end(recorder.handle)); }), SOON);
        EXPECT_GE(probedDuration(temporary), 500);
        EXPECT_TRUE(decodesCleanly(temporary));
        if (std::string(name) == "end of the program")
            recorder.handle = nullptr;
        else
            EXPECT_LT(timeOf([&] { EXPECT_EQ(0, recorder_unprepare(recorder.handle)); }), SOON);
        server.signal(SIGCONT);
        std::filesystem::remove(temporary);
        recorder_release_temporary(temporary.c_str());
    }
    server.signal(SIGSTOP);
    RecorderHandle late(temporary);
    EXPECT_LT(timeOf([&] { EXPECT_EQ(RECORDER_ERROR_DEVICE, recorder_prepare(late.handle)); }), 2 * SOON);
    server.signal(SIGCONT);
    EXPECT_TRUE(runUntil([&] { return recorder_prepare(late.handle) == 0; }));
}

TEST_F(RecorderTest, AMonitorThatNobodyChoseEndsTheRecording)
{
    (void)server.load("module-rescue-streams");
    RecorderHandle recorder(temporary);
    ASSERT_EQ(0, recorder.prepareAndStart());
    ASSERT_TRUE(recorder.recordUntil(300));
    std::string stream = server.control("list short source-outputs | grep native | cut -f1");
    stream.resize(stream.find_last_not_of('\n') + 1);
    for (const char* chosen : {"spk.monitor", "micsrc"}) {
        EXPECT_EQ("", server.control("move-source-output " + stream + " " + chosen));
        ASSERT_TRUE(recorder.recordUntil(recorder.told.elapsed.back() + 1500)) << chosen;
    }
    EXPECT_TRUE(recorder.told.interruptions.empty()) << "the user's own choice";
    server.unload("module-remap-source");
    ASSERT_TRUE(runUntil([&] { return !recorder.told.interruptions.empty(); }, 5));
    EXPECT_EQ(std::vector{RECORDER_POLICY_DEVICE_LOST}, recorder.told.interruptions);
    EXPECT_GE(probedDuration(temporary), 3000);
    EXPECT_TRUE(decodesCleanly(temporary));
}

TEST_F(SourceTest, ADeletedFolderEndsTheRecordingAndLosesNothing)
{
    for (const bool isFolder : {false, true}) {
        const std::string path = directory.file("root/Mewlo/.mw_temp");
        std::filesystem::create_directories(directory.file("root/Mewlo"));
        RecorderHandle recorder(path);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(600));
        std::filesystem::remove_all(isFolder ? directory.file("root") : path);
        ASSERT_TRUE(runUntil([&] { return !recorder.told.interruptions.empty(); }, 4));
        EXPECT_EQ(std::vector{RECORDER_POLICY_STORAGE}, recorder.told.interruptions);
        EXPECT_EQ(0, recorder_check_temporary(path.c_str()));
        EXPECT_GE(probedDuration(path), 600);
        EXPECT_TRUE(decodesCleanly(path));
        std::filesystem::remove_all(directory.file("root"));
        recorder_release_temporary(path.c_str());
    }
}

TEST_F(SourceTest, PlaysAsLongAsItWasRecorded)
{
    for (const int rate : {44100, 48000, 8000}) {
        SCOPED_TRACE(rate);
        // Loud from the first sample on, so that hidden or lost sound shows.
        useSource("audiotestsrc is-live=false wave=square volume=0.5 samplesperbuffer=441");
        RecorderHandle recorder(temporary);
        recorder_attr_set_audio_samplerate(recorder.handle, rate);
        recorder_attr_set_time_limit(recorder.handle, 1);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 20));
        ASSERT_EQ(0, recorder_commit(recorder.handle));
        EXPECT_NEAR(1000, probedDuration(temporary), 1);
        EXPECT_EQ(1000, media::durationOf(temporary).value_or(0));
        const auto samples = support::decode(temporary, rate);
        // Some decoders deliver the last frame whole.
        ASSERT_NEAR(rate, static_cast<double>(samples.size()), 1023);
        ASSERT_GE(samples.size(), static_cast<size_t>(rate));
        const auto loud = [&](size_t from) {
            return std::any_of(&samples[from], &samples[from] + rate / 100, [](short s) { return std::abs(s) > 8000; });
        };
        EXPECT_TRUE(loud(0) && loud(static_cast<size_t>(rate - rate / 100)));
        recorder.destroy();

        // The same frames without an index, as a crash leaves them: to one frame.
        const std::string file = readFile(temporary);
        const std::string journal = readFile(temporary + ".idx");
        recorder_release_temporary(temporary.c_str());
        const auto frames = file.substr(media::MP4_DATA_START, file.find("moov") - 4 - media::MP4_DATA_START);
        writeFile(temporary, media::mp4FileHead(media::MP4_UNFINISHED) + frames);
        writeFile(temporary + ".idx", journal);
        const auto found = rescue(temporary);
        ASSERT_EQ(1u, found.size());
        const double frame = 1024.0 * 1000 / rate;
        EXPECT_NEAR(1000, found[0].duration, frame);
        EXPECT_NEAR(1000, probedDuration(found[0].path), frame);
        std::filesystem::remove(found[0].path);
        EXPECT_TRUE(rescue(temporary).empty());
    }
}

TEST_F(SourceTest, OpensNothingThatSomebodyPlanted)
{
    const std::string victim = directory.file("victim");
    writeFile(victim, "precious");
    const auto plant = [&](const std::string& name, int kind) {
        if (kind == 0)
            std::filesystem::create_symlink(victim, name);
        else if (kind == 1)
            std::filesystem::create_hard_link(victim, name);
        else
            ASSERT_EQ(0, mkfifo(name.c_str(), 0666));
    };
    for (const int kind : {0, 1, 2})
        for (const char* suffix : {".idx", ".reserve"}) {
            SCOPED_TRACE(std::to_string(kind) + suffix);
            plant(temporary + suffix, kind);
            RecorderHandle recorder(temporary);
            ASSERT_EQ(0, recorder.prepareAndStart());
            ASSERT_TRUE(recorder.recordUntil(100));
            EXPECT_EQ(0, recorder_commit(recorder.handle));
            EXPECT_EQ("precious", readFile(victim));
            recorder.destroy();
            std::filesystem::remove(temporary);
            recorder_release_temporary(temporary.c_str());
            std::filesystem::remove(temporary + suffix);
        }
    // A pipe in place of a journal holds no rescue either.
    for (const char* name : {".mw_temp.idx", ".mw_rescue_0.idx", ".mw_rescue_0", ".mw_temp"})
        plant(directory.file(name), 2);
    (void)rescue(temporary);
    EXPECT_EQ("precious", readFile(victim));
}
