// Deleting and moving recordings on real directories and the real database. The pieces that need two file systems are
// skipped where there is only one.
#include "MwFileOperator.h"

#include <gtest/gtest.h>

#include <Ecore.h>

#include <csignal>
#include <fcntl.h>
#include <memory>
#include <set>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "MwFileName.h"
#include "MwMediaRow.h"
#include "MwMoveRecord.h"
#include "MwStagedFile.h"
#include "MwStorageRoots.h"
#include "support/FaultyCalls.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

namespace fs = std::filesystem;
using support::readFile;
using support::recordingPath;
using support::runUntil;
using support::writeFile;
using Files = std::map<std::string, std::string>;

std::string privateDirectory() { return mwPrivateRoot() + "/Sounds/Mewlo"; }
std::string privatePath(const std::string& name) { return privateDirectory() + "/" + name; }

// Every name, hidden ones included, with its content.
Files filesIn(const std::string& directory)
{
    Files all;
    if (fs::exists(directory))
        for (const auto& entry : fs::directory_iterator(directory))
            all[entry.path().filename()] = readFile(entry.path());
    return all;
}

std::map<std::string, std::string> rows()
{
    std::map<std::string, std::string> idsByPath;
    const auto collect = [](media_info_h media, void* data) {
        char* path = nullptr;
        char* id = nullptr;
        media_info_get_file_path(media, &path);
        media_info_get_media_id(media, &id);
        (*static_cast<std::map<std::string, std::string>*>(data))[mwAdopt(path)] = mwAdopt(id);
        return true;
    };
    media_info_foreach_media_from_db(nullptr, collect, &idsByPath);
    return idsByPath;
}

int bookmarksOf(const std::string& mediaId)
{
    int count = 0;
    media_info_get_bookmark_count_from_db(mediaId.c_str(), nullptr, &count);
    return count;
}

class FileOperatorTest : public testing::Test {
protected:
    FileOperatorTest()
    {
        for (const std::string& root : {mwDeviceRoot(), mwPrivateRoot()})
            fs::remove_all(root + "/Sounds");
        fs::create_directories(support::recordingsDirectory());
        ::setenv("MEWLO_MEDIA_DB", _database.file("media.db").c_str(), 1);
        media_content_connect();
    }
    ~FileOperatorTest() override
    {
        _operator.reset();
        media_content_disconnect();
        ::unsetenv("MEWLO_MEDIA_DB");
    }

    void start(MwFileOperator::Type type, const std::vector<std::string>& paths)
    {
        std::vector<MwFileOperator::Source> sources;
        const auto known = rows();
        for (const std::string& path : paths)
            sources.push_back({path, known.contains(path) ? known.at(path) : std::string()});
        _clashes.clear();
        _finished = 0;
        _operator = std::make_unique<MwFileOperator>(type, sources,
            MwFileOperator::Callbacks{[this] { ++_updates; },
                [this](const std::string& path) {
                    _clashes.push_back(path);
                    if (_answer != MwClashAction::NONE)
                        _operator->answer(_answer);
                },
                [this] { ++_finished; }});
        _operator->start();
    }
    [[nodiscard]] bool finish() const
    {
        return runUntil([this] { return _finished > 0; }, 20);
    }
    bool run(MwFileOperator::Type type, const std::vector<std::string>& paths)
    {
        start(type, paths);
        return finish();
    }

    support::TempDir _database;
    std::unique_ptr<MwFileOperator> _operator;
    MwClashAction _answer = MwClashAction::NONE;
    std::vector<std::string> _clashes;
    int _updates = 0;
    int _finished = 0;
};

TEST_F(FileOperatorTest, MovesFilesThereAndBackWithTheirBookmarks)
{
    const std::string id = support::addRecording("Voice 001.m4a", "one");
    media_bookmark_insert_to_db(id.c_str(), 7, "Bookmark 1");
    support::addRecording("Voice 002.amr", "two");
    ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath("Voice 001.m4a"), recordingPath("Voice 002.amr")}));
    EXPECT_EQ((Files{{"Voice 001.m4a", "one"}, {"Voice 002.amr", "two"}}), filesIn(privateDirectory()));
    EXPECT_EQ(Files(), filesIn(support::recordingsDirectory()));
    EXPECT_EQ(2U, _operator->moved().size());
    EXPECT_EQ(100, _operator->progress().percent());
    EXPECT_GT(_updates, 0);
    ASSERT_TRUE(run(MwFileOperator::REMOVE_FROM_PRIVATE, {privatePath("Voice 001.m4a")}));
    EXPECT_EQ((std::set<std::string>{recordingPath("Voice 001.m4a"), privatePath("Voice 002.amr")}),
        (std::set<std::string>{rows().begin()->first, rows().rbegin()->first}));
    EXPECT_EQ(id, rows()[recordingPath("Voice 001.m4a")]);
    EXPECT_EQ(1, bookmarksOf(id));
}

