#include <gtest/gtest.h>
#include <media_content.h>

#include <vconf.h>

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <functional>
#include <map>
#include <thread>

#include "media/DatabaseReaders.h"
#include "support/Amr.h"
#include "support/DatabaseRows.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

using support::addRecording;
using support::recordingPath;

class MediaDatabaseTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        ::setenv("MEWLO_MEDIA_DB", _directory.file("media.db").c_str(), 1);
        std::filesystem::remove_all(support::deviceRoot() + "/Sounds");
        ASSERT_EQ(0, media_content_connect());
    }
    void TearDown() override
    {
        media_content_disconnect();
        ::unsetenv("MEWLO_MEDIA_DB");
    }
    void reconnect()
    {
        media_content_disconnect();
        ASSERT_EQ(0, media_content_connect());
    }
    // Names, or another text, of the rows that fulfil a condition.
    static std::vector<std::string> names(
        const std::string& condition = "1", int (*text)(media_info_h, char**) = media_info_get_display_name)
    {
        filter_h filter = nullptr;
        media_filter_create(&filter);
        media_filter_set_condition(filter, condition.c_str(), MEDIA_CONTENT_COLLATE_NOCASE);
        media_filter_set_order(filter, MEDIA_CONTENT_ORDER_ASC, "MEDIA_DISPLAY_NAME", MEDIA_CONTENT_COLLATE_DEFAULT);
        std::pair<decltype(text), std::vector<std::string>> found{text, {}};
        const auto collect = [](media_info_h media, void* data) {
            auto* all = static_cast<decltype(found)*>(data);
            char* value = nullptr;
            all->first(media, &value);
            all->second.push_back(mwAdopt(value));
            return true;
        };
        EXPECT_EQ(0, media_info_foreach_media_from_db(filter, collect, &found));
        media_filter_destroy(filter);
        return found.second;
    }
    static std::string idOf(const std::string& name)
    {
        return names("MEDIA_DISPLAY_NAME=\"" + name + "\"", media_info_get_media_id).at(0);
    }
    static int bookmarksOf(const std::string& id)
    {
        int count = -1;
        media_info_get_bookmark_count_from_db(id.c_str(), nullptr, &count);
        return count;
    }
    // Changes that were told, and by which process the last one was made.
    struct Heard {
        int pid = 0;
        int count = 0;
    } _heard;
    void listen()
    {
        _heard = {};
        const auto callback
            = [](media_content_error_e, int pid, media_content_db_update_item_type_e, media_content_db_update_type_e,
                  media_content_type_e, char*, char*, char*, void* data) {
                  auto* heard = static_cast<Heard*>(data);
                  *heard = {pid, heard->count + 1};
              };
        ASSERT_EQ(0, media_content_set_db_updated_cb(callback, &_heard));
    }
    const support::TempDir _directory;
};

using Names = std::vector<std::string>;

TEST_F(MediaDatabaseTest, KeepsOneRowAFileWithKindAndMode)
{
    const std::string first = addRecording("a.M4A");
    EXPECT_EQ(first, addRecording("a.M4A", "longer content")) << "refreshed, not doubled";
    addRecording("b.amr");
    support::writeFile(support::deviceRoot() + "/elsewhere.m4a", "x");
    media_info_h media = nullptr;
    ASSERT_EQ(0, media_info_insert_to_db((support::deviceRoot() + "/elsewhere.m4a").c_str(), &media));
    media_info_destroy(media);
    EXPECT_EQ((Names{"a.M4A", "b.amr"}),
        names("MEDIA_MIME_TYPE=\"audio/AMR\" OR (MEDIA_MIME_TYPE=\"audio/mp4\" AND MEDIA_MODE=10)"));
    EXPECT_EQ(Names{"b.amr"}, names("MEDIA_MIME_TYPE=\"AUDIO/amr\""));
    EXPECT_NE(0, media_info_insert_to_db("/no/such.m4a", &media));
    EXPECT_EQ(nullptr, media);
    reconnect();
    EXPECT_EQ(3u, names().size());
}

