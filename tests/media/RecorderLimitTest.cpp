#include "RecorderFixture.h"

#include <sys/mount.h>
#include <sys/stat.h>

#include <chrono>
#include <fstream>

using support::readFile;
using support::runFor;
using support::runUntil;

namespace {

// A file system of its own, unmounted at the end.
class SmallDisk {
public:
    SmallDisk(std::string path, const std::string& size)
        : _path(std::move(path))
    {
        std::filesystem::create_directory(_path);
        _isMounted = mount("tmpfs", _path.c_str(), "tmpfs", 0, ("size=" + size).c_str()) == 0;
    }
    ~SmallDisk()
    {
        if (_isMounted)
            umount2(_path.c_str(), MNT_DETACH);
    }
    SmallDisk(const SmallDisk&) = delete;
    SmallDisk& operator=(const SmallDisk&) = delete;

    [[nodiscard]] bool isMounted() const { return _isMounted; }
    [[nodiscard]] std::string file(const std::string& name) const { return _path + "/" + name; }
    // Leaves that many bytes free.
    void fillUpTo(uint64_t bytesLeft) const
    {
        std::filesystem::remove(file("filler"));
        const auto space = std::filesystem::space(_path);
        std::ofstream(file("filler")) << std::string(space.available - bytesLeft, 'x');
    }

private:
    std::string _path;
    bool _isMounted = false;
};

}

TEST_F(SourceTest, StopsAtTheSizeLimitAndNeverAboveIt)
{
    useSource("audiotestsrc is-live=false wave=white-noise samplesperbuffer=441");
    for (const bool isAmr : {false, true})
        for (const int kilobytes : {3, 10, 100, 500}) {
            SCOPED_TRACE(std::to_string(kilobytes) + (isAmr ? " amr" : " aac"));
            RecorderHandle recorder(temporary);
            if (isAmr)
                recorder.useAmr();
            recorder_attr_set_size_limit(recorder.handle, kilobytes);
            ASSERT_EQ(0, recorder.prepareAndStart());
            ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 20));
            EXPECT_EQ(RECORDER_STATE_RECORDING, recorder.state()) << "the application stops it";
            ASSERT_EQ(0, recorder_commit(recorder.handle));
            runFor(0.02);
            EXPECT_EQ(std::vector{RECORDER_RECORDING_LIMIT_SIZE}, recorder.told.limits);
            const auto size = readFile(temporary).size();
            EXPECT_LE(size, static_cast<size_t>(kilobytes) * 1024);
            EXPECT_GE(size, static_cast<size_t>(kilobytes) * 1024 - 1600);
            EXPECT_TRUE(decodesCleanly(temporary));
        }
}

TEST_F(SourceTest, StopsExactlyAtTheTimeLimit)
{
    useSource("audiotestsrc is-live=false samplesperbuffer=1000");
    for (const bool isAmr : {false, true}) {
        RecorderHandle recorder(temporary);
        if (isAmr)
            recorder.useAmr();
        recorder_attr_set_time_limit(recorder.handle, 2);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 20));
        ASSERT_EQ(0, recorder_commit(recorder.handle));
        EXPECT_EQ(std::vector{RECORDER_RECORDING_LIMIT_TIME}, recorder.told.limits);
        EXPECT_NEAR(2000, probedDuration(temporary), 70);
        EXPECT_GE(probedDuration(temporary), 2000);
    }
}

TEST_F(SourceTest, SavesWhatWasRecordedWhenTheStorageFillsUp)
{
    const SmallDisk disk(directory.file("disk"), "4m");
    if (!disk.isMounted())
        GTEST_SKIP() << "needs the right to mount";
    for (const bool isAmr : {false, true}) {
        SCOPED_TRACE(isAmr);
        RecorderHandle recorder(disk.file(".mw_temp"));
        if (isAmr)
            recorder.useAmr();
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(1200));
        // Faster than the look at the free space: the next frames find no room.
        disk.fillUpTo(0);
        ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 20));
        EXPECT_EQ(std::vector{RECORDER_RECORDING_LIMIT_FREE_SPACE}, recorder.told.limits);
        ASSERT_EQ(0, recorder_commit(recorder.handle));
        EXPECT_EQ(RECORDER_STATE_READY, recorder.state());
        EXPECT_GE(probedDuration(recorder.path), 1100);
        EXPECT_TRUE(decodesCleanly(recorder.path));
        EXPECT_TRUE(recorder.told.errors.empty());
        recorder.destroy();
        std::filesystem::remove(recorder.path);
        std::filesystem::remove(disk.file("filler"));
        recorder_release_temporary(recorder.path.c_str());
    }
}