TEST_F(FileOperatorTest, ClashIsAnsweredByTheUser)
{
    const struct {
        MwClashAction answer;
        Files expected;
        bool leavesSource;
    } cases[] = {
        {MwClashAction::CANCEL, {{"Voice 001.m4a", "old"}, {"Voice 001_001.m4a", "other"}}, true},
        {MwClashAction::REPLACE, {{"Voice 001.m4a", "new"}, {"Voice 001_001.m4a", "other"}}, false},
        {MwClashAction::RENAME,
            {{"Voice 001.m4a", "old"}, {"Voice 001_001.m4a", "other"}, {"Voice 001_002.m4a", "new"}}, false},
    };
    for (const auto& entry : cases) {
        SCOPED_TRACE(static_cast<int>(entry.answer));
        fs::remove_all(privateDirectory());
        const std::string id = support::addRecording("Voice 001.m4a", "new");
        writeFile(privatePath("Voice 001.m4a"), "old");
        writeFile(privatePath("Voice 001_001.m4a"), "other");
        media_content_scan_file(privatePath("Voice 001.m4a").c_str());
        _answer = entry.answer;
        ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath("Voice 001.m4a")}));
        EXPECT_EQ(std::vector{recordingPath("Voice 001.m4a")}, _clashes);
        EXPECT_EQ(entry.expected, filesIn(privateDirectory()));
        EXPECT_EQ(entry.leavesSource, fs::exists(recordingPath("Voice 001.m4a")));
        EXPECT_EQ(1U, _operator->donePaths().size());
        const std::string place = entry.leavesSource ? recordingPath("Voice 001.m4a") : _operator->moved().at(0).to;
        EXPECT_EQ(id, rows()[place]);
    }
}

TEST_F(FileOperatorTest, WhatIsReplacedGoesToTheTrashUnlessItIsPrivate)
{
    const std::string trash = std::string(std::getenv("XDG_DATA_HOME")) + "/Trash";
    _answer = MwClashAction::REPLACE;
    for (const bool intoPrivate : {false, true}) {
        SCOPED_TRACE(intoPrivate);
        fs::remove_all(trash);
        writeFile(recordingPath("a.m4a"), intoPrivate ? "new" : "old");
        writeFile(privatePath("a.m4a"), intoPrivate ? "old" : "new");
        media_content_scan_all();
        const auto type = intoPrivate ? MwFileOperator::MOVE_TO_PRIVATE : MwFileOperator::REMOVE_FROM_PRIVATE;
        ASSERT_TRUE(run(type, {intoPrivate ? recordingPath("a.m4a") : privatePath("a.m4a")}));
        EXPECT_EQ(
            (Files{{"a.m4a", "new"}}), filesIn(intoPrivate ? privateDirectory() : support::recordingsDirectory()));
        EXPECT_EQ(Files(), filesIn(intoPrivate ? support::recordingsDirectory() : privateDirectory()));
        EXPECT_EQ(intoPrivate ? Files() : (Files{{"a.m4a", "old"}}), filesIn(trash + "/files"));
        EXPECT_EQ(1U, rows().size());
    }
    fs::remove_all(trash);
}

TEST_F(FileOperatorTest, AnswerForAllIsAskedForOnce)
{
    std::vector<std::string> paths;
    for (const char* name : {"a.m4a", "b.m4a", "c.m4a"}) {
        support::addRecording(name, "new");
        writeFile(privatePath(name), "old");
        paths.push_back(recordingPath(name));
    }
    start(MwFileOperator::MOVE_TO_PRIVATE, paths);
    ASSERT_TRUE(runUntil([this] { return !_clashes.empty(); }));
    EXPECT_EQ(paths[0], _operator->currentPath());
    _operator->setApplyToAll(true);
    _operator->answer(MwClashAction::RENAME);
    ASSERT_TRUE(finish());
    EXPECT_EQ(1U, _clashes.size());
    EXPECT_EQ(3U, _operator->moved().size());
    EXPECT_EQ("new", readFile(privatePath("c_001.m4a")));
}