TEST_F(MediaDatabaseTest, BookmarksGoWithTheirRecording)
{
    const std::string id = addRecording("a.m4a");
    EXPECT_EQ(0, media_bookmark_insert_to_db(id.c_str(), 9, "late"));
    EXPECT_EQ(0, media_bookmark_insert_to_db(id.c_str(), 3, "early"));
    EXPECT_NE(0, media_bookmark_insert_to_db("no such id", 3, "x"));
    std::string order;
    const auto collect = [](media_bookmark_h bookmark, void* data) {
        char* name = nullptr;
        media_bookmark_get_thumbnail_path(bookmark, &name);
        *static_cast<std::string*>(data) += mwAdopt(name) + " ";
        return true;
    };
    media_info_foreach_bookmark_from_db(id.c_str(), nullptr, collect, &order);
    EXPECT_EQ("early late ", order);
    EXPECT_EQ(0, media_info_delete_from_db(id.c_str()));
    EXPECT_EQ(0, bookmarksOf(id));
}

TEST_F(MediaDatabaseTest, AFileThatReplacesAnotherBringsRowAndBookmarksInOneCommit)
{
    const std::string former = addRecording("a.m4a", "long");
    EXPECT_EQ(0, media_bookmark_insert_to_db(former.c_str(), 9, "of the former"));
    const media_bookmark_entry_s marks[] = {{1, "one"}, {2, "two"}};
    // Whatever fails, in the middle or in the commit itself, leaves all as it was, and the next change succeeds.
    const struct {
        const char* fails;
        const char* undo;
    } failures[] = {
        {"CREATE TRIGGER fails BEFORE INSERT ON bookmark WHEN NEW.BOOKMARK_NAME='two' BEGIN "
         "SELECT RAISE(ABORT, 'no'); END",
            "DROP TRIGGER fails"},
        {"CREATE TABLE late(id REFERENCES media DEFERRABLE INITIALLY DEFERRED); CREATE TRIGGER fails AFTER INSERT ON "
         "bookmark BEGIN INSERT INTO late VALUES('nobody'); END",
            "DROP TRIGGER fails; DROP TABLE late"},
    };
    for (const auto& [fails, undo] : failures) {
        SCOPED_TRACE(fails);
        ASSERT_TRUE(support::execute(fails));
        EXPECT_NE(0, media_info_replace_in_db(former.c_str(), recordingPath("a.m4a").c_str(), marks, 2, nullptr));
        EXPECT_EQ(former, idOf("a.m4a"));
        EXPECT_EQ(1, bookmarksOf(former));
        ASSERT_TRUE(support::execute(undo));
        EXPECT_EQ(0, media_bookmark_insert_to_db(addRecording("other.m4a").c_str(), 1, "x"));
    }
    listen();
    char* id = nullptr;
    ASSERT_EQ(0, media_info_replace_in_db(former.c_str(), recordingPath("a.m4a").c_str(), marks, 2, &id));
    const std::string own = mwAdopt(id);
    EXPECT_NE(former, own);
    EXPECT_EQ(own, idOf("a.m4a"));
    EXPECT_EQ(2, bookmarksOf(own));
    EXPECT_EQ(0, bookmarksOf(former));
    EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0; }));
    EXPECT_EQ(1, _heard.count);
    EXPECT_EQ(0, media_info_replace_in_db(nullptr, recordingPath("a.m4a").c_str(), nullptr, 0, nullptr));
    EXPECT_EQ((Names{"a.m4a", "other.m4a"}), names());
    EXPECT_NE(0, media_info_replace_in_db(nullptr, "/no/such.m4a", nullptr, 0, nullptr));
    media_content_unset_db_updated_cb();
}

TEST_F(MediaDatabaseTest, ADamagedDatabaseIsSetAsideAndRebuiltFromTheFiles)
{
    addRecording("a.m4a");
    media_content_disconnect();
    support::writeFile(_directory.file("media.db"), std::string(8192, 'x'));
    ASSERT_EQ(0, media_content_connect());
    EXPECT_EQ(Names{"a.m4a"}, names());
    int aside = 0;
    for (const auto& entry : std::filesystem::directory_iterator(_directory.path()))
        aside += entry.path().filename().string().find("media.db.damaged-") == 0 ? 1 : 0;
    EXPECT_EQ(1, aside);
}

