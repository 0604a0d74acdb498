// Dates in the way of a region. Texts are UTF-16, lengths count its units; a length of -1 means up to the zero. 0 is
// success, also where the library only warns (that it took a fallback, for one); failures are positive. Any thread, one
// at a time for each handle.
#pragma once

#include <cstdint>

enum i18n_error_code_e : int {
    I18N_ERROR_NONE = 0,
    I18N_ERROR_INVALID_PARAMETER = 1,
};
// How a formatter is described: by a pattern, for the time and for the date.
enum i18n_udate_format_style_e { I18N_UDATE_PATTERN = -2 };

typedef char16_t i18n_uchar;
typedef double i18n_udate; // milliseconds since the epoch
typedef void* i18n_udate_h;
typedef void* i18n_udatepg_h;

extern "C" {
// Finds the usual pattern for the fields of a skeleton such as "yyyyMMMddEEE".
int i18n_udatepg_create(const char* locale, i18n_udatepg_h* generator);
int i18n_udatepg_get_best_pattern(i18n_udatepg_h generator, const i18n_uchar* skeleton, int32_t length,
    i18n_uchar* pattern, int32_t capacity, int32_t* pattern_length);
int i18n_udatepg_destroy(i18n_udatepg_h generator);

// A time zone that is not known counts as GMT.
int i18n_udate_create(i18n_udate_format_style_e time_style, i18n_udate_format_style_e date_style, const char* locale,
    const i18n_uchar* time_zone, int32_t time_zone_length, const i18n_uchar* pattern, int32_t pattern_length,
    i18n_udate_h* format);
int i18n_udate_format_date(
    i18n_udate_h format, i18n_udate date, i18n_uchar* text, int32_t capacity, int32_t* text_length);
int i18n_udate_destroy(i18n_udate_h format);

// Conversions write whole characters only and cut what does not fit; the answer is what they wrote, without a zero at
// the end.
int i18n_ustring_from_utf8(
    const char* source, int32_t length, i18n_uchar* text, int32_t capacity, int32_t* text_length);
int i18n_ustring_to_utf8(const i18n_uchar* source, int32_t length, char* text, int32_t capacity, int32_t* text_length);
}