TEST_F(SourceTest, StopsInTimeWhenTheSpaceRunsLow)
{
    const SmallDisk disk(directory.file("disk"), "4m");
    if (!disk.isMounted())
        GTEST_SKIP() << "needs the right to mount";
    disk.fillUpTo(300 * 1024);
    RecorderHandle recorder(disk.file(".mw_temp"));
    ASSERT_EQ(0, recorder.prepareAndStart());
    ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 20));
    EXPECT_EQ(RECORDER_STATE_RECORDING, recorder.told.stateWhenInterrupted);
    EXPECT_EQ(0, recorder_commit(recorder.handle));
    EXPECT_TRUE(decodesCleanly(recorder.path));
    recorder.destroy();
    std::filesystem::remove(recorder.path);
    recorder_release_temporary(recorder.path.c_str());

    disk.fillUpTo(20 * 1024);
    RecorderHandle late(disk.file(".mw_temp"));
    EXPECT_EQ(RECORDER_ERROR_OUT_OF_STORAGE, late.prepareAndStart());
    EXPECT_EQ(std::vector<std::string>{"filler"}, filesIn(directory.file("disk")));
}

TEST_F(SourceTest, RefusesWhatCannotBeRecorded)
{
    RecorderHandle recorder(directory.file("missing/.mw_temp"));
    EXPECT_EQ(RECORDER_ERROR_INVALID_STATE, recorder_start(recorder.handle));
    EXPECT_EQ(RECORDER_ERROR_INVALID_OPERATION, recorder.prepareAndStart());
    EXPECT_EQ(RECORDER_STATE_READY, recorder.state());
    EXPECT_EQ(RECORDER_ERROR_INVALID_STATE, recorder_commit(recorder.handle));
    EXPECT_EQ(RECORDER_ERROR_INVALID_STATE, recorder_pause(recorder.handle));
    EXPECT_EQ(RECORDER_ERROR_INVALID_PARAMETER, recorder_set_filename(recorder.handle, ""));
    if (geteuid() != 0) {
        const std::string closed = directory.file("closed");
        std::filesystem::create_directory(closed);
        chmod(closed.c_str(), 0500);
        recorder_set_filename(recorder.handle, (closed + "/.mw_temp").c_str());
        EXPECT_EQ(RECORDER_ERROR_PERMISSION_DENIED, recorder_start(recorder.handle));
    }
    recorder_set_filename(recorder.handle, temporary.c_str());
    EXPECT_EQ(0, recorder_start(recorder.handle));
    EXPECT_EQ(RECORDER_ERROR_INVALID_STATE, recorder_attr_set_time_limit(recorder.handle, 1));
    EXPECT_EQ(0, recorder_cancel(recorder.handle));

    RecorderHandle mixed(temporary);
    recorder_set_file_format(mixed.handle, RECORDER_FILE_FORMAT_AMR);
    EXPECT_EQ(RECORDER_ERROR_INVALID_PARAMETER, recorder_prepare(mixed.handle));
    useSource("no-such-element");
    RecorderHandle without(temporary);
    EXPECT_EQ(RECORDER_ERROR_DEVICE, recorder_prepare(without.handle));
}

TEST_F(SourceTest, CommitDoesNotDependOnTheLength)
{
    // Ten minutes of sound, as fast as it can be encoded.
    useSource("audiotestsrc is-live=false wave=ticks samplesperbuffer=4096");
    RecorderHandle recorder(temporary);
    recorder_attr_set_time_limit(recorder.handle, 600);
    ASSERT_EQ(0, recorder.prepareAndStart());
    ASSERT_TRUE(runUntil([&] { return !recorder.told.limits.empty(); }, 100));
    runFor(0.5);
    const auto begin = std::chrono::steady_clock::now();
    ASSERT_EQ(0, recorder_commit(recorder.handle));
    const auto took = std::chrono::steady_clock::now() - begin;
    EXPECT_LT(took, std::chrono::seconds(2)); // mostly the flush of what was written too fast
    EXPECT_NEAR(600000, probedDuration(temporary), 70);
    EXPECT_GE(recorder.told.elapsed.size(), 2u);
}
