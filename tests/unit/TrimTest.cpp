// Trimming with the real engine, files and database: what becomes of recordings, rows and bookmarks, whatever happens
// meanwhile.
#include "MwTrim.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <fcntl.h>
#include <map>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "MwFileOperator.h"
#include "MwSavedBookmarks.h"
#include "MwStorageRoots.h"
#include "support/FaultyCalls.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

namespace fs = std::filesystem;
namespace faults = support::faults;
using support::readFile;
using support::recordingPath;
using support::runUntil;
using Marks = std::map<unsigned int, std::string>;

constexpr int LENGTH = 6000;
constexpr int BEGIN = 2500;
constexpr int END = 4999;
const Marks MARKS = {{1, "one"}, {2, "two"}, {4, "four"}, {5, "five"}};
const Marks MARKS_INSIDE = {{0, "two"}, {2, "four"}};

struct Outcome {
    int events = 0;
    MwTrim::eventType event = MwTrim::TRIM_EVENT_FAILED;
    MwTrim::Failure failure = MwTrim::Failure::NONE;
    std::string path;
};

std::string idOf(const std::string& path)
{
    struct Search {
        std::string path;
        std::string id;
        int rows = 0;
    } search{path, {}, 0};
    media_info_foreach_media_from_db(
        nullptr,
        [](media_info_h media, void* data) {
            auto* found = static_cast<Search*>(data);
            char* text = nullptr;
            media_info_get_file_path(media, &text);
            if (mwAdopt(text) == found->path && ++found->rows > 0) {
                media_info_get_media_id(media, &text);
                found->id = mwAdopt(text);
            }
            return true;
        },
        &search);
    return search.rows == 1 ? search.id : std::string();
}

Marks marksOf(const std::string& path)
{
    Marks marks;
    for (const MwSavedBookmark& each : mwReadBookmarks(idOf(path), [](const char*, int) {}))
        marks[each.markedTime] = each.name;
    return marks;
}

std::vector<std::string> namesIn(const std::string& directory)
{
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(directory))
        names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
}

class TrimTest : public testing::Test {
protected:
    static void SetUpTestSuite()
    {
        static const support::TempDir directory;
        const std::string file = directory.file("source.m4a");
        const std::string command = "ffmpeg -v error -f lavfi -i anoisesrc=d=6:r=44100:a=0.3 -ac 1 -c:a aac " + file;
        ASSERT_EQ(0, std::system(command.c_str()));
        _content = readFile(file);
    }

    TrimTest()
    {
        ::setenv("MEWLO_MEDIA_DB", _database.file("media.db").c_str(), 1);
        prepare();
    }
    ~TrimTest() override
    {
        media_content_disconnect();
        ::unsetenv("MEWLO_MEDIA_DB");
    }

    // One recording with its row and marks, and nothing else; connected.
    void prepare()
    {
        fs::remove_all(mwDeviceRoot() + "/Sounds");
        fs::remove_all(trash());
        for (const auto& entry : fs::directory_iterator(_database.path()))
            fs::remove(entry);
        media_content_connect();
        _id = support::addRecording("Voice 001.m4a", _content);
        for (const auto& [time, name] : MARKS)
            media_bookmark_insert_to_db(_id.c_str(), time, name.c_str());
    }
    static std::string trash() { return std::string(std::getenv("XDG_DATA_HOME")) + "/Trash"; }
    static std::string inTrash()
    {
        std::error_code none;
        const fs::directory_iterator files(trash() + "/files", none);
        // A kill in between may have used up the name itself.
        return files != fs::directory_iterator()
                && files->path().filename().string().starts_with("Voice 001 (original)")
            ? readFile(files->path())
            : std::string();
    }

    static Outcome trim(bool overwrite, int begin = BEGIN, int end = END,
        const std::function<void(MwTrim&)>& meanwhile = {}, const std::string& path = recordingPath("Voice 001.m4a"))
    {
        Outcome outcome;
        MwTrim engine;
        engine.trimSignal.addListener([&](MwTrim::eventType event) {
            ++outcome.events;
            outcome.event = event;
        });
        EXPECT_TRUE(engine.start(path.c_str(), overwrite, begin, end, LENGTH));
        if (meanwhile)
            meanwhile(engine);
        EXPECT_TRUE(runUntil([&] { return outcome.events > 0; }, 10));
        outcome.failure = engine.getFailure();
        outcome.path = engine.getOutputPath();
        return outcome;
    }

