#include "MwText.h"

#include <glib.h>
#include <notification.h>

#include <cstdarg>
#include <libintl.h>

std::string mwFormat(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    char* text = g_strdup_vprintf(format, arguments);
    va_end(arguments);
    std::string result = text != nullptr ? text : "";
    g_free(text);
    return result;
}

std::string mwTranslate(const char* id)
{
    const char* text = gettext(id);
    return text != nullptr ? text : id;
}

std::string mwTranslateNumber(const char* id, size_t number)
{
    std::string text = mwTranslate(id);
    if (const size_t place = text.find("%d"); place != std::string::npos)
        text.replace(place, 2, std::to_string(number));
    return text;
}

void mwPost(const char* id) { notification_status_message_post(mwTranslate(id).c_str()); }
