// One line for a service function that records its call and answers.
#pragma once

#include "fakes/Fakes.h"

#include <string>
#include <type_traits>

namespace fakes {

inline std::string word(const char* text) { return text; }
inline std::string word(const std::string& text) { return text; }
template <typename Number>
std::string word(Number number)
{
    return std::to_string(static_cast<int>(number));
}

template <typename... Arguments>
int answer(const char* function, const Arguments&... arguments)
{
    std::string words;
    ((words += (words.empty() ? "" : " ") + word(arguments)), ...);
    return calls.record(function, words);
}

}

// FAKE(<function>, (<parameters>), <what a success does>, <what is recorded of the call>...)
#define FAKE(function, parameters, effect, ...)                                                                        \
    int function parameters                                                                                            \
    {                                                                                                                  \
        const int code = fakes::answer(#function __VA_OPT__(, ) __VA_ARGS__);                                          \
        if (code == 0) {                                                                                               \
            effect;                                                                                                    \
        }                                                                                                              \
        return code;                                                                                                   \
    }
