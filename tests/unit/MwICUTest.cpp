#include <gtest/gtest.h>
#include <utils_i18n.h>
#include <vconf.h>

#include <cstdlib>
#include <filesystem>

#include "MwICU.h"

namespace {

constexpr int64_t MORNING = 1700032380; // 2023-11-15 07:13 UTC
constexpr int64_t NOON = 1700051580; // 12:33 UTC

void useSettings(const char* region, bool has24Hours, const char* zone = "UTC")
{
    vconf_set_str("db/menu_widget/regionformat", region);
    vconf_set_int("db/setting/clock_24h", has24Hours);
    vconf_set_str("db/setting/timezone", zone);
}

std::string write(int64_t seconds, MwICU::Kind kind)
{
    MwICU icu;
    return icu.getICUstring(seconds, kind).value_or("nothing");
}

// The library puts a narrow space before "AM" in newer versions.
std::string plainSpaces(std::string text)
{
    constexpr auto NARROW = "\u202f";
    for (size_t at = text.find(NARROW); at != std::string::npos; at = text.find(NARROW))
        text.replace(at, std::string(NARROW).size(), " ");
    return text;
}

TEST(MwICUTest, WritesDatesTheWayOfTheRegion)
{
    const struct {
        const char* region;
        const char* date;
        const char* with24Hours;
        const char* with12Hours;
    } regions[] = {
        {"en_US", "Wed, Nov 15, 2023", "Wed, Nov 15, 2023, 07:13", "Wed, Nov 15, 2023, 7:13 AM"},
        {"en_GB", "Wed, 15 Nov 2023", "Wed, 15 Nov 2023, 07:13", "Wed, 15 Nov 2023, 7:13 am"},
        {"de_DE", "Mi., 15. Nov. 2023", "Mi., 15. Nov. 2023, 07:13", "Mi., 15. Nov. 2023, 7:13 AM"},
        {"ko_KR", "2023년 11월 15일 (수)", "2023년 11월 15일 (수) 07:13", "2023년 11월 15일 (수) 오전 7:13"},
        {"ja_JP", "2023年11月15日(水)", "2023年11月15日(水) 7:13", "2023年11月15日(水) 午前7:13"},
        {"ar_EG", "الأربعاء، ١٥ نوفمبر ٢٠٢٣", nullptr, nullptr},
    };
    for (const auto& each : regions) {
        SCOPED_TRACE(each.region);
        useSettings(each.region, true);
        EXPECT_EQ(each.date, write(MORNING, MwICU::DATE));
        if (!each.with24Hours)
            continue;
        EXPECT_EQ(each.with24Hours, plainSpaces(write(MORNING, MwICU::DATE_AND_TIME)));
        useSettings(each.region, false);
        EXPECT_EQ(each.with12Hours, plainSpaces(write(MORNING, MwICU::DATE_AND_TIME)));
    }
    useSettings("ja_JP", false);
    EXPECT_EQ("2023年11月15日(水) 午後12:33", write(NOON, MwICU::DATE_AND_TIME)) << "midday is 12, not 0";
}

TEST(MwICUTest, TakesRegionsAndTimeZonesAsTheyComeAndFallsBack)
{
    for (const char* region : {"en_GB.UTF-8", "en_GB@euro", "en_GB.UTF-8@euro"}) {
        useSettings(region, true);
        EXPECT_EQ("Wed, 15 Nov 2023", write(MORNING, MwICU::DATE)) << region;
    }
    for (const char* region : {"", "UTF-8"}) {
        useSettings(region, true);
        EXPECT_EQ("Wed, Nov 15, 2023", write(MORNING, MwICU::DATE)) << region;
    }
    std::filesystem::remove_all(std::string(std::getenv("XDG_RUNTIME_DIR")) + "/com.tovanic.mewlo-lite/state/db");
    ASSERT_EQ(nullptr, vconf_get_str("db/menu_widget/regionformat"));
    EXPECT_EQ("Wed, Nov 15, 2023", write(MORNING, MwICU::DATE)) << "unreadable";
    useSettings("en_US", true, "Asia/Tokyo");
    EXPECT_EQ("Wed, Nov 15, 2023, 16:13", write(MORNING, MwICU::DATE_AND_TIME));
    useSettings("en_US", true, "America/New_York");
    EXPECT_EQ("Tue, Nov 14, 2023, 20:00", write(1700010000, MwICU::DATE_AND_TIME)) << "still the day before";
    useSettings("en_US", true, "No/Such_Place");
    EXPECT_EQ("Wed, Nov 15, 2023, 07:13", write(MORNING, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Sun, Feb 07, 2106", write(UINT32_MAX, MwICU::DATE));
    EXPECT_EQ("Mon, Dec 01, 2200, 01:20", write(7286980800, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Wed, Dec 31, 1969, 23:59", write(-60, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Mon, Jan 01, 1900", write(-2208988800, MwICU::DATE));
    useSettings("sr_Latn_RS", true);
    EXPECT_NE(std::string::npos, write(MORNING, MwICU::DATE).find("nov")) << write(MORNING, MwICU::DATE);
    // A zone without a name: each date has the offset of its own season.
    ::setenv("TZ", "XYZ-5:45XYS,M3.5.0,M10.5.0/3", 1);
    useSettings("en_US", true, "localtime");
    EXPECT_EQ("Wed, Nov 15, 2023, 12:58", write(MORNING, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Sat, Jul 15, 2023, 12:45", write(1689379200 + 21600, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Thu, Jan 01, 1970, 05:45", write(0, MwICU::DATE_AND_TIME));
    ::unsetenv("TZ");
}

TEST(MwICUTest, KeepsAFormatterUntilTheOtherKindIsAskedFor)
{
    useSettings("en_US", true);
    MwICU icu;
    ASSERT_EQ("Wed, Nov 15, 2023", icu.getICUstring(MORNING, MwICU::DATE));
    useSettings("en_GB", true);
    EXPECT_EQ("Wed, Nov 15, 2023", icu.getICUstring(MORNING, MwICU::DATE));
    EXPECT_EQ("Wed, 15 Nov 2023, 07:13", icu.getICUstring(MORNING, MwICU::DATE_AND_TIME));
    EXPECT_EQ("Wed, 15 Nov 2023", icu.getICUstring(MORNING, MwICU::DATE));
}

TEST(MwICUTest, CutsLongTextsBetweenCharacters)
{
    useSettings("ar_EG", false);
    const std::string text = write(MORNING, MwICU::DATE_AND_TIME);
    EXPECT_LE(text.size(), 64U);
    EXPECT_TRUE(text.starts_with("الأربعاء، ١٥ نوفمبر ٢٠٢٣")) << text;
    const std::u16string source = u"٢٠٢٣";
    char bytes[3] = {'-', '-', '-'};
    int32_t length = 0;
    EXPECT_EQ(0, i18n_ustring_to_utf8(source.data(), -1, bytes, 3, &length));
    EXPECT_EQ(2, length) << "half a digit is none";
    EXPECT_EQ('-', bytes[2]);
    i18n_uchar units[2] = {};
    EXPECT_EQ(0, i18n_ustring_from_utf8("a😀", -1, units, 2, &length));
    EXPECT_EQ(1, length);
    EXPECT_NE(0, i18n_ustring_from_utf8("\xff\xfe", -1, units, 2, nullptr));
    EXPECT_NE(0, i18n_udate_destroy(nullptr));
}

}