TEST_F(MediaDatabaseTest, DamageFoundInTheMiddleIsRepairedToo)
{
    for (int i = 0; i < 200; ++i)
        support::writeFile(recordingPath("r" + std::to_string(1000 + i) + ".m4a"), "x");
    media_content_scan_folder(support::recordingsDirectory().c_str(), nullptr, nullptr);
    media_content_disconnect(); // also writes the log back into the file
    std::string content = support::readFile(_directory.file("media.db"));
    ASSERT_LT(20000u, content.size());
    std::fill(content.begin() + 4096, content.end(), 'x'); // all but the first page
    support::writeFile(_directory.file("media.db"), content);
    ASSERT_EQ(0, media_content_connect());
    EXPECT_NE("", addRecording("new.m4a"));
    EXPECT_EQ(201u, names().size());
}

// Damage of every kind, and whatever else may be found in the place of the database: the bookmarks are there
// afterwards, from what can still be read or from the good copy.
TEST_F(MediaDatabaseTest, BookmarksSurviveWhateverHappensToTheDatabase)
{
    constexpr int RECORDINGS = 60;
    constexpr int MARKS = 4;
    const std::string path = _directory.file("media.db");
    for (int i = 0; i < RECORDINGS; ++i) {
        const std::string id = addRecording("r" + std::to_string(100 + i) + ".m4a");
        for (unsigned int mark = 0; mark < MARKS; ++mark)
            media_bookmark_insert_to_db(id.c_str(), mark * 10, ("a bookmark " + std::to_string(mark)).c_str());
    }
    media_content_disconnect();
    const std::string good = support::readFile(path);
    const std::string copy = support::readFile(path + ".good");
    ASSERT_GT(good.size(), 20000u);
    ASSERT_FALSE(copy.empty());

    struct Case {
        std::string what;
        std::function<void()> damage;
        bool needsCopy;
    };
    std::vector<Case> cases;
    const auto write = [&](const std::string& content) { return [=] { support::writeFile(path, content); }; };
    const auto change = [&](const char* sql) { return [=] { EXPECT_TRUE(support::execute(sql)); }; };
    for (size_t size = 0; size < good.size(); size += good.size() / 9 + 1)
        cases.push_back({"cut to " + std::to_string(size), write(good.substr(0, size)), true});
    for (size_t page = 0; page * 4096 < good.size(); ++page) {
        std::string zeroed = good;
        zeroed.replace(page * 4096, 4096, std::string(4096, '\0'));
        cases.push_back({"zeroed page " + std::to_string(page), write(zeroed), true});
    }
    unsigned int seed = 5;
    for (int i = 0; i < 60; ++i) {
        seed = seed * 1103515245 + 12345;
        std::string flipped = good;
        flipped[(seed >> 4) % flipped.size()] ^= static_cast<char>(1 << (seed >> 29));
        const size_t place = (seed >> 4) % flipped.size();
        cases.push_back({"flipped bit " + std::to_string(place), write(flipped), place < 4096}); // names the tables
    }
    cases.push_back({"no column", change("ALTER TABLE media DROP COLUMN MEDIA_STORAGE"), false});
    cases.push_back({"a later version", change("PRAGMA user_version=99"), false});
    cases.push_back({"before there were versions", change("PRAGMA user_version=0; DROP TABLE waveform"), false});
    cases.push_back({"another program's", change("DROP TABLE media; CREATE TABLE media(x)"), true});
    cases.push_back({"a folder", [=] { std::filesystem::create_directory(path); }, true});
    cases.push_back({"a pipe", [=] { ASSERT_EQ(0, ::mkfifo(path.c_str(), 0600)); }, true});
    cases.push_back({"a link to nowhere", [=] { std::filesystem::create_symlink("/nowhere/at.all", path); }, true});

    for (const bool hasCopy : {true, false}) {
        int kept = 0;
        for (const Case& each : cases) {
            SCOPED_TRACE(each.what + (hasCopy ? "" : ", without a copy"));
            for (const auto& entry : std::filesystem::directory_iterator(_directory.path()))
                std::filesystem::remove_all(entry);
            support::writeFile(path, good);
            const bool isOther = each.what.starts_with("a folder") || each.what.starts_with("a pipe")
                || each.what.starts_with("a link");
            if (isOther)
                std::filesystem::remove(path);
            if (hasCopy)
                support::writeFile(path + ".good", copy);
            each.damage();
            ASSERT_EQ(0, media_content_connect());
            EXPECT_EQ(static_cast<size_t>(RECORDINGS), names().size());
            EXPECT_NE("", addRecording("r100.m4a", "changed")) << "it can be written to";
            support::writeFile(recordingPath("r100.m4a"), "x");
            // What shows in no call is found in a quiet moment.
            media_content_disconnect();
            ASSERT_EQ(0, media_content_connect());
            int marks = 0;
            for (const std::string& id : names("1", media_info_get_media_id))
                marks += bookmarksOf(id);
            // One flipped bit may spoil the row that it is in.
            const int least = hasCopy || !each.needsCopy ? RECORDINGS * MARKS - MARKS : 0;
            EXPECT_GE(marks, least);
            EXPECT_LE(marks, RECORDINGS * MARKS + 1);
            kept += marks;
            media_content_disconnect();
            if (HasFailure())
                break;
        }
        EXPECT_GT(kept, static_cast<int>(cases.size()) * RECORDINGS * MARKS * (hasCopy ? 98 : 70) / 100);
    }
    media_content_connect();
}

