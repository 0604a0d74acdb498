// The cutter against sound that another program decodes: what is cut is what was there.
#include <video_edit.h>

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <cstdlib>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

#include "media/FileDescriptor.h"
#include "media/Mp4Movie.h"
#include "support/Amr.h"
#include "support/RunUntil.h"
#include "support/TempDir.h"

namespace {

using support::TempDir;

constexpr int LONGEST_FRAME = 4096; // samples: ffmpeg plays the last one to its end

std::atomic<int> error = 0;
std::atomic<bool> isDone = false;

bool shell(const std::string& command) { return std::system(command.c_str()) == 0; }

// Mono samples as ffmpeg hears them.
std::vector<int16_t> decode(const std::string& file, const TempDir& directory, const std::string& filter = {})
{
    const std::string raw = directory.file("raw");
    const std::string command = "ffmpeg -v error -y -i '" + file + "' " + filter + " -map 0:a -ac 1 -f s16le " + raw
        + " </dev/null 2>/dev/null";
    if (!shell(command))
        return {};
    const std::string bytes = support::readFile(raw);
    std::vector<int16_t> samples(bytes.size() / 2);
    std::copy_n(bytes.data(), samples.size() * 2, reinterpret_cast<char*>(samples.data()));
    return samples;
}

class TrimCutTest : public testing::Test {
protected:
    TrimCutTest()
    {
        video_edit_init();
        video_edit_set_error_received_cb([](int code) {
            error = code;
            isDone = true;
        });
        video_edit_set_state_changed_cb([](int state) { isDone = state == VIDEO_EDIT_STATE_END_OF_STREAM; });
    }
    ~TrimCutTest() override { video_edit_deinit(); }

    // White noise, with which no shift goes unseen (but not AAC's own, which a decoder makes up anew each time).
    bool make(const std::string& name, const std::string& codec, int seconds = 6, int rate = 44100)
    {
        return shell("ffmpeg -v error -y -f lavfi -i anoisesrc=d=" + std::to_string(seconds)
            + ":r=" + std::to_string(rate) + ":a=0.4:c=white -ac 1 " + codec + " '" + file(name) + "'");
    }
    [[nodiscard]] std::string file(const std::string& name) const { return _directory.file(name); }

    // 0, or the engine's error.
    int cut(const std::string& from, const std::string& to, int begin, int end)
    {
        error = 0;
        isDone = false;
        ::close(::open(file(to).c_str(), O_RDWR | O_CREAT | O_TRUNC, 0600));
        const std::string path = file(from);
        const video_edit_clip_s clip{path.c_str(), 0, begin, end};
        const video_edit_project_s project{&clip};
        int result = video_edit_prepare(VIDEO_EDIT_PROJECT_SOUND, &project);
        if (result == 0)
            result = video_edit_export(file(to).c_str());
        if (result != 0) {
            video_edit_unprepare();
            return result;
        }
        EXPECT_TRUE(support::runUntil([] { return isDone.load(); }, 20));
        video_edit_unprepare();
        return error;
    }

    // Compares with the same stretch of the source, from a sample on, as far as `slack` samples allow.
    void expectSame(const std::string& from, const std::string& to, int begin, int end, int rate, int slack)
    {
        const auto whole = decode(file(from), _directory);
        const auto part = decode(file(to), _directory);
        const auto first = static_cast<long>(std::lround(begin * rate / 1000.0));
        const auto wanted = static_cast<long>(std::lround(end * rate / 1000.0)) - first;
        EXPECT_NEAR(static_cast<double>(part.size()), static_cast<double>(wanted), slack + LONGEST_FRAME);
        ASSERT_GE(
            static_cast<long>(part.size()), std::min<long>(wanted, static_cast<long>(whole.size()) - first) - slack);
        // The shift that fits best, within the slack; then all of it has to fit.
        long best = 0;
        double least = 1e30;
        const long length = std::min<long>(wanted, static_cast<long>(part.size())) - slack - 8;
        const auto differenceAt = [&](long shift, long from_, long count) {
            double sum = 0;
            for (long i = from_; i < from_ + count; ++i) {
                const long at = first + i + shift;
                const double value
                    = at >= 0 && at < static_cast<long>(whole.size()) ? whole[static_cast<size_t>(at)] : 0;
                sum += std::abs(value - part[static_cast<size_t>(i)]);
            }
            return sum / static_cast<double>(count);
        };
        const long probe = std::min<long>(length / 2, 4000);
        for (long shift = -slack; shift <= slack; ++shift) {
            const double difference = differenceAt(shift, length / 2, std::min<long>(probe, length - length / 2));
            if (difference < least) {
                least = difference;
                best = shift;
            }
        }
        EXPECT_LT(least, slack == 0 ? 0.5 : 40.0) << "from sample " << length / 2;
        if (slack == 0) {
            EXPECT_LT(differenceAt(best, 0, length), 0.5) << "as a whole";
        }
    }

