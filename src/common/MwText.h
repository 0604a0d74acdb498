#pragma once

#include <cstdlib>
#include <memory>
#include <string>

// A std::string in printf style.
std::string mwFormat(const char* format, ...) __attribute__((format(printf, 1, 2)));

// The translated text of a string identifier.
std::string mwTranslate(const char* id);

// The translated text of an identifier with the number in place of its "%d". What comes from a translation is never
// used as a format.
std::string mwTranslateNumber(const char* id, size_t number);

// Shows the translated text of an identifier to the user as a status message. Any thread.
void mwPost(const char* id);

// Adopts a text that a service allocated; null becomes the empty string.
inline std::string mwAdopt(char* text)
{
    const std::unique_ptr<char, decltype(&std::free)> owner(text, &std::free);
    return text != nullptr ? std::string(text) : std::string();
}
