#include "RecorderFixture.h"

#include <fstream>
#include <sys/inotify.h>
#include <unistd.h>

using support::readFile;
using support::runUntil;
using support::writeFile;

namespace {

// Another process that records into a path; it can be killed.
class OtherProcess {
public:
    OtherProcess(const std::string& path, const std::string& format, int commitAfterMs = 0)
        : _process(
            {"/proc/" + std::to_string(getpid()) + "/exe", "--record", path, format, std::to_string(commitAfterMs)})
    {
    }
    void kill() { _process.end(); }

private:
    support::Program _process;
};

// What is moved away from names in a folder.
class Moves {
public:
    explicit Moves(const std::string& folder)
        : _watch(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC))
    {
        ::inotify_add_watch(_watch, folder.c_str(), IN_MOVED_FROM);
    }
    ~Moves() { ::close(_watch); }
    Moves(const Moves&) = delete;
    Moves& operator=(const Moves&) = delete;

    [[nodiscard]] std::string last() const
    {
        alignas(inotify_event) char events[4096];
        const ssize_t size = ::read(_watch, events, sizeof events);
        std::string name;
        for (const char* at = events; size > 0 && at < events + size;) {
            const auto* event = reinterpret_cast<const inotify_event*>(at);
            name = event->name;
            at += sizeof *event + event->len;
        }
        return name;
    }

private:
    int _watch;
};

bool growsTo(const std::string& path, uint64_t size)
{
    return runUntil(
        [&] {
            std::error_code error;
            const auto now = std::filesystem::file_size(path, error);
            return !error && now >= size;
        },
        20);
}

// Whether a file's index is written (its head names a size).
bool isCommitted(const std::string& path)
{
    return runUntil([&] { return readFile(path).find("moov") != std::string::npos; }, 20);
}

}

class RescueTest : public SourceTest {
protected:
    // What a process left that was killed while it recorded.
    void recordAndKill(const std::string& format, uint64_t bytes)
    {
        OtherProcess other(temporary, format);
        ASSERT_TRUE(growsTo(temporary, bytes));
        other.kill();
    }
    void copyState(const std::string& from, const std::string& to) const
    {
        std::filesystem::remove_all(directory.file(to));
        std::filesystem::copy(directory.file(from), directory.file(to));
    }
};

TEST_F(RescueTest, RebuildsWhatAKilledProcessLeft)
{
    for (const auto& [format, bytes, type] :
        {std::tuple{"aac", 80000, RECORDER_FILE_FORMAT_MP4}, std::tuple{"amr", 3200, RECORDER_FILE_FORMAT_AMR}}) {
        SCOPED_TRACE(format);
        recordAndKill(format, static_cast<uint64_t>(bytes));
        writeFile(temporary + RECORDER_NOTES_SUFFIX, "name");
        const auto left = static_cast<double>(readFile(temporary).size());
        const Moves moves(directory.path());
        const auto found = rescue(temporary);
        EXPECT_EQ(".mw_temp.idx", moves.last()) << "it says what the others are, as long as they are on their way";
        ASSERT_EQ(1u, found.size());
        EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
        EXPECT_EQ(type, found[0].format);
        // Every byte that had reached the file is sound now.
        const double expected = type == RECORDER_FILE_FORMAT_AMR ? (left - 6) / 32 * 20 : (left - 48) * 8000 / 288000;
        EXPECT_NEAR(expected, found[0].duration, 50);
        EXPECT_NEAR(found[0].duration, probedDuration(found[0].path), 60);
        EXPECT_TRUE(decodesCleanly(found[0].path));
        if (type == RECORDER_FILE_FORMAT_MP4) {
            EXPECT_NEAR(found[0].duration * 44.1, static_cast<double>(heard(found[0].path).size()), 100);
        }
        EXPECT_EQ("name", readFile(found[0].sidecar));
        EXPECT_FALSE(std::filesystem::exists(temporary));

        // Not moved away, it is reported again, unchanged.
        const std::string rebuilt = readFile(found[0].path);
        ASSERT_EQ(1u, rescue(temporary).size());
        EXPECT_EQ(rebuilt, readFile(found[0].path));
        std::filesystem::remove(found[0].path);
        std::filesystem::remove(found[0].sidecar);
        EXPECT_TRUE(rescue(temporary).empty());
        EXPECT_TRUE(filesIn(directory.path()).empty());
    }
}