// Run by the test below in a process of its own.
TEST(MediaDatabaseWriter, DISABLED_InsertsOneFile)
{
    ASSERT_EQ(0, media_content_connect());
    media_info_h media = nullptr;
    EXPECT_EQ(0, media_info_insert_to_db(std::getenv("MEWLO_TEST_FOREIGN_FILE"), &media));
    media_info_destroy(media);
    media_content_disconnect();
}

TEST_F(MediaDatabaseTest, OtherProcessesAreToldOfCommits)
{
    support::writeFile(recordingPath("foreign.m4a"), "x");
    listen();
    // The writer is a fresh process: a database connection must not cross a fork.
    ::setenv("MEWLO_TEST_FOREIGN_FILE", recordingPath("foreign.m4a").c_str(), 1);
    const pid_t child = ::fork();
    if (child == 0) {
        ::execl("/proc/self/exe", "writer", "--gtest_filter=MediaDatabaseWriter.*", "--gtest_also_run_disabled_tests",
            static_cast<char*>(nullptr));
        ::_exit(1);
    }
    int status = -1;
    ::waitpid(child, &status, 0);
    ASSERT_EQ(0, status);
    EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0; }));
    EXPECT_EQ(child, _heard.pid);
    EXPECT_EQ(Names{"foreign.m4a"}, names());
    media_content_unset_db_updated_cb();
}

TEST_F(MediaDatabaseTest, IsWatchedFromTheVeryFirstStart)
{
    media_content_disconnect();
    for (int i = 0; i < 20; ++i) {
        // The folder of the database does not exist yet, and the database opens beside the caller.
        ::setenv("MEWLO_MEDIA_DB", _directory.file(std::to_string(i) + "/a/media.db").c_str(), 1);
        ASSERT_EQ(0, media_content_connect());
        listen();
        addRecording("a.m4a");
        EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0; }));
        media_content_unset_db_updated_cb();
        media_content_disconnect();
    }
    ASSERT_EQ(0, media_content_connect());
}

TEST_F(MediaDatabaseTest, RowsOfACardThatIsOutWaitForItThoseOfADeletedFolderGo)
{
    const std::string card = std::string(std::getenv("MEWLO_CARD_ROOT")) + "/Sounds";
    const std::string onCard = card + "/Mewlo/c.m4a";
    support::writeFile(onCard, "x");
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    media_content_scan_all();
    addRecording("a.m4a");
    ASSERT_EQ((Names{"a.m4a", "c.m4a"}), names());
    const std::string id = idOf("c.m4a");
    EXPECT_EQ(0, media_bookmark_insert_to_db(id.c_str(), 7, "Here"));
    listen();
    std::filesystem::rename(card, card + "-out");
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
    EXPECT_EQ(Names{"a.m4a"}, names());
    EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0 && _heard.pid == 0; }));
    std::filesystem::remove_all(support::recordingsDirectory());
    media_content_scan_all();
    EXPECT_EQ(Names{}, names());
    std::filesystem::rename(card + "-out", card);
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    media_content_scan_all();
    EXPECT_EQ(Names{"c.m4a"}, names());
    EXPECT_EQ(id, idOf("c.m4a"));
    EXPECT_EQ(1, bookmarksOf(id));
    media_content_unset_db_updated_cb();
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
    std::filesystem::remove_all(card);
}