    // What holds whenever nobody works on it any more: one whole recording under the name, and what belongs to it.
    static void expectWhole(bool overwrite, const std::string& result, bool mayMissTrash = false)
    {
        const std::string path = recordingPath("Voice 001.m4a");
        const std::string copy = recordingPath("Voice 001_001.m4a");
        const std::string now = readFile(path);
        const bool isReplaced = overwrite && now == result;
        EXPECT_TRUE(isReplaced || now == _content);
        EXPECT_EQ(isReplaced ? MARKS_INSIDE : MARKS, marksOf(path));
        EXPECT_TRUE((mayMissTrash && inTrash().empty()) || inTrash() == (isReplaced ? _content : std::string()));
        std::vector<std::string> names{"Voice 001.m4a"};
        if (fs::exists(copy)) {
            EXPECT_FALSE(overwrite);
            EXPECT_EQ(result, readFile(copy));
            EXPECT_EQ(MARKS_INSIDE, marksOf(copy));
            names.emplace_back("Voice 001_001.m4a");
        }
        EXPECT_EQ(names, namesIn(support::recordingsDirectory()));
    }

    // What the next start does.
    static void startAnew()
    {
        MwTrimStore::recover(support::recordingsDirectory());
        media_content_scan_all();
    }

    static std::string _content;
    support::TempDir _database;
    std::string _id;
};
std::string TrimTest::_content;

TEST_F(TrimTest, WritesANewFileOrReplacesTheOriginalWithTheMarksInside)
{
    EXPECT_EQ(MwTrim::TRIM_EVENT_DONE, trim(false).event);
    const std::string copy = recordingPath("Voice 001_001.m4a");
    EXPECT_EQ(MARKS_INSIDE, marksOf(copy));
    EXPECT_EQ(MARKS, marksOf(recordingPath("Voice 001.m4a")));
    EXPECT_EQ(_id, idOf(recordingPath("Voice 001.m4a")));
    EXPECT_EQ(recordingPath("Voice 001_002.m4a"), trim(false).path);
    const std::string result = readFile(copy);
    fs::remove(copy);
    fs::remove(recordingPath("Voice 001_002.m4a"));
    media_content_scan_all();

    EXPECT_EQ(recordingPath("Voice 001.m4a"), trim(true).path);
    expectWhole(true, result);
    EXPECT_NE(_id, idOf(recordingPath("Voice 001.m4a")));
}

TEST_F(TrimTest, KeepsWhatIsPrivateOutOfTheTrash)
{
    const std::string path = mwPrivateRoot() + "/Sounds/Mewlo/Voice 009.m4a";
    support::writeFile(path, _content);
    EXPECT_EQ(MwTrim::TRIM_EVENT_DONE, trim(true, BEGIN, END, {}, path).event);
    EXPECT_LT(fs::file_size(path), _content.size());
    EXPECT_FALSE(fs::exists(trash() + "/files/Voice 009 (original).m4a"));
    fs::remove_all(mwPrivateRoot() + "/Sounds");
}

TEST_F(TrimTest, RefusesWhatItCannotCut)
{
    const std::string text = recordingPath("Voice 002.m4a");
    support::writeFile(text, std::string(5000, 'x'));
    support::writeFile(recordingPath("Voice 003.m4a"), _content.substr(0, _content.size() / 2));
    const struct {
        std::string path;
        int begin;
        int end;
        MwTrim::Failure failure;
    } cases[] = {
        {recordingPath("none.m4a"), BEGIN, END, MwTrim::Failure::OTHER},
        {text, BEGIN, END, MwTrim::Failure::DAMAGED},
        {recordingPath("Voice 003.m4a"), BEGIN, END, MwTrim::Failure::DAMAGED},
        {recordingPath("Voice 001.m4a"), END, BEGIN, MwTrim::Failure::OTHER},
        {"", BEGIN, END, MwTrim::Failure::OTHER},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.path);
        const Outcome outcome = trim(true, each.begin, each.end, {}, each.path);
        EXPECT_EQ(1, outcome.events);
        EXPECT_EQ(MwTrim::TRIM_EVENT_FAILED, outcome.event);
        EXPECT_EQ(each.failure, outcome.failure);
    }
    EXPECT_EQ((std::vector<std::string>{"Voice 001.m4a", "Voice 002.m4a", "Voice 003.m4a"}),
        namesIn(support::recordingsDirectory()));
    MwTrim engine;
    EXPECT_FALSE(engine.start(nullptr, false, 0, 1000, LENGTH));
}

TEST_F(TrimTest, CancelEndsItOnceAndLeavesNothing)
{
    for (int i = 0; i < 20; ++i) {
        const Outcome outcome = trim(true, BEGIN, END, [&](MwTrim& engine) {
            ::usleep(static_cast<useconds_t>(i) * 200);
            engine.cancel();
        });
        runUntil([] { return false; }, 0.02);
        EXPECT_EQ(1, outcome.events);
        if (outcome.event == MwTrim::TRIM_EVENT_DONE)
            return; // too late to cancel: done as asked for
        EXPECT_EQ(MwTrim::Failure::CANCELLED, outcome.failure);
        expectWhole(true, {});
    }
}