TEST_F(RescueTest, LeavesALiveProcessItsRecording)
{
    OtherProcess other(temporary, "aac");
    ASSERT_TRUE(growsTo(temporary, 20000));
    EXPECT_TRUE(rescue(temporary).empty());
    RecorderHandle recorder(temporary);
    EXPECT_EQ(RECORDER_ERROR_INVALID_OPERATION, recorder.prepareAndStart());
    EXPECT_EQ((std::vector<std::string>{".mw_temp", ".mw_temp.idx"}), filesIn(directory.path()));
    EXPECT_TRUE(growsTo(temporary, 60000));
    other.kill();
    EXPECT_EQ(1u, rescue(temporary).size());
}

TEST_F(RescueTest, LeavesACommittedRecordingUntilItsProcessSavedIt)
{
    OtherProcess other(temporary, "aac", 500);
    ASSERT_TRUE(isCommitted(temporary));
    EXPECT_TRUE(rescue(temporary).empty());
    EXPECT_TRUE(std::filesystem::exists(temporary));
    other.kill();
    const auto found = rescue(temporary);
    ASSERT_EQ(1u, found.size());
    EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
    EXPECT_TRUE(decodesCleanly(found[0].path));
}

TEST_F(RescueTest, StartMovesALeftoverAside)
{
    recordAndKill("aac", 40000);
    writeFile(temporary + RECORDER_NOTES_SUFFIX, "old");
    const std::string old = readFile(temporary);
    {
        RecorderHandle recorder(temporary);
        ASSERT_EQ(0, recorder.prepareAndStart());
        EXPECT_EQ(5u, filesIn(directory.path()).size()); // two now, three of the old one
        // Our own running recording is no leftover, the old one is.
        auto found = rescue(temporary);
        ASSERT_EQ(1u, found.size());
        EXPECT_EQ("old", readFile(found[0].sidecar));
        EXPECT_EQ(old.substr(48, 30000), readFile(found[0].path).substr(48, 30000));
        EXPECT_TRUE(decodesCleanly(found[0].path));
        ASSERT_TRUE(recorder.recordUntil(300));
        ASSERT_EQ(0, recorder_commit(recorder.handle));
        // Committed but never saved: the next start must not write over it either.
        ASSERT_EQ(0, recorder_start(recorder.handle));
        EXPECT_EQ(0, recorder_cancel(recorder.handle));
    }
    EXPECT_EQ(2u, rescue(temporary).size());
}

TEST_F(RescueTest, TwoRecordersOfOneProcessDoNotShareAFile)
{
    RecorderHandle first(temporary);
    RecorderHandle second(temporary);
    ASSERT_EQ(0, first.prepareAndStart());
    EXPECT_EQ(RECORDER_ERROR_INVALID_OPERATION, second.prepareAndStart());
    EXPECT_EQ(RECORDER_ERROR_INVALID_STATE, recorder_release_temporary(temporary.c_str()));
    ASSERT_TRUE(first.recordUntil(300));
    ASSERT_EQ(0, recorder_commit(first.handle));
    EXPECT_GE(probedDuration(temporary), 300);
    // Saved or not, the first recording stays what it is.
    ASSERT_EQ(0, recorder_start(second.handle));
    EXPECT_EQ(0, recorder_cancel(second.handle));
    const auto found = rescue(temporary);
    ASSERT_EQ(1u, found.size());
    EXPECT_GE(probedDuration(found[0].path), 300);
}

TEST_F(RescueTest, ReleasedRecordingLeavesNoTrace)
{
    RecorderHandle recorder(temporary);
    ASSERT_EQ(0, recorder.prepareAndStart());
    ASSERT_TRUE(recorder.recordUntil(200));
    ASSERT_EQ(0, recorder_commit(recorder.handle));
    std::filesystem::rename(temporary, directory.file("saved.m4a"));
    EXPECT_EQ(0, recorder_release_temporary(temporary.c_str()));
    EXPECT_NE(0, recorder_release_temporary(temporary.c_str()));
    EXPECT_EQ(std::vector<std::string>{"saved.m4a"}, filesIn(directory.path()));
    EXPECT_TRUE(decodesCleanly(directory.file("saved.m4a")));
}