    TempDir _directory;
};

TEST_F(TrimCutTest, CutsOurFormatsToTheSample)
{
    ASSERT_TRUE(make("a.m4a", "-c:a aac -aac_pns 0"));
    ASSERT_TRUE(make("b.m4a", "-c:a aac -aac_pns 0 -movflags +faststart -metadata title=Hello", 6, 48000));
    ASSERT_TRUE(make("c.m4a", "-c:a alac"));
    const struct {
        int begin;
        int end;
    } ranges[] = {{0, 1000}, {1234, 4321}, {0, 6000}, {5000, 6000}, {1161, 1184}, {10, 33}, {2000, 2001}};
    for (const auto& [name, rate] : {std::pair("a.m4a", 44100), {"b.m4a", 48000}, {"c.m4a", 44100}}) {
        for (const auto& range : ranges) {
            SCOPED_TRACE(std::string(name) + " " + std::to_string(range.begin) + "-" + std::to_string(range.end));
            ASSERT_EQ(0, cut(name, "out.m4a", range.begin, range.end));
            expectSame(name, "out.m4a", range.begin, range.end, rate, 0);
        }
    }
    EXPECT_TRUE(shell("ffprobe -v error -show_format '" + file("b.m4a") + "' | grep -q TAG:title=Hello"));
    // A cut of a cut is as good.
    ASSERT_EQ(0, cut("a.m4a", "once.m4a", 1000, 5000));
    ASSERT_EQ(0, cut("once.m4a", "twice.m4a", 1000, 3000));
    expectSame("a.m4a", "twice.m4a", 2000, 4000, 44100, 0);
}

TEST_F(TrimCutTest, CutsAmrAtItsFrames)
{
    ASSERT_TRUE(support::makeAmr(file("a.amr"), 6));
    const std::string source = support::readFile(file("a.amr"));
    ASSERT_EQ(0, cut("a.amr", "out.amr", 1010, 3009));
    const size_t frame = (source.size() - 6) / 300;
    EXPECT_EQ("#!AMR\n" + source.substr(6 + 51 * frame, 99 * frame), support::readFile(file("out.amr")));
    // Frames of changing size, wide band, and a torn one at the end.
    std::string wide = "#!AMR-WB\n";
    for (int i = 0; i < 1000; ++i)
        wide += i % 3 == 0 ? std::string("\x44") + std::string(60, 'x') : std::string("\x04") + std::string(17, 'y');
    support::writeFile(file("w.amr"), wide + std::string("\x44half"));
    ASSERT_EQ(0, cut("w.amr", "out.amr", 40, 100));
    EXPECT_EQ("#!AMR-WB\n" + wide.substr(9 + 61 + 18, 18) + wide.substr(9 + 61 + 36, 61 + 18),
        support::readFile(file("out.amr")).substr(0, 9 + 18 + 61 + 18));
}

TEST_F(TrimCutTest, CutsWhatOthersHaveRecorded)
{
    const struct {
        const char* name;
        const char* codec;
        int slack; // samples
    } cases[] = {
        {"fragments.m4a",
            "-c:a aac -aac_pns 0 -movflags frag_keyframe+empty_moov+default_base_moof -frag_duration 500000", 1200},
        {"a.mp3", "-c:a libmp3lame -b:a 128k -metadata title=Hello", 1300},
        {"a.ogg", "-c:a libvorbis", 1300},
        {"a.opus.ogg", "-c:a libopus -ar 48000", 1300},
        {"a.flac", "-c:a flac -metadata title=Hello", 0},
        {"a.wav", "-c:a pcm_s16le", 0},
        {"a.aac", "-c:a aac -aac_pns 0 -f adts", 2200},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.name);
        const int rate = std::string(each.name).find("opus") != std::string::npos ? 48000 : 44100;
        ASSERT_TRUE(make(each.name, each.codec, 6, rate));
        const std::string out = std::string("out") + (std::string(each.name).substr(std::string(each.name).rfind('.')));
        ASSERT_EQ(0, cut(each.name, out, 1500, 4500));
        expectSame(each.name, out, 1500, 4500, rate, each.slack);
        ASSERT_EQ(0, cut(each.name, out, 0, 1000));
        const bool hasTitle = std::string(each.codec).find("Hello") != std::string::npos;
        EXPECT_TRUE(!hasTitle || shell("ffprobe -v error -show_format '" + file(out) + "' | grep -qi TAG:title=Hello"));
    }
}