TEST_F(MediaDatabaseTest, AFileBringsItsBookmarksWhereverItArrives)
{
    const auto file = [](const std::string& name) { return recordingPath(name + ".m4a"); };
    const auto move = [&](const char* from, const char* to) { std::filesystem::rename(file(from), file(to)); };
    const auto write = [&](const std::string& name, const std::string& content) {
        support::writeFile(file(name), content);
        std::filesystem::last_write_time(
            file(name), std::filesystem::file_time_type::clock::now() - std::chrono::hours(content.size()));
    };
    struct Case {
        const char* what;
        std::function<void()> change;
        std::map<std::string, std::string> owners; // of the bookmarks, by name afterwards; "" for none
    };
    const Case cases[] = {
        {"overwritten", [&] { move("b", "a"); }, {{"a", "b"}}},
        {"swapped",
            [&] {
                move("a", "x");
                move("b", "a");
                move("x", "b");
            },
            {{"a", "b"}, {"b", "a"}}},
        {"made way for another",
            [&] {
                move("a", "c");
                write("a", "another");
            },
            {{"a", ""}, {"b", "b"}, {"c", "a"}}},
        {"other case", [&] { move("a", "B"); }, {{"B", "a"}, {"b", "b"}}},
        {"same size, another time",
            [&] {
                std::filesystem::remove(file("a"));
                support::writeFile(file("c"), "1");
            },
            {{"b", "b"}, {"c", ""}}},
        {"changed", [&] { write("a", "longer"); }, {{"a", "a"}, {"b", "b"}}},
    };
    for (const Case& each : cases) {
        SCOPED_TRACE(each.what);
        std::filesystem::remove_all(support::recordingsDirectory());
        media_content_scan_all();
        std::map<std::string, std::string> ids;
        write("a", "1");
        write("b", "22");
        media_content_scan_all();
        for (const char* name : {"a", "b"}) {
            ids[name] = idOf(std::string(name) + ".m4a");
            media_bookmark_insert_to_db(ids[name].c_str(), 1, name);
        }
        each.change();
        media_content_scan_all();
        EXPECT_EQ(each.owners.size(), names().size());
        for (const auto& [name, owner] : each.owners) {
            const auto found = names("MEDIA_PATH=\"" + file(name) + "\" COLLATE BINARY", media_info_get_media_id);
            ASSERT_EQ(1U, found.size()) << name;
            EXPECT_EQ(owner.empty() ? 0 : 1, bookmarksOf(found[0])) << name;
            EXPECT_EQ(owner.empty(), ids[owner] != found[0]) << name;
        }
    }
}

TEST_F(MediaDatabaseTest, ScanningKnowsWhatIsARecording)
{
    addRecording("a.m4a");
    int removed = -1;
    support::writeFile(recordingPath(".hidden.m4a"), "x");
    support::writeFile(recordingPath("notes.txt"), "x");
    support::writeFile(recordingPath("\xff\xfe.m4a"), "no UTF-8");
    int added = 0;
    media_content_scan_folder(support::recordingsDirectory().c_str(), &added, &removed);
    EXPECT_EQ(1, added);
    EXPECT_EQ(0, removed);
    EXPECT_EQ(2u, names().size());
}

// What happens in the folders from outside: files come, change, go, and are renamed.
TEST_F(MediaDatabaseTest, FollowsTheFilesWhileWatched)
{
    listen();
    const auto become
        = [&](const Names& expected) { return support::runUntil([&] { return names() == expected; }, 2.0); };
    std::filesystem::remove_all(support::deviceRoot() + "/Sounds");
    support::runFor(0.5); // the watch moves up to the nearest folder that is left
    std::filesystem::create_directories(support::recordingsDirectory());
    support::runFor(0.5);
    support::writeFile(recordingPath("a.m4a"), "x");
    EXPECT_TRUE(become({"a.m4a"}));
    EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0; }));

    const std::string id = idOf("a.m4a");
    EXPECT_EQ(0, media_bookmark_insert_to_db(id.c_str(), 7, "Here"));
    std::filesystem::rename(recordingPath("a.m4a"), recordingPath("b.m4a"));
    EXPECT_TRUE(become({"b.m4a"}));
    EXPECT_EQ(id, idOf("b.m4a"));
    EXPECT_EQ(1, bookmarksOf(id));

    std::filesystem::remove(recordingPath("b.m4a"));
    EXPECT_TRUE(become({}));
    media_content_unset_db_updated_cb();
}

