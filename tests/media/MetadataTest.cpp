#include "RecorderFixture.h"

#include "support/Amr.h"

#include <metadata_extractor.h>

#include <chrono>
#include <cstdlib>
#include <memory>
#include <random>

namespace {

// The duration as the application reads it; -1 for an error.
int durationOf(const std::string& path)
{
    metadata_extractor_h extractor = nullptr;
    EXPECT_EQ(0, metadata_extractor_create(&extractor));
    (void)metadata_extractor_set_path(extractor, path.c_str());
    char* value = nullptr;
    const int error = metadata_extractor_get_metadata(extractor, METADATA_DURATION, &value);
    const int duration = error == 0 ? std::atoi(value) : -1;
    free(value);
    EXPECT_EQ(0, metadata_extractor_destroy(extractor));
    return duration;
}

std::string box(const std::string& type, const std::string& content, uint32_t extra = 0)
{
    const auto size = static_cast<uint32_t>(8 + content.size() + extra);
    std::string head;
    for (int shift = 24; shift >= 0; shift -= 8)
        head.push_back(static_cast<char>(size >> shift));
    return head + type + content;
}

}

class MetadataTest : public SourceTest {
protected:
    int durationOfContent(const std::string& content)
    {
        std::filesystem::remove(directory.file("file")); // writing over it would wait for the disk
        support::writeFile(directory.file("file"), content);
        return durationOf(directory.file("file"));
    }
};

TEST_F(MetadataTest, ReadsDurations)
{
    for (const bool isAmr : {false, true}) {
        makeRecording(directory.file("made"), 2, isAmr);
        EXPECT_NEAR(probedDuration(directory.file("made")), durationOf(directory.file("made")), 1);
        std::filesystem::remove(directory.file("made"));
    }
    // Another writer's file, with its index in front.
    (void)support::outputOf(
        "ffmpeg -v error -f lavfi -i sine=d=3 -c:a aac -movflags +faststart " + directory.file("other.m4a"));
    EXPECT_NEAR(3000, durationOf(directory.file("other.m4a")), 30);
    // Fragments, frames without a box, bytes behind the last box.
    const std::string sine = "ffmpeg -v error -f lavfi -i sine=d=3 -c:a aac ";
    (void)support::outputOf(sine + "-movflags frag_keyframe+empty_moov " + directory.file("one.m4a"));
    (void)support::outputOf(sine + "-movflags frag_keyframe+empty_moov+default_base_moof -frag_duration 500000 "
        + directory.file("six.m4a"));
    (void)support::outputOf(sine + "-f adts " + directory.file("frames.m4a"));
    support::writeFile(directory.file("tail.m4a"), support::readFile(directory.file("other.m4a")) + "and more");
    for (const char* name : {"one.m4a", "six.m4a", "frames.m4a", "tail.m4a"})
        EXPECT_NEAR(3000, durationOf(directory.file(name)), 50) << name;
    EXPECT_EQ(1000, durationOfContent(support::wideAmr(50)));
    // Long durations take 64 bits: 40 hours at 44100 a second.
    const std::string zeros(20, '\0');
    const std::string header = std::string("\1\0\0\0", 4) + zeros.substr(0, 16) + std::string("\0\0\xac\x44", 4)
        + std::string("\0\0\0\x01\x7a\x97\x83\x00", 8) + zeros;
    EXPECT_EQ(static_cast<int>(0x17a978300ull * 1000 / 44100),
        durationOfContent(box("ftyp", "M4A ") + box("mdat", "data") + box("moov", box("mvhd", header))));
}

TEST_F(MetadataTest, RefusesHostileFiles)
{
    const std::string type = box("ftyp", "M4A isom");
    const std::string data = box("mdat", "0123456789");
    const std::string zeroScale(100, '\0');
    const std::vector<std::string> hostile = {"", "#!AMR\n", "#!AMR\n\xff\xff\xff\xff" + std::string(40, '\xff'),
        "ftyp", type, type + data, type + data + box("moov", ""), type + data + box("moov", box("mvhd", "short")),
        type + data + box("moov", box("mvhd", zeroScale)), type + data + box("moov", "", 0x7fffffff),
        type + data + std::string("\0\0\0\1moov\xff\xff\xff\xff\xff\xff\xff\xff", 16),
        type + data + std::string("\0\0\0\1moov\0\0\0\0\0\0\0\1", 16), type + data + std::string("\0\0\0\4moov", 8),
        type + box("moof", "x") + data, std::string("\0\0\0\0ftyp", 8)};
    for (size_t i = 0; i < hostile.size(); ++i) {
        SCOPED_TRACE(i);
        EXPECT_EQ(-1, durationOfContent(hostile[i]));
    }
    // A million boxes without content must not take long either.
    std::string many = type;
    for (int i = 0; i < 1000000; ++i)
        many += std::string("\0\0\0\x08"
                            "free",
            8);
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(-1, durationOfContent(many));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(3));
    for (const char* path : {"/nonexistent/file", "/dev", "/dev/zero"})
        EXPECT_EQ(-1, durationOf(path));
}

TEST_F(MetadataTest, SurvivesEveryCutAndManyFlips)
{
    makeRecording(directory.file("made"), 1, false);
    const std::string good = support::readFile(directory.file("made"));
    const size_t index = good.find("moov") - 4;
    for (size_t size = index; size < good.size(); size += 7)
        EXPECT_EQ(-1, durationOfContent(good.substr(0, size))) << size;
    std::mt19937 random(7);
    for (int i = 0; i < 2000; ++i) {
        std::string bent = good.substr(0, 64) + good.substr(index);
        for (int flips = 0; flips < 4; ++flips)
            bent[random() % bent.size()] = static_cast<char>(random());
        EXPECT_GE(durationOfContent(bent), -1);
    }
}
