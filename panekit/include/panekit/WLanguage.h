#pragma once

#include <string>

namespace panekit {

// The language of the texts. Translations work without installed locales, and a language without a catalogue falls back
// to English, so that identifiers are never shown. Main loop only.
class WLanguage {
public:
    // Takes the language from the environment. Called by WApp::start; programs without it call it first in main.
    static void initialize();
    // Changes the language of every text at once, such as "de_DE" or "de_DE.UTF-8"; empty means the environment's.
    static void use(const std::string& language);
    // A text of the current text domain, never null.
    static const char* text(const std::string& id);
};

}