TEST_F(TrimCutTest, ReadsSeveralChunksEditsAndLongOffsets)
{
    // As a device with little memory writes it: chunks of a second, with other data in between.
    ASSERT_TRUE(make("a.mp4", "-f lavfi -i testsrc=d=6:s=16x16:r=5 -map 0:a -map 1:v -c:a aac -aac_pns 0 -c:v mpeg4"));
    ASSERT_TRUE(shell("ffmpeg -v error -y -i '" + file("a.mp4") + "' -map 0:a -c copy '" + file("one.m4a") + "'"));
    const media::FileDescriptor whole(::open(file("one.m4a").c_str(), O_RDONLY));
    const auto movie = media::Mp4Movie::read(whole.get());
    ASSERT_TRUE(movie);
    // Two pieces with silence between them, in one file made by hand from parts of another.
    media::Mp4Part part{0, movie->frames(), {{false, 44100, 44100}, {true, 0, 22050}, {false, 132300, 44100}}};
    const std::string source = support::readFile(file("one.m4a"));
    std::string data;
    for (const auto& range : movie->bytesOf(0, movie->frames()))
        data += source.substr(range.offset, range.size);
    const std::string head = movie->fileType() + std::string("\0\0\0\1mdat\0\0\0\0", 12);
    std::string size;
    for (int shift = 24; shift >= 0; shift -= 8)
        size.push_back(static_cast<char>((data.size() + 16) >> shift));
    support::writeFile(file("edits.m4a"), head + size + data + movie->indexOf(part, head.size() + 4));
    const media::FileDescriptor edited(::open(file("edits.m4a").c_str(), O_RDONLY));
    const auto edits = media::Mp4Movie::read(edited.get());
    ASSERT_TRUE(edits);
    EXPECT_EQ(44100u * 2 + 22050, edits->length());
    ASSERT_EQ(0, cut("edits.m4a", "out.m4a", 500, 2000));
    const media::FileDescriptor result(::open(file("out.m4a").c_str(), O_RDONLY));
    const auto out = media::Mp4Movie::read(result.get());
    ASSERT_TRUE(out);
    EXPECT_EQ(66150u, out->length());
    EXPECT_EQ(3u, out->pieces().size());
    EXPECT_EQ(22050u, out->pieces()[0].length);
    EXPECT_TRUE(out->pieces()[1].isSilence);
    // Only silence is no recording.
    EXPECT_EQ(VIDEO_EDIT_ERROR_NOT_SUPPORTED, cut("edits.m4a", "none.m4a", 1100, 1400));
    // A film has more than one track: it is cut, or refused, but never spoiled.
    const int film = cut("a.mp4", "film.m4a", 1000, 3000);
    EXPECT_TRUE(film == 0 || film == VIDEO_EDIT_ERROR_NOT_SUPPORTED);
    EXPECT_TRUE(film != 0 || !decode(file("film.m4a"), _directory).empty());
}