TEST_F(RescueTest, DestroyedRecorderLeavesACompleteFile)
{
    {
        RecorderHandle recorder(temporary);
        ASSERT_EQ(0, recorder.prepareAndStart());
        ASSERT_TRUE(recorder.recordUntil(400));
    }
    EXPECT_GE(probedDuration(temporary), 400);
    EXPECT_TRUE(rescue(temporary).empty()) << "this process still holds it";
}

TEST_F(RescueTest, MakesTheBestOfTornFiles)
{
    recordAndKill("aac", 80000);
    std::filesystem::create_directory(directory.file("crash"));
    std::filesystem::rename(temporary, directory.file("crash/.mw_temp"));
    std::filesystem::rename(temporary + ".idx", directory.file("crash/.mw_temp.idx"));
    const auto bytes = std::filesystem::file_size(directory.file("crash/.mw_temp"));
    const auto sizes = std::filesystem::file_size(directory.file("crash/.mw_temp.idx"));
    struct Case {
        const char* name;
        uint64_t fileBytes;
        uint64_t journalBytes;
        bool isBlankTail;
        recorder_leftover_e outcome;
        int leastMs;
    };
    for (const auto& torn : {Case{"torn frame", bytes - 100, sizes, false, RECORDER_LEFTOVER_REBUILT, 1900},
             Case{"half the file", bytes / 2, sizes, false, RECORDER_LEFTOVER_REBUILT, 1000},
             Case{"short journal", bytes, sizes - 41, false, RECORDER_LEFTOVER_REBUILT, 1500},
             Case{"blank end", bytes, sizes, true, RECORDER_LEFTOVER_REBUILT, 1300},
             Case{"no frame in the journal", bytes, 57, false, RECORDER_LEFTOVER_BEYOND_RESCUE, 0},
             Case{"no journal", bytes, 0, false, RECORDER_LEFTOVER_BEYOND_RESCUE, 0},
             Case{"head only", 48, sizes, false, RECORDER_LEFTOVER_EMPTY, 0},
             Case{"nothing", 0, 0, false, RECORDER_LEFTOVER_EMPTY, 0}}) {
        SCOPED_TRACE(torn.name);
        copyState("crash", "work");
        const std::string path = directory.file("work/.mw_temp");
        std::filesystem::resize_file(path, torn.fileBytes);
        std::filesystem::resize_file(path + ".idx", torn.journalBytes);
        if (torn.isBlankTail) {
            std::filesystem::resize_file(path, torn.fileBytes - 20000);
            std::filesystem::resize_file(path, torn.fileBytes);
        }
        const auto found = rescue(path);
        ASSERT_EQ(1u, found.size());
        EXPECT_EQ(torn.outcome, found[0].outcome);
        EXPECT_GE(found[0].duration, torn.leastMs);
        if (torn.outcome == RECORDER_LEFTOVER_REBUILT) {
            EXPECT_TRUE(decodesCleanly(found[0].path));
            EXPECT_NEAR(found[0].duration, probedDuration(found[0].path), 2);
            const double frames = (found[0].duration * 44.1 + 1600) / 1024;
            EXPECT_NEAR(56 + 2 * frames, std::filesystem::file_size(found[0].path + ".idx"), 1) << "those it has";
        } else if (torn.outcome == RECORDER_LEFTOVER_BEYOND_RESCUE) {
            EXPECT_EQ(bytes, std::filesystem::file_size(found[0].path));
            EXPECT_TRUE(rescue(path).empty()) << "kept, but not reported again";
        } else {
            EXPECT_TRUE(filesIn(directory.file("work")).empty());
        }
    }
}

TEST_F(RescueTest, RepeatsARescueThatWasCutOff)
{
    recordAndKill("aac", 60000);
    auto found = rescue(temporary);
    ASSERT_EQ(1u, found.size());
    const std::string path = found[0].path;
    const std::string rebuilt = readFile(path);
    const std::string journal = readFile(path + ".idx");
    const auto index = rebuilt.find("moov") - 4;
    // The head not yet patched, the index half written, the journal not yet marked.
    std::string cut = rebuilt.substr(0, index + 200);
    cut.replace(32, 16,
        std::string("\0\0\0\x08"
                    "free"
                    "\0\0\0\0"
                    "mdat",
            16));
    std::string unmarked = journal;
    unmarked[9] = 0;
    for (const auto& [file, sizes] : {std::pair{cut, journal}, std::pair{rebuilt, journal.substr(0, 60)}}) {
        writeFile(path, file);
        writeFile(path + ".idx", sizes);
        found = rescue(temporary);
        ASSERT_EQ(1u, found.size());
        EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
        EXPECT_EQ(rebuilt, readFile(path));
    }
}

