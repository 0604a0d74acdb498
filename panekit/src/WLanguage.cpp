#include <panekit/WLanguage.h>

#include <clocale>
#include <cstdlib>
#include <libintl.h>

#include <Elementary.h>

namespace panekit {

namespace {

    constexpr auto FALLBACK_LANGUAGE = "en";
    constexpr auto FALLBACK_LOCALE = "C.UTF-8";

    std::string environment(const char* name)
    {
        const char* value = std::getenv(name);
        return value ? value : "";
    }

    bool isPlain(const std::string& locale) { return locale.empty() || locale == "C" || locale == "POSIX"; }

    std::string withoutEncoding(const std::string& locale) { return locale.substr(0, locale.find('.')); }

    // The user's wish, in the order that gettext gives to these variables.
    std::string wantedLanguage()
    {
        if (const std::string list = environment("LANGUAGE"); !list.empty())
            return list;
        for (const char* name : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
            if (const std::string value = environment(name); !value.empty())
                return isPlain(withoutEncoding(value)) ? "" : withoutEncoding(value);
        }
        return {};
    }

    // gettext looks nothing up in the plain "C" locale; with any other one the list of languages decides.
    void ensureTranslatingLocale()
    {
        const char* locale = std::setlocale(LC_MESSAGES, nullptr);
        if (isPlain(locale ? locale : ""))
            std::setlocale(LC_ALL, FALLBACK_LOCALE);
    }

    void setLanguageList(const std::string& wanted)
    {
        const std::string list = wanted.empty() ? FALLBACK_LANGUAGE : wanted + ":" + FALLBACK_LANGUAGE;
        ::setenv("LANGUAGE", list.c_str(), 1);
    }

}

void WLanguage::initialize()
{
    std::setlocale(LC_ALL, "");
    ensureTranslatingLocale();
    setLanguageList(wantedLanguage());
}

void WLanguage::use(const std::string& language)
{
    setLanguageList(withoutEncoding(language));
    // Setting the domain again makes gettext drop what it remembers of the old language.
    textdomain(textdomain(nullptr));
    elm_language_set(language.c_str());
    ensureTranslatingLocale();
}

const char* WLanguage::text(const std::string& id) { return id.empty() ? "" : gettext(id.c_str()); }

}