TEST_F(FileOperatorTest, EndsOnItsOwnWhateverWaits)
{
    support::addRecording("a.m4a", "new");
    writeFile(privatePath("a.m4a"), "old");
    start(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath("a.m4a")});
    ASSERT_TRUE(runUntil([this] { return !_clashes.empty(); }));
    _operator.reset(); // with the question still open
    EXPECT_EQ("new", readFile(recordingPath("a.m4a")));
    EXPECT_EQ("old", readFile(privatePath("a.m4a")));
    EXPECT_EQ(0, _finished);

    start(MwFileOperator::DELETE, {recordingPath("a.m4a")});
    EXPECT_FALSE(_operator->hasBegun());
    _operator->cancelAndWait(); // before the worker starts
    support::runFor(0.5);
    EXPECT_EQ("new", readFile(recordingPath("a.m4a")));
    EXPECT_TRUE(_operator->donePaths().empty());
}

TEST_F(FileOperatorTest, MissingFileStopsAMoveAndIsSkippedByADelete)
{
    for (const char* name : {"a.m4a", "c.m4a"})
        support::addRecording(name);
    const std::vector<std::string> paths = {recordingPath("a.m4a"), recordingPath("b.m4a"), recordingPath("c.m4a")};
    ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, paths));
    EXPECT_TRUE(_operator->hasFailed());
    EXPECT_EQ(std::vector{paths[0]}, _operator->donePaths());
    EXPECT_EQ(MwFileMover::Trouble::MISSING, _operator->trouble());
    EXPECT_TRUE(fs::exists(paths[2]));
    support::addRecording("a.m4a");
    ASSERT_TRUE(run(MwFileOperator::DELETE, paths));
    EXPECT_EQ((std::vector{paths[0], paths[2]}), _operator->donePaths());
    EXPECT_EQ(Files(), filesIn(support::recordingsDirectory()));
    EXPECT_EQ(std::vector{privatePath("a.m4a")}, std::vector{rows().begin()->first});
}

TEST_F(FileOperatorTest, DeletesIntoTheTrashButPrivateFilesForGood)
{
    const std::string trash = std::string(::getenv("XDG_DATA_HOME")) + "/Trash/files";
    support::addRecording("common.m4a", "common");
    support::addRecording("secret.m4a", "secret");
    ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath("secret.m4a")}));
    ASSERT_TRUE(run(MwFileOperator::DELETE, {recordingPath("common.m4a"), privatePath("secret.m4a")}));
    EXPECT_EQ(std::vector{recordingPath("common.m4a")}, _operator->donePaths());
    EXPECT_EQ(std::vector{privatePath("secret.m4a")}, _operator->withoutTrash());
    EXPECT_FALSE(_operator->hasFailed()) << "it is asked about";
    EXPECT_TRUE(fs::exists(privatePath("secret.m4a")));
    ASSERT_TRUE(run(MwFileOperator::DELETE_FOR_GOOD, {privatePath("secret.m4a")}));
    EXPECT_EQ(1U, _operator->donePaths().size());
    EXPECT_TRUE(rows().empty());
    EXPECT_EQ(Files(), filesIn(privateDirectory()));
    EXPECT_EQ("common", filesIn(trash)["common.m4a"]);
    EXPECT_FALSE(filesIn(trash).contains("secret.m4a"));
}

TEST(FileNameTest, RefusesWhatIsNoNameOfARecording)
{
    for (const std::string& name : {std::string(), std::string("   "), std::string(".hidden"), std::string(".."),
             std::string("."), std::string("a/b"), std::string("two\nlines"), std::string("bell\a"),
             std::string("\x7f"), std::string(252, 'x'), std::string("\0", 1)})
        EXPECT_FALSE(mwIsFileName(name, ".m4a")) << name;
    for (const std::string& name :
        {std::string("Voice 001"), std::string("Übung"), std::string("a..b "), std::string(251, 'x')})
        EXPECT_TRUE(mwIsFileName(name, ".m4a")) << name;
}

