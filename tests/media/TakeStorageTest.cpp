// One recording on a storage that fails, dies or loses what was not flushed: every call, not a chosen one.
#include "media/FileDescriptor.h"
#include "media/RecordingClaims.h"
#include "media/RecordingFile.h"
#include "media/RecordingJournal.h"
#include "support/FaultyCalls.h"
#include "support/TempDir.h"

#include <recorder_leftover.h>

#include <gtest/gtest.h>

#include <map>
#include <new>
#include <set>
#include <sys/mman.h>
#include <sys/wait.h>

namespace {

namespace fs = std::filesystem;
namespace faults = support::faults;
using faults::Effect;

constexpr int FRAMES = 30;
constexpr int FRAMES_PER_FLUSH = 10;
constexpr int SAMPLES_PER_FRAME[] = {0, 1024, 160}; // by format
constexpr int RATES[] = {0, 44100, 8000};

std::string frame(recorder_file_format_e format, int number)
{
    if (format == RECORDER_FILE_FORMAT_AMR)
        return '\x3c' + std::string(31, static_cast<char>('A' + number));
    return std::string(static_cast<size_t>(40 + number), static_cast<char>('A' + number));
}

std::string sound(recorder_file_format_e format, int frames)
{
    std::string all;
    for (int i = 0; i < frames; ++i)
        all += frame(format, i);
    return all;
}

// What a take knows to be in the system's, and in the storage's, hands. Shared with the process that takes.
struct Promise {
    int written = 0;
    int flushed = 0;
    bool isFinished = false;
};

// As the recorder does it, up to the end of its own work; the folder is the test's.
void take(const std::string& path, recorder_file_format_e format, Promise& promise)
{
    int error = media::claimTemporary(path);
    const auto rate = static_cast<uint32_t>(RATES[format]);
    auto file = error == 0 ? media::RecordingFile::create(path, media::makeJournalHeader(format, rate, 1, 64000), error)
                           : nullptr;
    if (!file)
        return;
    for (int i = 0; i < FRAMES; ++i) {
        const std::string next = frame(format, i);
        if (file->append(next.data(), next.size()) != 0)
            break;
        promise.written = i + 1;
        if (i % FRAMES_PER_FLUSH == FRAMES_PER_FLUSH - 1 && file->flush() == 0)
            promise.flushed = i + 1;
        file->growReserve();
    }
    const auto frames = static_cast<uint64_t>(promise.written);
    promise.isFinished = file->finish(frames * static_cast<uint64_t>(SAMPLES_PER_FRAME[format])) == 0;
}

struct Found {
    int count = 0;
    std::string content;
    int duration = 0;
};

Found rescue(const std::string& temporary)
{
    Found found;
    const auto add = [](recorder_leftover_e outcome, const char* path, recorder_file_format_e, int duration,
                         const char*, void* data) {
        auto& all = *static_cast<Found*>(data);
        all.count += outcome == RECORDER_LEFTOVER_EMPTY ? 0 : 1;
        if (outcome == RECORDER_LEFTOVER_REBUILT)
            all = {all.count, support::readFile(path), duration};
    };
    recorder_rescue_leftovers(temporary.c_str(), add, &found);
    return found;
}

// The sound of at least that many frames, whole, and a length that says so.
void expectFrames(const Found& found, recorder_file_format_e format, int least, bool hasHoles)
{
    if (least == 0)
        return;
    ASSERT_EQ(1, found.count);
    int frames = 0;
    while (frames < FRAMES && found.content.find(sound(format, frames + 1)) != std::string::npos)
        ++frames;
    EXPECT_LE(least, frames);
    // An encoder needs up to two frames before the first sound, which are not heard. Holes may follow in an AMR file.
    const double length = 1000.0 * SAMPLES_PER_FRAME[format] / RATES[format];
    EXPECT_LE((frames - 2.1) * length, found.duration);
    if (!hasHoles || format == RECORDER_FILE_FORMAT_MP4) {
        EXPECT_GE((frames + 0.1) * length, found.duration);
    }
}

class TakeStorageTest : public testing::TestWithParam<recorder_file_format_e> {
protected:
    support::TempDir _directory;
    std::string _path = _directory.file(".mw_temp");
};

TEST_P(TakeStorageTest, SurvivesAFailureAndADeathAtEveryCall)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer cannot be stood in front of";
#endif
    void* shared = ::mmap(nullptr, sizeof(Promise), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    ASSERT_NE(MAP_FAILED, shared);
    for (const auto& [effect, error] : {std::pair{Effect::KILL, 0}, {Effect::FAIL, EIO}, {Effect::FAIL, ENOSPC}}) {
        int point = 0;
        for (bool isOver = false; !isOver && !HasFailure();) {
            SCOPED_TRACE((effect == Effect::KILL ? "killed at " : "failing with " + std::to_string(error) + " at ")
                + std::to_string(++point));
            fs::remove_all(_directory.path());
            fs::create_directories(_directory.path());
            auto* promise = new (shared) Promise;
            const pid_t child = ::fork();
            if (child == 0) {
                faults::arm(_directory.path(), point, effect, error);
                take(_path, GetParam(), *promise);
                ::_exit(faults::count() < point ? 0 : 1);
            }
            int status = 0;
            ::waitpid(child, &status, 0);
            isOver = status == 0;
            EXPECT_TRUE(!isOver || (promise->isFinished && promise->written == FRAMES));
            expectFrames(rescue(_path), GetParam(), promise->written, false);
        }
        EXPECT_GT(point, FRAMES);
    }
    ::munmap(shared, sizeof(Promise));
}

// What a storage holds after the power was cut: of each file what was flushed, with some of what was written since.
class Storage {
public:
    explicit Storage(std::string directory)
        : _directory(std::move(directory))
    {
    }
    void take(faults::Deed deed, const std::string& path, off_t at, std::string_view data)
    {
        if (path == _directory) {
            for (const auto& entry : fs::directory_iterator(_directory))
                _names.insert(entry.path().filename());
            return;
        }
        File& file = _files[fs::path(path).filename()];
        if (deed == faults::Deed::FLUSHED) {
            file.flushed = support::readFile(path);
            file.since.clear();
        } else {
            file.since.push_back({deed, static_cast<size_t>(at), std::string(data)});
        }
    }
    // Which of the later writes have arrived all the same: every so many, from the first or the second.
    void leave(const std::string& directory, size_t every, size_t from) const
    {
        fs::remove_all(directory);
        fs::create_directories(directory);
        for (const auto& [name, file] : _files) {
            std::string content = file.flushed;
            for (size_t i = from; every > 0 && i < file.since.size(); i += every)
                apply(file.since[i], content);
            if (_names.contains(name))
                support::writeFile(directory + "/" + name, content);
        }
    }

private:
    struct Change {
        faults::Deed deed;
        size_t at;
        std::string data;
    };
    struct File {
        std::string flushed;
        std::vector<Change> since;
    };
    static void apply(const Change& change, std::string& content)
    {
        if (change.deed == faults::Deed::CUT)
            return content.resize(change.at);
        if (content.size() < change.at + change.data.size())
            content.resize(change.at + change.data.size());
        content.replace(change.at, change.data.size(), change.data);
    }