TEST_F(MediaDatabaseTest, NobodyWhoReadsWaitsForAScan)
{
    const std::string id = addRecording("a.m4a");
    ASSERT_TRUE(
        support::execute("CREATE TRIGGER slow AFTER INSERT ON media BEGIN SELECT count(*) FROM (WITH RECURSIVE "
                         "c(x) AS (SELECT 1 UNION ALL SELECT x + 1 FROM c LIMIT 4000000) SELECT x FROM c); END"));
    support::writeFile(recordingPath("b.m4a"), "x");
    std::atomic<bool> hasEnded = false;
    std::thread scanner([&] {
        media_content_scan_all();
        hasEnded = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(100)); // it writes by now
    const Names before = names();
    EXPECT_EQ(0, bookmarksOf(id));
    EXPECT_FALSE(hasEnded);
    EXPECT_EQ(Names{"a.m4a"}, before);
    scanner.join();
    EXPECT_EQ((Names{"a.m4a", "b.m4a"}), names());
}

TEST_F(MediaDatabaseTest, NobodyWhoReadsWaitsForAnotherReader)
{
    addRecording("a.m4a");
    media::DatabaseReaders readers(support::databasePath());
    const auto nothing = [](sqlite3*) { return SQLITE_OK; };
    EXPECT_EQ(std::nullopt, readers.read(nothing));
    readers.allow();
    std::optional<int> other;
    std::thread closer;
    std::atomic<bool> isClosed = false;
    readers.read([&](sqlite3*) {
        std::thread([&] { other = readers.read(nothing); }).join(); // while this one reads
        closer = std::thread([&] {
            readers.close();
            isClosed = true;
        });
        while (readers.read(nothing)) // until the closing has begun
            std::this_thread::yield();
        EXPECT_FALSE(isClosed);
        return SQLITE_OK;
    });
    EXPECT_EQ(SQLITE_OK, other);
    closer.join();
}

TEST_F(MediaDatabaseTest, AnUnknownLengthIsAskedForByScansOnly)
{
    addRecording("a.amr", support::wideAmr(50));
    addRecording("b.amr", "no sound");
    ASSERT_TRUE(support::execute("UPDATE media SET MEDIA_DURATION=-1"));
    const auto lengths = [] {
        std::vector<int> found;
        const auto collect = [](media_info_h media, void* data) {
            audio_meta_h meta = nullptr;
            int length = -1;
            EXPECT_EQ(0, media_info_get_audio(media, &meta));
            audio_meta_get_duration(meta, &length);
            audio_meta_destroy(meta);
            static_cast<std::vector<int>*>(data)->push_back(length);
            return true;
        };
        media_info_foreach_media_from_db(nullptr, collect, &found);
        std::sort(found.begin(), found.end());
        return found;
    };
    EXPECT_EQ((std::vector<int>{0, 0}), lengths());
    listen();
    media_content_scan_all();
    EXPECT_EQ((std::vector<int>{0, 1000}), lengths());
    EXPECT_TRUE(support::runUntil([&] { return _heard.count > 0; }));
    _heard = {};
    media_content_scan_all();
    support::runFor(0.2);
    EXPECT_EQ(0, _heard.count) << "nothing new was found";
    media_content_unset_db_updated_cb();
}

TEST_F(MediaDatabaseTest, AScanWaitsForAFileThatIsBeingChanged)
{
    const std::string id = addRecording("a.m4a");
    files_lock_h lock = nullptr;
    ASSERT_EQ(0, media_content_lock_files(&lock));
    std::filesystem::rename(recordingPath("a.m4a"), recordingPath("b.m4a"));
    std::thread scanner([] { media_content_scan_all(); });
    std::this_thread::sleep_for(std::chrono::milliseconds(50)); // it has looked by now and waits
    media_info_h media = nullptr;
    ASSERT_EQ(0, media_info_get_media_from_db(id.c_str(), &media));
    EXPECT_EQ(0, media_info_move_to_db(media, recordingPath("b.m4a").c_str()));
    media_info_destroy(media);
    media_content_unlock_files(lock);
    scanner.join();
    EXPECT_EQ(id, idOf("b.m4a"));
    EXPECT_EQ(Names{"b.m4a"}, names());
}

}