TEST_F(FileOperatorTest, HostileNamesTouchNothingElse)
{
    const std::vector<std::string> names = {"\" OR \"1\"=\"1.m4a", "%s%n%d.m4a", "it's; DROP TABLE media.m4a",
        std::string(251, 'x') + ".m4a", "broken\xff\xfe.m4a", "Memo.m4a"};
    const std::string other = support::addRecording("memo.m4a", "other");
    for (const std::string& name : names) {
        SCOPED_TRACE(name);
        const std::string id = support::addRecording(name, "mine");
        writeFile(privatePath(name), "old");
        _answer = MwClashAction::RENAME;
        ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath(name)}));
        ASSERT_EQ(1U, _operator->moved().size());
        const std::string to = _operator->moved()[0].to;
        EXPECT_EQ("mine", readFile(to));
        EXPECT_EQ((std::map<std::string, std::string>{{recordingPath("memo.m4a"), other}, {to, id}}), rows());
        ASSERT_TRUE(run(MwFileOperator::DELETE_FOR_GOOD, {to}));
        EXPECT_EQ("old", readFile(privatePath(name)));
    }
    EXPECT_EQ((Files{{"memo.m4a", "other"}}), filesIn(support::recordingsDirectory()));
}

TEST_F(FileOperatorTest, KilledAtAnyTimeEveryFileIsWholeAndKeepsItsBookmark)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer ends forked children that start threads";
#endif
    std::map<std::string, std::string> ids;
    for (int i = 0; i < 100; ++i) {
        const std::string name = std::to_string(i) + ".m4a";
        ids[name] = support::addRecording(name, name);
        media_bookmark_insert_to_db(ids[name].c_str(), 1, "Bookmark 1");
    }
    media_content_disconnect(); // a connection does not survive a fork
    int killed = 0;
    for (int round = 0; round < 10; ++round) {
        const pid_t child = ::fork();
        if (child == 0) {
            media_content_connect();
            const std::atomic<bool> cancelled = false;
            MwFileMover mover(
                privateDirectory(), 0, cancelled, [](const std::string&) { return MwClashAction::REPLACE; },
                [](uint64_t) {});
            std::string destination;
            for (const auto& [name, id] : ids)
                (void)mover.move(recordingPath(name), destination);
            ::_exit(0);
        }
        ::usleep(static_cast<useconds_t>(4000 + 1000 * round)); // somewhere in the middle
        ::kill(child, SIGKILL);
        int status = 0;
        ::waitpid(child, &status, 0);
        killed += WIFSIGNALED(status) ? 1 : 0;
    }
    EXPECT_GT(killed, 3);
    media_content_connect();
    MwStagedFile::sweep(privateDirectory());
    MwMoveRecord::recover(privateDirectory());
    media_content_scan_all();
    Files all = filesIn(privateDirectory());
    Files stayed = filesIn(support::recordingsDirectory());
    EXPECT_EQ(ids.size(), all.size() + stayed.size()) << "none is there twice";
    all.merge(stayed);
    for (const auto& [name, id] : ids) {
        EXPECT_EQ(name, all[name]);
        EXPECT_EQ(1, bookmarksOf(id)) << name;
    }
}