    std::string _directory;
    std::map<std::string, File> _files;
    std::set<std::string> _names;
};

TEST_P(TakeStorageTest, KeepsWhatWasFlushedWhenThePowerIsCut)
{
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer cannot be stood in front of";
#endif
    Storage storage(_directory.path());
    Promise promise;
    support::TempDir elsewhere;
    int cuts = 0;
    faults::arm(_directory.path(), 0, Effect::COUNT);
    faults::observe([&](faults::Deed deed, const std::string& path, off_t at, std::string_view data) {
        storage.take(deed, path, at, data);
        for (const auto& [every, from] : {std::pair{0, 0}, {1, 0}, {2, 0}, {2, 1}}) {
            SCOPED_TRACE("after call " + std::to_string(++cuts) + ", of the rest " + std::to_string(every) + "/"
                + std::to_string(from));
            const std::string left = elsewhere.file("left");
            storage.leave(left, static_cast<size_t>(every), static_cast<size_t>(from));
            expectFrames(rescue(left + "/.mw_temp"), GetParam(), promise.flushed, every > 1);
        }
    });
    take(_path, GetParam(), promise);
    faults::observe({});
    faults::disarm();
    EXPECT_TRUE(promise.isFinished);
    EXPECT_GT(cuts, FRAMES);
    recorder_release_temporary(_path.c_str());
}

INSTANTIATE_TEST_SUITE_P(Formats, TakeStorageTest, testing::Values(RECORDER_FILE_FORMAT_MP4, RECORDER_FILE_FORMAT_AMR));

}