TEST_F(RescueTest, FinishesAMoveThatWasCutOff)
{
    // Both files lie under their old names at first, then only the journal does.
    for (const bool isFileMoved : {false, true}) {
        SCOPED_TRACE(isFileMoved);
        recordAndKill("aac", 40000);
        {
            const auto rescued = rescue(temporary);
            ASSERT_EQ(1u, rescued.size());
            std::filesystem::rename(rescued[0].path + ".idx", temporary + ".idx");
            if (!isFileMoved)
                std::filesystem::rename(rescued[0].path, temporary);
        }
        const auto found = rescue(temporary);
        ASSERT_EQ(1u, found.size());
        EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
        EXPECT_TRUE(decodesCleanly(found[0].path));
        EXPECT_EQ(2u, filesIn(directory.path()).size());
        std::filesystem::remove(found[0].path);
        EXPECT_TRUE(rescue(temporary).empty());
    }
}

TEST_F(RescueTest, IsDoneOnceWhenTwoAreAtIt)
{
    recordAndKill("aac", 20000);
    static std::string path;
    path = temporary;
    static int others;
    others = -1;
    const int count = recorder_rescue_leftovers(
        temporary.c_str(),
        [](recorder_leftover_e, const char*, recorder_file_format_e, int, const char*, void*) {
            // As another process would, while this one moves the file to its place.
            others = recorder_rescue_leftovers(path.c_str(), nullptr, nullptr);
        },
        nullptr);
    EXPECT_EQ(1, count);
    EXPECT_EQ(0, others);
    EXPECT_EQ(1u, rescue(temporary).size());
}

TEST_F(RescueTest, RebuildsBeyondFourGigabytes)
{
    // Most of the file is a hole; a real last frame keeps the end from being taken for unwritten.
    constexpr uint64_t FRAMES = 3600000;
    constexpr uint64_t FRAME_BYTES = 1400;
    recordAndKill("aac", 20000);
    const std::string journal = readFile(temporary + ".idx");
    std::string sizes;
    for (uint64_t i = 0; i < FRAMES; ++i)
        sizes += std::string("\x78\x05", 2);
    writeFile(temporary + ".idx", journal.substr(0, 56) + sizes);
    std::filesystem::resize_file(temporary, 48);
    std::filesystem::resize_file(temporary, 48 + FRAMES * FRAME_BYTES);
    std::fstream(temporary, std::ios::in | std::ios::out | std::ios::binary).seekp(-1, std::ios::end) << '\xE0';

    const auto found = rescue(temporary);
    ASSERT_EQ(1u, found.size());
    EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
    EXPECT_EQ(static_cast<int>((FRAMES * 1024 - 1600) * 1000 / 44100), found[0].duration);
    EXPECT_NEAR(found[0].duration, probedDuration(found[0].path), 10);
    const std::string places = support::outputOf(
        "ffprobe -v error -show_entries packet=pos -of csv=p=0 -read_intervals 83580% '" + found[0].path + "'");
    const std::string last = std::to_string(48 + (FRAMES - 1) * FRAME_BYTES);
    EXPECT_NE(std::string::npos, places.find(last)) << "the last frame is where it was written";
}

TEST_F(RescueTest, RescuesAmrWithoutItsJournal)
{
    recordAndKill("amr", 3200);
    std::filesystem::remove(temporary + ".idx");
    std::ofstream(temporary, std::ios::app | std::ios::binary) << '\x3c' << "torn";
    const auto found = rescue(temporary);
    ASSERT_EQ(1u, found.size());
    EXPECT_EQ(RECORDER_LEFTOVER_REBUILT, found[0].outcome);
    EXPECT_EQ(0u, (std::filesystem::file_size(found[0].path) - 6) % 32);
    EXPECT_TRUE(decodesCleanly(found[0].path));
}