// Killed before each call that changes a file or the database, in both ways of moving: there is one recording
// afterwards, with its bookmark.
TEST_F(FileOperatorTest, AMoveCutOffAnywhereLeavesOneRecordingNotTwo)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer ends forked children that start threads";
#endif
    std::string elsewhere = "/dev/shm/mewlo-test-XXXXXX";
    ASSERT_NE(nullptr, ::mkdtemp(elsewhere.data()));
    using support::faults::Effect;
    const std::pair<std::string, Effect> cases[] = {{privateDirectory(), Effect::KILL}, {elsewhere, Effect::KILL},
        {privateDirectory(), Effect::FAIL}, {elsewhere, Effect::FAIL}};
    for (const auto& [directory, effect] : cases) {
        bool isCutOff = true;
        int point = 0;
        while (isCutOff) {
            SCOPED_TRACE(directory + (effect == Effect::KILL ? ", killed at call " : ", failing call ")
                + std::to_string(++point));
            fs::remove_all(directory);
            fs::remove_all(support::recordingsDirectory());
            fs::create_directories(directory);
            const std::string id = support::addRecording("a.m4a", "content");
            media_bookmark_insert_to_db(id.c_str(), 1, "Bookmark 1");
            media_content_disconnect();
            const pid_t child = ::fork();
            if (child == 0) {
                media_content_connect();
                support::faults::arm("/", point, effect, EACCES);
                const std::atomic<bool> cancelled = false;
                std::string destination;
                MwFileMover mover(
                    directory, 7, cancelled, [](const std::string&) { return MwClashAction::CANCEL; }, [](uint64_t) {});
                (void)mover.move(recordingPath("a.m4a"), destination);
                ::_exit(support::faults::count() < point ? 0 : 1);
            }
            int status = 0;
            ::waitpid(child, &status, 0);
            isCutOff = status != 0;
            media_content_connect();
            // What the next start does; somebody may have looked at the folders before.
            if (point % 2 == 0)
                media_content_scan_all();
            MwStagedFile::sweep(directory);
            MwMoveRecord::recover(directory);
            media_content_scan_all();
            const Files there = filesIn(directory);
            const Files here = filesIn(support::recordingsDirectory());
            EXPECT_EQ(1U, there.size() + here.size());
            EXPECT_EQ("content", (there.empty() ? here : there).at("a.m4a"));
            int marks = 0;
            for (const auto& [path, row] : rows())
                marks += bookmarksOf(row);
            EXPECT_EQ(1, marks);
            media_info_delete_from_db(id.c_str());
            if (HasFailure())
                break;
        }
        EXPECT_GT(point, 5);
    }
    fs::remove_all(elsewhere);
}

TEST_F(FileOperatorTest, InterruptedMoveIsEndedByTheNextOne)
{
    fs::create_directories(privateDirectory());
    for (const bool rowHasFollowed : {false, true}) {
        SCOPED_TRACE(rowHasFollowed);
        const std::string name = rowHasFollowed ? "a.m4a" : "b.m4a";
        const std::string id = support::addRecording(name, name);
        media_bookmark_insert_to_db(id.c_str(), 1, "Bookmark 1");
        fs::create_hard_link(recordingPath(name), privatePath(name));
        if (rowHasFollowed) {
            ASSERT_EQ(MwMediaRow::Move::DONE, MwMediaRow::move(recordingPath(name), privatePath(name)));
            media_content_scan_file(recordingPath(name).c_str()); // found again, without bookmarks
        }
        ASSERT_TRUE(run(MwFileOperator::MOVE_TO_PRIVATE, {recordingPath(name)}));
        EXPECT_TRUE(_clashes.empty());
        EXPECT_FALSE(fs::exists(recordingPath(name)));
        EXPECT_EQ(name, readFile(privatePath(name)));
        EXPECT_EQ(id, rows()[privatePath(name)]);
        EXPECT_EQ(1, bookmarksOf(id));
    }
}

// Moves between file systems: from the temporary directory to one in memory.
class TwoFileSystemsTest : public FileOperatorTest {
protected:
    void SetUp() override
    {
        std::string pattern = "/dev/shm/mewlo-test-XXXXXX";
        struct stat here { };
        struct stat there { };
        if (::mkdtemp(pattern.data()) != nullptr)
            _other = pattern;
        if (_other.empty() || ::stat(_other.c_str(), &there) != 0 || ::stat(mwDeviceRoot().c_str(), &here) != 0
            || here.st_dev == there.st_dev)
            GTEST_SKIP() << "there is only one file system";
    }
    void TearDown() override
    {
        if (!_other.empty())
            fs::remove_all(_other);
    }
    MwFileMover::Outcome move(const std::string& source, uint64_t total)
    {
        MwFileMover mover(
            _other, total, _cancelled, [this](const std::string&) { return _answer; },
            [this](uint64_t bytes) {
                _reports.push_back(bytes);
                if (_onReport)
                    _onReport();
            });
        return mover.move(source, _destination);
    }

    std::string _other;
    std::string _destination;
    std::atomic<bool> _cancelled = false;
    std::vector<uint64_t> _reports;
    std::function<void()> _onReport;
};

