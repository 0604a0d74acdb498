#include "state/KeyTree.h"

#include "support/RunUntil.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <thread>

#include <sys/wait.h>
#include <unistd.h>

namespace {

using platform::KeyTree;
using support::runFor;
using support::runUntil;

constexpr auto KEY = "memory/sysman/mmc";

class KeyTreeTest : public testing::Test {
protected:
    KeyTree& open()
    {
        _tree = std::make_unique<KeyTree>(live(), pinned(), KeyTree::Durability::MEMORY);
        return *_tree;
    }
    [[nodiscard]] std::string live() const { return _directory.file("live"); }
    [[nodiscard]] std::string pinned() const { return _directory.file("pinned"); }

    support::TempDir _directory;
    std::unique_ptr<KeyTree> _tree;
};

// Writes long values of one letter for ever, in a process of its own.
pid_t startWriter(const std::string& live, char letter)
{
    const pid_t child = ::fork();
    if (child != 0)
        return child;
    KeyTree tree(live, "", KeyTree::Durability::MEMORY);
    const std::string value(3000, letter);
    for (;;)
        tree.write(KEY, value);
}

bool isWhole(const std::optional<std::string>& value)
{
    return value && value->size() == 3000
        && std::all_of(value->begin(), value->end(), [&](char c) { return c == value->front(); });
}

TEST_F(KeyTreeTest, RefusesKeysThatLeaveTheTreeOrNameTemporaries)
{
    KeyTree& tree = open();
    for (const std::string key :
        {"", "/", "/etc/passwd", "../outside", "a/../../outside", "a//b", "a/", ".hidden", "a/.tmp-1", ".", "a/."}) {
        SCOPED_TRACE(key);
        EXPECT_FALSE(tree.write(key, "1"));
        EXPECT_FALSE(tree.pin(key, "1"));
        EXPECT_FALSE(tree.read(key).has_value());
        if (!key.empty()) {
            EXPECT_EQ(0U, tree.watch(key, [](const std::string&) {}));
        }
    }
    EXPECT_FALSE(tree.write(std::string("a\0b", 3), "1"));
    EXPECT_FALSE(std::filesystem::exists(_directory.file("outside")));
}

TEST_F(KeyTreeTest, KeepsValuesOfAnyShape)
{
    KeyTree& tree = open();
    EXPECT_FALSE(tree.read(KEY).has_value());
    for (const std::string value : {"", "1", "two words", "mit Umlaut \xc3\xa4", "line\nbreak"}) {
        EXPECT_TRUE(tree.write(KEY, value));
        EXPECT_EQ(value, tree.read(KEY));
    }
    EXPECT_TRUE(tree.write("MainRecordingState", "2"));
    EXPECT_EQ((std::vector<std::string>{"MainRecordingState", KEY}), tree.keys());
    EXPECT_FALSE(tree.write("MainRecordingState/below", "1")); // a key is no directory
    EXPECT_EQ("2", tree.read("MainRecordingState"));
}

TEST_F(KeyTreeTest, NotifiesSameValueForeignAndShellWrites)
{
    KeyTree& tree = open();
    int calls = 0;
    ASSERT_NE(0U, tree.watch(KEY, [&](const std::string& key) { calls += key == KEY ? 1 : 100; }));
    tree.write(KEY, "1");
    ASSERT_TRUE(runUntil([&] { return calls == 1; }));
    tree.write(KEY, "1");
    ASSERT_TRUE(runUntil([&] { return calls == 2; }));

    EXPECT_TRUE(tree.writeIfDifferent(KEY, "1"));
    EXPECT_TRUE(tree.writeIfDifferent("memory/other", "1"));
    runFor(0.05);
    EXPECT_EQ(2, calls);

    const pid_t child = ::fork();
    if (child == 0)
        ::_exit(KeyTree(live(), "", KeyTree::Durability::DISK).write(KEY, "2") ? 0 : 1);
    ::waitpid(child, nullptr, 0);
    ASSERT_TRUE(runUntil([&] { return calls == 3; }));
    EXPECT_EQ("2", tree.read(KEY));

    ASSERT_EQ(0, std::system(("echo 3 > " + live() + "/" + KEY).c_str()));
    ASSERT_TRUE(runUntil([&] { return calls >= 4; }));
    EXPECT_EQ("3", tree.read(KEY));
}

TEST_F(KeyTreeTest, SeesKeysAndDirectoriesCreatedLater)
{
    KeyTree& tree = open();
    std::vector<std::string> seen;
    tree.watch("a/deep/key", [&](const std::string& key) { seen.push_back(key); });
    std::vector<std::string> all;
    tree.watch("", [&](const std::string& key) { all.push_back(key); });
    tree.write("a/deep/key", "1");
    ASSERT_TRUE(runUntil([&] { return !seen.empty(); }));
    EXPECT_EQ("a/deep/key", all.front());

    // Somebody clears the whole store: later writes are still seen.
    std::filesystem::remove_all(live());
    runFor(0.05);
    seen.clear();
    tree.write("a/deep/key", "2");
    EXPECT_TRUE(runUntil([&] { return !seen.empty(); }));
}

TEST_F(KeyTreeTest, PinHidesLiveWritesUntilUnpinned)
{
    KeyTree& tree = open();
    int calls = 0;
    tree.watch(KEY, [&](const std::string&) { ++calls; });
    tree.write(KEY, "1");
    ASSERT_TRUE(runUntil([&] { return calls == 1; }));
    EXPECT_TRUE(tree.pin(KEY, "5"));
    ASSERT_TRUE(runUntil([&] { return calls == 2; }));
    EXPECT_TRUE(tree.isPinned(KEY));

    tree.write(KEY, "2");
    runFor(0.05);
    EXPECT_EQ(2, calls);
    EXPECT_EQ("5", tree.read(KEY));

    EXPECT_TRUE(tree.unpin(KEY));
    ASSERT_TRUE(runUntil([&] { return calls == 3; }));
    EXPECT_EQ("2", tree.read(KEY));
    EXPECT_FALSE(tree.unpin(KEY));
}

TEST_F(KeyTreeTest, CallbacksMayChangeTheWatches)
{
    KeyTree& tree = open();
    int self = 0;
    int other = 0;
    KeyTree::WatchId own = 0;
    KeyTree::WatchId second = 0;
    own = tree.watch(KEY, [&](const std::string&) {
        ++self;
        tree.unwatch(own);
        tree.unwatch(second);
        tree.watch(KEY, [&](const std::string&) { ++other; });
    });
    second = tree.watch(KEY, [&](const std::string&) { ADD_FAILURE() << "called after its removal"; });
    tree.write(KEY, "1");
    ASSERT_TRUE(runUntil([&] { return self == 1; }));
    tree.write(KEY, "1");
    EXPECT_TRUE(runUntil([&] { return other >= 1; }));
    EXPECT_EQ(1, self);
}

TEST_F(KeyTreeTest, KilledWritersLeaveNeitherTornValuesNorRubbish)
{
    KeyTree& tree = open();
    tree.write(KEY, std::string(3000, 'x'));
    size_t reads = 0;
    for (int round = 0; round < 200; ++round) {
        const pid_t writers[] = {startWriter(live(), 'a'), startWriter(live(), 'b')};
        for (int i = 0; i < 20; ++i, ++reads)
            ASSERT_TRUE(isWhole(tree.read(KEY)));
        for (const pid_t writer : writers) {
            ::kill(writer, SIGKILL);
            ::waitpid(writer, nullptr, 0);
        }
    }
    EXPECT_EQ(4000U, reads);
    EXPECT_EQ(1U, tree.keys().size()); // temporaries are no keys

    const std::string stale = live() + "/memory/sysman/.tmp-1-1-mmc";
    const std::string fresh = live() + "/memory/sysman/.tmp-2-2-mmc";
    support::writeFile(stale, "x");
    support::writeFile(fresh, "x");
    std::filesystem::last_write_time(stale, std::filesystem::file_time_type::clock::now() - std::chrono::minutes(2));
    open();
    EXPECT_FALSE(std::filesystem::exists(stale));
    EXPECT_TRUE(std::filesystem::exists(fresh));
}

TEST_F(KeyTreeTest, LastWriteOfABurstIsReported)
{
    KeyTree& tree = open();
    std::string last;
    tree.watch(KEY, [&](const std::string& key) { last = tree.read(key).value_or(""); });
    std::thread writer([&] {
        for (int i = 0; i <= 2000; ++i)
            tree.write(KEY, std::to_string(i));
    });
    EXPECT_TRUE(runUntil([&] { return last == "2000"; }, 20));
    writer.join();
}

}