// Twelve hours, nearly all of it a hole.
TEST_F(TrimCutTest, CutsTwelveHoursAndIsCancelledAtOnce)
{
    constexpr uint64_t FRAMES = 12ull * 3600 * 44100 / 1024;
    constexpr uint32_t FRAME = 3000; // above 4 GiB in all
    ASSERT_TRUE(make("a.m4a", "-c:a aac -aac_pns 0", 1));
    const media::FileDescriptor small(::open(file("a.m4a").c_str(), O_RDONLY));
    const auto movie = media::Mp4Movie::read(small.get());
    ASSERT_TRUE(movie);
    const auto u32 = [](uint64_t value) {
        std::string out;
        for (int shift = 24; shift >= 0; shift -= 8)
            out.push_back(static_cast<char>(value >> shift));
        return out;
    };
    const auto box
        = [&](const std::string& type, const std::string& content) { return u32(content.size() + 8) + type + content; };
    const std::string index = movie->indexOf(*movie->part(0, 44100), 48);
    const size_t at = index.find("stsd") - 4;
    const std::string stsd = index.substr(at, static_cast<unsigned char>(index[at + 3]));
    const std::string tables = stsd + box("stts", u32(0) + u32(1) + u32(FRAMES) + u32(1024))
        + box("stsc", u32(0) + u32(1) + u32(1) + u32(FRAMES) + u32(1)) + box("stsz", u32(0) + u32(FRAME) + u32(FRAMES))
        + box("co64", u32(0) + u32(1) + u32(0) + u32(movie->fileType().size() + 16));
    const uint64_t length = FRAMES * 1024;
    const std::string timed = std::string("\0\0\0\0", 4) + u32(0) + u32(0);
    const std::string moov = box("moov",
        box("mvhd", timed + u32(44100) + u32(length) + std::string(80, '\0'))
            + box("trak",
                box("tkhd", timed + u32(1) + u32(0) + u32(length) + std::string(60, '\0'))
                    + box("mdia",
                        box("mdhd", timed + u32(44100) + u32(length) + u32(0))
                            + box("hdlr", u32(0) + u32(0) + "soun" + std::string(13, '\0'))
                            + box("minf", box("stbl", tables)))));
    const std::string path = file("long.m4a");
    const uint64_t data = FRAMES * FRAME;
    support::writeFile(path, movie->fileType() + u32(1) + "mdat" + u32((data + 16) >> 32) + u32(data + 16));
    ASSERT_EQ(0, ::truncate(path.c_str(), static_cast<off_t>(movie->fileType().size() + 16 + data)));
    {
        const media::FileDescriptor out(::open(path.c_str(), O_WRONLY | O_APPEND));
        ASSERT_EQ(static_cast<ssize_t>(moov.size()), ::write(out.get(), moov.data(), moov.size()));
    }
    ASSERT_EQ(0, cut("long.m4a", "end.m4a", 43000000, 43002000));
    const media::FileDescriptor end(::open(file("end.m4a").c_str(), O_RDONLY));
    EXPECT_EQ(88200u, media::Mp4Movie::read(end.get())->length());

    ::close(::open(file("all.m4a").c_str(), O_RDWR | O_CREAT, 0600));
    const video_edit_clip_s clip{path.c_str(), 0, 1000, 43100000};
    const video_edit_project_s project{&clip};
    isDone = false;
    ASSERT_EQ(0, video_edit_prepare(VIDEO_EDIT_PROJECT_SOUND, &project));
    ASSERT_EQ(0, video_edit_export(file("all.m4a").c_str()));
    const media::FileDescriptor growing(::open(file("all.m4a").c_str(), O_RDONLY));
    ASSERT_TRUE(support::runUntil([&] { return ::lseek(growing.get(), 0, SEEK_END) > (16 << 20); }, 20));
    ASSERT_EQ(0, video_edit_export_cancel());
    EXPECT_LT(::lseek(growing.get(), 0, SEEK_END), static_cast<off_t>(data / 2));
    EXPECT_FALSE(isDone);
}

// Every cut short and many flipped bits: an error, or a result that opens.
TEST_F(TrimCutTest, SurvivesDamagedSources)
{
    ASSERT_TRUE(make("a.m4a", "-c:a aac -aac_pns 0", 2));
    ASSERT_TRUE(make("a.mp3", "-c:a libmp3lame", 2));
    unsigned int seed = 7;
    for (const char* name : {"a.m4a", "a.mp3"}) {
        const std::string whole = support::readFile(file(name));
        for (int i = 0; i < 120; ++i) {
            std::string damaged = whole;
            for (int flips = 0; flips < 4; ++flips) {
                seed = seed * 1103515245 + 12345;
                damaged[damaged.size() - 1 - (seed >> 8) % 1500] ^= static_cast<char>(1 << (seed >> 28) % 8);
            }
            if (i % 3 == 0)
                damaged.resize(damaged.size() * static_cast<size_t>(i) / 120);
            support::writeFile(file("damaged"), damaged);
            (void)cut("damaged", "out", 200, 1500);
        }
    }
}

}
