#include <utils_i18n.h>

#include <unicode/udat.h>
#include <unicode/udatpg.h>
#include <unicode/ustring.h>

#include <ctime>
#include <string>
#include <string_view>

namespace {

constexpr std::u16string_view LOCAL = u"localtime";

struct Format {
    UDateFormat* format;
    bool isLocal; // formats Universal Time, to which the C library's offset is added
};

Format* formatOf(i18n_udate_h handle) { return static_cast<Format*>(handle); }

double localOffset(double milliseconds)
{
    const auto seconds = static_cast<std::time_t>(milliseconds / 1000);
    std::tm local{};
    return localtime_r(&seconds, &local) != nullptr ? static_cast<double>(local.tm_gmtoff) * 1000 : 0;
}

// Nearly every call of the library warns (with a negative code); only positive codes are failures.
int toError(UErrorCode code) { return U_FAILURE(code) ? static_cast<int>(code) : I18N_ERROR_NONE; }

// The end of the last whole character within the capacity.
int32_t wholeCharacters(const char16_t* text, int32_t length, int32_t capacity)
{
    if (length <= capacity)
        return length;
    const bool splits = capacity > 0 && U16_IS_LEAD(text[capacity - 1]);
    return splits ? capacity - 1 : capacity;
}

int32_t wholeCharacters(const std::string& text, int32_t capacity)
{
    int32_t end = capacity;
    if (static_cast<int32_t>(text.size()) <= capacity)
        return static_cast<int32_t>(text.size());
    while (end > 0 && U8_IS_TRAIL(text[static_cast<size_t>(end)]))
        --end;
    return end;
}

}

extern "C" {

int i18n_udatepg_create(const char* locale, i18n_udatepg_h* generator)
{
    if (generator == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    UErrorCode code = U_ZERO_ERROR;
    *generator = udatpg_open(locale, &code);
    return toError(code);
}

int i18n_udatepg_get_best_pattern(i18n_udatepg_h generator, const i18n_uchar* skeleton, int32_t length,
    i18n_uchar* pattern, int32_t capacity, int32_t* pattern_length)
{
    if (generator == nullptr || skeleton == nullptr || pattern == nullptr || pattern_length == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    UErrorCode code = U_ZERO_ERROR;
    const int32_t units = length >= 0 ? length : u_strlen(skeleton);
    *pattern_length = udatpg_getBestPattern(
        static_cast<UDateTimePatternGenerator*>(generator), skeleton, units, pattern, capacity, &code);
    return toError(code);
}

int i18n_udatepg_destroy(i18n_udatepg_h generator)
{
    if (generator == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    udatpg_close(static_cast<UDateTimePatternGenerator*>(generator));
    return I18N_ERROR_NONE;
}

int i18n_udate_create(i18n_udate_format_style_e time_style, i18n_udate_format_style_e date_style, const char* locale,
    const i18n_uchar* time_zone, int32_t time_zone_length, const i18n_uchar* pattern, int32_t pattern_length,
    i18n_udate_h* format)
{
    if (format == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    UErrorCode code = U_ZERO_ERROR;
    const int32_t zoneLength = time_zone == nullptr ? 0
        : time_zone_length >= 0                     ? time_zone_length
                                                    : u_strlen(time_zone);
    const std::u16string_view zone(time_zone, static_cast<size_t>(zoneLength));
    const bool isLocal = zone == LOCAL;
    if (isLocal)
        ::tzset(); // it may have changed
    UDateFormat* made = udat_open(static_cast<UDateFormatStyle>(time_style), static_cast<UDateFormatStyle>(date_style),
        locale, isLocal ? u"UTC" : time_zone, isLocal ? -1 : time_zone_length, pattern, pattern_length, &code);
    *format = made != nullptr ? new Format{made, isLocal} : nullptr;
    return toError(code);
}

int i18n_udate_format_date(
    i18n_udate_h format, i18n_udate date, i18n_uchar* text, int32_t capacity, int32_t* text_length)
{
    if (format == nullptr || text == nullptr || text_length == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    UErrorCode code = U_ZERO_ERROR;
    const double shown = date + (formatOf(format)->isLocal ? localOffset(date) : 0);
    *text_length = udat_format(formatOf(format)->format, shown, text, capacity, nullptr, &code);
    return toError(code);
}

int i18n_udate_destroy(i18n_udate_h format)
{
    if (format == nullptr)
        return I18N_ERROR_INVALID_PARAMETER;
    udat_close(formatOf(format)->format);
    delete formatOf(format);
    return I18N_ERROR_NONE;
}

int i18n_ustring_from_utf8(const char* source, int32_t length, i18n_uchar* text, int32_t capacity, int32_t* text_length)
{
    if (source == nullptr || text == nullptr || text_length == nullptr || capacity < 0)
        return I18N_ERROR_INVALID_PARAMETER;
    const std::string bytes = length >= 0 ? std::string(source, static_cast<size_t>(length)) : std::string(source);
    std::u16string all(bytes.size() + 1, u'\0'); // no character takes more units than bytes
    int32_t units = 0;
    UErrorCode code = U_ZERO_ERROR;
    u_strFromUTF8(
        all.data(), static_cast<int32_t>(all.size()), &units, bytes.data(), static_cast<int32_t>(bytes.size()), &code);
    if (U_FAILURE(code))
        return toError(code);
    *text_length = wholeCharacters(all.data(), units, capacity);
    u_memcpy(text, all.data(), *text_length);
    return I18N_ERROR_NONE;
}

int i18n_ustring_to_utf8(const i18n_uchar* source, int32_t length, char* text, int32_t capacity, int32_t* text_length)
{
    if (source == nullptr || text == nullptr || text_length == nullptr || capacity < 0)
        return I18N_ERROR_INVALID_PARAMETER;
    const int32_t units = length >= 0 ? length : u_strlen(source);
    std::string all(static_cast<size_t>(units) * 3 + 1, '\0'); // a unit takes three bytes at most
    int32_t bytes = 0;
    UErrorCode code = U_ZERO_ERROR;
    u_strToUTF8(all.data(), static_cast<int32_t>(all.size()), &bytes, source, units, &code);
    if (U_FAILURE(code))
        return toError(code);
    all.resize(static_cast<size_t>(bytes));
    *text_length = wholeCharacters(all, capacity);
    all.copy(text, static_cast<size_t>(*text_length));
    return I18N_ERROR_NONE;
}
}