TEST_F(TwoFileSystemsTest, CopyKeepsTimesModeAndBookmarksAndReportsAtItsPace)
{
    std::string content;
    for (int i = 0; content.size() < 409600; ++i)
        content += std::to_string(i);
    content.resize(409600);
    const struct timespec times[2] = {{1000000001, 123456789}, {1100000002, 987654321}};
    std::string id;
    for (const char* name : {"a.m4a", "b.m4a", "c.m4a"}) {
        id = support::addRecording(name, content);
        media_bookmark_insert_to_db(id.c_str(), 3, "Bookmark 1");
        ASSERT_EQ(0, ::utimensat(AT_FDCWD, recordingPath(name).c_str(), times, 0));
        ASSERT_EQ(0, ::chmod(recordingPath(name).c_str(), 0640));
        ASSERT_EQ(MwFileMover::Outcome::MOVED, move(recordingPath(name), 3 * content.size()));
    }
    EXPECT_EQ(12U, _reports.size()); // every 8 chunks, and the rest of each file
    EXPECT_EQ(131072U, _reports[0]);
    EXPECT_EQ(16384U, _reports[3]);
    struct stat status { };
    ASSERT_EQ(0, ::stat(_destination.c_str(), &status));
    EXPECT_EQ(times[1].tv_sec, status.st_mtim.tv_sec);
    EXPECT_EQ(times[1].tv_nsec, status.st_mtim.tv_nsec);
    EXPECT_EQ(times[0].tv_sec, status.st_atim.tv_sec);
    EXPECT_EQ(0640U, status.st_mode & 07777);
    EXPECT_EQ(id, rows()[_destination]);
    EXPECT_EQ(1, bookmarksOf(id));
    EXPECT_EQ((Files{{"a.m4a", content}, {"b.m4a", content}, {"c.m4a", content}}), filesIn(_other));
}

TEST_F(TwoFileSystemsTest, CancelledCopyLeavesTheSourceOnly)
{
    support::addRecording("a.m4a", std::string(2000000, 'a'));
    writeFile(_other + "/a.m4a", "old");
    _answer = MwClashAction::REPLACE;
    _onReport = [this] { _cancelled = true; };
    EXPECT_EQ(MwFileMover::Outcome::FAILED, move(recordingPath("a.m4a"), 2000000));
    EXPECT_EQ(1U, _reports.size());
    EXPECT_EQ((Files{{"a.m4a", "old"}}), filesIn(_other));
    EXPECT_EQ(2000000U, fs::file_size(recordingPath("a.m4a")));
    EXPECT_TRUE(rows().contains(recordingPath("a.m4a")));
}

TEST_F(TwoFileSystemsTest, NameTakenDuringTheCopyIsAClashToo)
{
    support::addRecording("a.m4a", std::string(100000, 'a'));
    _onReport = [this] { writeFile(_other + "/a.m4a", "somebody's"); };
    _answer = MwClashAction::RENAME;
    EXPECT_EQ(MwFileMover::Outcome::MOVED, move(recordingPath("a.m4a"), 100000));
    EXPECT_EQ((Files{{"a.m4a", "somebody's"}, {"a_001.m4a", std::string(100000, 'a')}}), filesIn(_other));
    EXPECT_FALSE(fs::exists(recordingPath("a.m4a")));
}

TEST_F(TwoFileSystemsTest, KilledInTheCopyTheFileIsWholeAndTheRestIsSwept)
{
    const std::string content(3000000, 'a');
    support::addRecording("a.m4a", content);
    writeFile(_other + "/a.m4a", "old");
    _answer = MwClashAction::REPLACE;
    const pid_t child = ::fork();
    if (child == 0) {
        _onReport = [this] {
            if (_reports.size() == 9)
                ::kill(::getpid(), SIGKILL);
        };
        (void)move(recordingPath("a.m4a"), content.size());
        ::_exit(0);
    }
    int status = 0;
    ASSERT_EQ(child, ::waitpid(child, &status, 0));
    ASSERT_TRUE(WIFSIGNALED(status));
    EXPECT_EQ(content, readFile(recordingPath("a.m4a")));
    EXPECT_EQ("old", readFile(_other + "/a.m4a"));
    ASSERT_EQ(2U, filesIn(_other).size()); // and the half of a copy
    int added = 0;
    media_content_scan_folder(_other.c_str(), &added, nullptr);
    EXPECT_EQ(1, added);
    MwStagedFile::sweep(_other);
    EXPECT_EQ((Files{{"a.m4a", "old"}}), filesIn(_other));
}

}
