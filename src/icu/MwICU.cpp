#include "MwICU.h"

#include <system_settings.h>
#include <utils_i18n.h>
#include <vconf.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <string_view>
#include <utility>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr auto FALLBACK_REGION = "en_US";
constexpr std::string_view CODESET = "UTF-8";
constexpr int32_t MAX_UNITS = 64;
constexpr int32_t MAX_BYTES = 64;

using Units = std::array<i18n_uchar, MAX_UNITS>;
using Generator = MwHandle<i18n_udatepg_h, i18n_udatepg_destroy>;

// "en_GB.UTF-8" names no locale of the library and "de_DE@euro" none at all: both are taken without their tails.
std::string withoutTail(std::string region)
{
    if (const size_t codeset = region.find(CODESET); codeset != std::string::npos)
        region.resize(codeset > 0 ? codeset - 1 : 0);
    region.resize(std::min(region.find('@'), region.size()));
    return region;
}

std::string readRegion()
{
    char* text = vconf_get_str(platform::KEY_REGION);
    if (text == nullptr)
        MW_LOGW("Cannot get region format.");
    const std::string region = withoutTail(mwAdopt(text));
    return region.empty() ? FALLBACK_REGION : region;
}

std::u16string toUnits(const std::string& text)
{
    Units units{};
    int32_t length = 0;
    if (!MW_CALL(
            i18n_ustring_from_utf8, text.c_str(), static_cast<int32_t>(text.size()), units.data(), MAX_UNITS, &length))
        return {};
    return {units.data(), static_cast<size_t>(length)};
}

const char16_t* skeletonOf(MwICU::Kind kind, bool has24Hours)
{
    if (kind == MwICU::DATE)
        return u"yyyyMMMddEEE";
    return has24Hours ? u"yyyyMMMddHmEEE" : u"yyyyMMMddhmEEE";
}

// Midday is 12 and not 0: hours from 0 to 11 become hours from 1 to 12. Quoted words stay what they are.
std::u16string withHoursFromOne(std::u16string pattern)
{
    bool isQuoted = false;
    for (char16_t& unit : pattern) {
        if (unit == u'\'')
            isQuoted = !isQuoted;
        else if (unit == u'K' && !isQuoted)
            unit = u'h';
    }
    return pattern;
}

std::optional<std::u16string> bestPattern(const std::string& region, const char16_t* skeleton)
{
    Generator generator;
    if (!MW_CALL(i18n_udatepg_create, region.c_str(), generator.out()))
        return std::nullopt;
    Units pattern{};
    int32_t length = 0;
    const bool found
        = MW_CALL(i18n_udatepg_get_best_pattern, generator.get(), skeleton, -1, pattern.data(), MAX_UNITS, &length);
    if (const int code = generator.close(); code != I18N_ERROR_NONE)
        MW_LOGE("i18n_udatepg_destroy failed : [%d]!!!", code);
    if (!found)
        return std::nullopt;
    return withHoursFromOne({pattern.data(), static_cast<size_t>(length)});
}

}

MwICU::~MwICU() { _clearFormat(); }

void MwICU::_clearFormat()
{
    if (void* format = std::exchange(_format, nullptr); format)
        MW_CALL(i18n_udate_destroy, format);
}

void* MwICU::_getFormat(Kind kind)
{
    if (_format && _kind == kind)
        return _format;
    _clearFormat();
    const std::string region = readRegion();
    bool has24Hours = false;
    char* zoneText = nullptr;
    if (!MW_CALL(system_settings_get_value_bool, SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR, &has24Hours)
        || !MW_CALL(system_settings_get_value_string, SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE, &zoneText))
        return nullptr;
    const std::u16string zone = toUnits(mwAdopt(zoneText));
    const auto pattern = bestPattern(region, skeletonOf(kind, has24Hours));
    if (!pattern)
        return nullptr;
    i18n_udate_h format = nullptr;
    if (!MW_CALL(i18n_udate_create, I18N_UDATE_PATTERN, I18N_UDATE_PATTERN, region.c_str(), zone.data(),
            static_cast<int32_t>(zone.size()), pattern->data(), static_cast<int32_t>(pattern->size()), &format))
        return nullptr;
    _format = format;
    _kind = kind;
    return _format;
}

std::optional<std::string> MwICU::getICUstring(int64_t seconds, Kind kind)
{
    void* format = _getFormat(kind);
    if (!format) {
        MW_LOGE("_getFormat failed!!!");
        return std::nullopt;
    }
    Units text{};
    int32_t length = 0;
    if (!MW_CALL(
            i18n_udate_format_date, format, static_cast<double>(seconds) * 1000.0, text.data(), MAX_UNITS, &length))
        return std::nullopt;
    std::array<char, MAX_BYTES> bytes{};
    int32_t size = 0;
    if (!MW_CALL(i18n_ustring_to_utf8, text.data(), length, bytes.data(), MAX_BYTES, &size))
        return std::nullopt;
    return std::string(bytes.data(), static_cast<size_t>(size));
}
