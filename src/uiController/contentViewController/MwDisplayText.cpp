#include "MwDisplayText.h"

#include <Elementary.h>
#include <glib.h>

#include "MwText.h"

namespace {

// Line separator, paragraph separator and the marks that would turn around what follows the name in its row.
bool breaksRow(gunichar character)
{
    return g_unichar_iscntrl(character) || character == 0x2028 || character == 0x2029
        || (character >= 0x202a && character <= 0x202e) || (character >= 0x2066 && character <= 0x2069);
}

std::string inOneLine(const std::string& text)
{
    std::string line;
    for (const char* at = text.c_str(); *at != '\0';) {
        const char* next = g_utf8_next_char(at);
        if (breaksRow(g_utf8_get_char(at)))
            line += ' ';
        else
            line.append(at, next);
        at = next;
    }
    return line;
}

}

std::string mwDisplayMarkup(const std::string& text)
{
    const std::string valid = mwAdopt(g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())));
    return mwAdopt(elm_entry_utf8_to_markup(inOneLine(valid).c_str()));
}

std::string mwWithoutExtension(const std::string& fileName)
{
    const size_t dot = fileName.rfind('.');
    return dot == 0 ? fileName : fileName.substr(0, dot);
}
