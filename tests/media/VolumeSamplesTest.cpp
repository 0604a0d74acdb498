// How loud recordings are: the exact and the coarse look, and what is kept of them.
#include <media_content.h>
#include <volume_samples.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <numeric>
#include <vector>

#include "media/Loudness.h"
#include "support/Amr.h"
#include "support/DatabaseRows.h"
#include "support/TempDir.h"

namespace {

using Values = std::vector<uint32_t>;

Values read(const std::string& path, volume_samples_quality_e quality = VOLUME_SAMPLES_EXACT, bool isCancelled = false)
{
    const std::atomic<bool> cancelled = isCancelled;
    volume_samples_s* samples = nullptr;
    if (mw_get_volume_samples_until(path.c_str(), quality, &cancelled, &samples) != 0)
        return {};
    const Values values(samples->amplitude_samples, samples->amplitude_samples + samples->sample_size / 4);
    EXPECT_EQ(0, mw_free_volume_samples(samples));
    return values;
}

double mean(const Values& values, size_t from, size_t to)
{
    return std::accumulate(values.begin() + static_cast<long>(from), values.begin() + static_cast<long>(to), 0.0)
        / static_cast<double>(to - from);
}

class VolumeSamplesTest : public testing::Test {
protected:
    bool make(const std::string& name, const std::string& codec, const std::string& length = "9")
    {
        const bool isAmr = name.ends_with(".amr");
        // Three thirds: loud, silent, half as loud.
        const std::string volume
            = "volume='if(lt(t," + length + "/3),0.5,if(lt(t,2*" + length + "/3),0,0.25))':eval=frame";
        return std::system(("ffmpeg -v error -y -f lavfi -i anoisesrc=d=" + length + ":r=44100:a=1 -af \"" + volume
                   + "\" -ac 1 " + codec + " '" + _directory.file(isAmr ? "a.wav" : name) + "'")
                               .c_str())
            == 0
            && (!isAmr || support::encodeAmr(_directory.file("a.wav"), _directory.file(name)));
    }

    support::TempDir _directory;
};

TEST_F(VolumeSamplesTest, TellsLoudFromSilent)
{
    for (const auto& [name, codec] : {std::pair("a.m4a", "-c:a aac"), {"a.amr", "-ar 8000"},
             {"a.mp3", "-c:a libmp3lame"}, {"a.wav", "-c:a pcm_s16le"}, {"a.flac", "-c:a flac"}}) {
        SCOPED_TRACE(name);
        ASSERT_TRUE(make(name, codec));
        const Values values = read(_directory.file(name));
        ASSERT_EQ(900u, values.size());
        const double loud = mean(values, 20, 280);
        EXPECT_GT(loud, 1500);
        EXPECT_LT(mean(values, 320, 580), loud / 50);
        EXPECT_NEAR(0.5, mean(values, 620, 880) / loud, 0.1);
        EXPECT_TRUE(read(_directory.file(name), VOLUME_SAMPLES_EXACT, true).empty()) << "cancelled";
    }
    ASSERT_TRUE(make("short.m4a", "-c:a aac", "1"));
    EXPECT_EQ(90u, read(_directory.file("short.m4a")).size());
    support::writeFile(_directory.file("damaged.m4a"), std::string(3000, 'x'));
    EXPECT_TRUE(read(_directory.file("damaged.m4a")).empty());
    EXPECT_TRUE(read(_directory.file("none.m4a")).empty());
    EXPECT_EQ(1, mw_free_volume_samples(nullptr));
}

TEST_F(VolumeSamplesTest, CoarseLookShowsTheSamePicture)
{
    for (const auto& [name, codec] : {std::pair("a.m4a", "-c:a aac -b:a 64k"), {"a.amr", "-ar 8000"}}) {
        SCOPED_TRACE(name);
        ASSERT_TRUE(make(name, codec, "400"));
        const Values coarse = read(_directory.file(name), VOLUME_SAMPLES_COARSE);
        const Values exact = read(_directory.file(name));
        ASSERT_EQ(900u, coarse.size());
        ASSERT_EQ(900u, exact.size());
        for (const auto& [from, to] : {std::pair<size_t, size_t>(5, 295), {605, 895}})
            EXPECT_NEAR(1.0, mean(coarse, from, to) / mean(exact, from, to), 0.1);
        EXPECT_LT(mean(coarse, 305, 595), mean(exact, 5, 295) / 10);
    }
}

TEST_F(VolumeSamplesTest, IsKeptWithItsRecording)
{
    ::setenv("MEWLO_MEDIA_DB", _directory.file("media.db").c_str(), 1);
    media_content_connect();
    ASSERT_TRUE(make("a.wav", "-c:a pcm_s16le", "2"));
    const std::string path = _directory.file("a.wav");
    const std::string count = "SELECT 1 FROM waveform";
    const Values alone = read(path);
    EXPECT_EQ(900u, alone.size());
    // Nothing is kept of what has no row; then the kept ones answer.
    ASSERT_TRUE(make("b.m4a", "-c:a aac", "3"));
    const std::string recording = _directory.file("b.m4a");
    media_info_h media = nullptr;
    ASSERT_EQ(0, media_info_insert_to_db(recording.c_str(), &media));
    const Values values = read(recording);
    const auto change = [&](const std::string& sql) { return support::execute(sql); };
    EXPECT_TRUE(change("UPDATE waveform SET WAVEFORM_SAMPLES = x'00070008'"));
    EXPECT_EQ((Values{7, 8}), read(recording));
    EXPECT_EQ((Values{7, 8}), read(recording, VOLUME_SAMPLES_COARSE));
    EXPECT_EQ(alone, read(path));
    // It follows the recording, and another file under its path is another recording.
    const std::string moved = _directory.file("c.m4a");
    std::filesystem::rename(recording, moved);
    EXPECT_EQ(0, media_info_move_to_db(media, moved.c_str()));
    EXPECT_EQ((Values{7, 8}), read(moved));
    std::filesystem::last_write_time(moved, std::filesystem::file_time_type::clock::now() + std::chrono::seconds(5));
    EXPECT_EQ(values, read(moved));
    char* id = nullptr;
    media_info_get_media_id(media, &id);
    EXPECT_EQ(0, media_info_delete_from_db(id));
    std::free(id);
    EXPECT_TRUE(change("CREATE TABLE proof(X CHECK(X = 0)); INSERT INTO proof SELECT count(*) FROM waveform"));
    media_info_destroy(media);
    media_content_disconnect();
    ::unsetenv("MEWLO_MEDIA_DB");
}

TEST(LoudnessTest, GrowsWithTheRecording)
{
    media::GrowingLoudness growing;
    EXPECT_TRUE(growing.result().empty());
    // Half an hour at 44.1 kHz: silence, then full scale.
    const uint64_t blocks = 1800ull * 44100 / 64;
    for (uint64_t i = 0; i < blocks; ++i)
        growing.add(i < blocks / 2 ? 0 : 64, 64);
    const auto values = growing.result();
    ASSERT_EQ(900u, values.size());
    EXPECT_EQ(0u, values[440]);
    EXPECT_EQ(32767u, values[460]);
    EXPECT_EQ(32767u, values[899]);
}

}