TEST_F(TrimTest, KeepsAnOriginalThatOthersHaveChangedMeanwhile)
{
    const std::string path = recordingPath("Voice 001.m4a");
    const struct {
        const char* what;
        std::function<void()> change;
        bool overwrite;
        bool succeeds;
    } cases[] = {
        {"renamed", [&] { fs::rename(path, recordingPath("Other.m4a")); }, true, false},
        {"deleted", [&] { fs::remove(path); }, true, false},
        {"replaced", [&] { support::writeFile(path + "~", "new"), fs::rename(path + "~", path); }, true, false},
        {"rewritten", [&] { support::writeFile(path, "rewritten"); }, true, false},
        {"renamed", [&] { fs::rename(path, recordingPath("Other.m4a")); }, false, true},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.what);
        MwTrimStore store(path, each.overwrite);
        ASSERT_TRUE(store.stage());
        support::writeFile(store.getStagedPath(), "result");
        each.change();
        const auto outcome = store.store(_id, {});
        EXPECT_EQ(each.succeeds ? MwTrimStore::Outcome::DONE : MwTrimStore::Outcome::CHANGED, outcome);
        if (fs::exists(path)) {
            EXPECT_NE("result", readFile(path));
        }
        media_content_disconnect();
        prepare();
    }
}

TEST_F(TrimTest, NobodyTakesWhatAnotherInstanceWorksOn)
{
    MwTrimStore first(recordingPath("Voice 001.m4a"), true);
    MwTrimStore second(recordingPath("Voice 001.m4a"), false);
    ASSERT_TRUE(first.stage() && second.stage());
    EXPECT_NE(first.getStagedPath(), second.getStagedPath());
    MwTrimStore::recover(support::recordingsDirectory());
    EXPECT_TRUE(fs::exists(first.getStagedPath()) && fs::exists(second.getStagedPath()));
    // A planted record leads nowhere outside.
    support::writeFile(recordingPath(".mw_trim.0.intent"), "mewlo trim 1\nreplaces 1\nname ../../evil\nend\n");
    support::writeFile(recordingPath(".mw_trim.0"), "planted");
    MwTrimStore::recover(support::recordingsDirectory());
    EXPECT_FALSE(fs::exists(recordingPath(".mw_trim.0.intent")));
}

// Killed before every call that changes a file or the database, then started anew.
TEST_F(TrimTest, SurvivesAKillAtEveryPoint)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer ends forked children that start threads";
#endif
    trim(false);
    const std::string result = readFile(recordingPath("Voice 001_001.m4a"));
    media_content_disconnect();
    for (const bool overwrite : {false, true}) {
        bool isKilled = true;
        int point = 0;
        while (isKilled) {
            SCOPED_TRACE((overwrite ? "over, call " : "new, call ") + std::to_string(++point));
            prepare();
            media_content_disconnect();
            const pid_t child = ::fork();
            if (child == 0) {
                media_content_connect();
                faults::arm("/tmp/", point, faults::Effect::KILL);
                trim(overwrite);
                ::_exit(0);
            }
            int status = 0;
            ::waitpid(child, &status, 0);
            isKilled = WIFSIGNALED(status);
            const std::string now = readFile(recordingPath("Voice 001.m4a"));
            EXPECT_TRUE(now == _content || (overwrite && now == result));
            media_content_connect();
            startAnew();
            expectWhole(overwrite, result);
            EXPECT_TRUE(isKilled || overwrite == (now == result));
            media_content_disconnect();
            if (HasFailure())
                return;
        }
        EXPECT_GT(point, 15);
    }
    media_content_connect();
}

// The same with calls that fail: for a broken and for a full storage.
TEST_F(TrimTest, SurvivesAFailureOfEveryCall)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "no call can be made to fail";
#endif
    trim(false);
    const std::string result = readFile(recordingPath("Voice 001_001.m4a"));
    for (const int error : {EIO, ENOSPC}) {
        for (const bool overwrite : {false, true}) {
            bool isHit = true;
            for (int point = 1; isHit; ++point) {
                SCOPED_TRACE((overwrite ? "over, call " : "new, call ") + std::to_string(point));
                media_content_disconnect();
                prepare();
                faults::arm("/tmp/", point, faults::Effect::FAIL, error);
                const Outcome outcome = trim(overwrite);
                isHit = faults::count() >= point;
                faults::disarm();
                EXPECT_EQ(1, outcome.events);
                const std::string now = readFile(recordingPath("Voice 001.m4a"));
                EXPECT_TRUE(now == _content || (overwrite && now == result));
                EXPECT_EQ(outcome.event == MwTrim::TRIM_EVENT_DONE ? result : _content,
                    outcome.event == MwTrim::TRIM_EVENT_DONE ? readFile(outcome.path) : now);
                startAnew();
                // Without a trash the original goes for good.
                expectWhole(overwrite, result, outcome.event == MwTrim::TRIM_EVENT_DONE);
                if (HasFailure())
                    return;
            }
        }
    }
}

}
