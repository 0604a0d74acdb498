#include "MwModel.h"

#include <Ecore_File.h>

#include <algorithm>
#include <string_view>

#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr unsigned long long MAX_PARSED_NUMBER = 4294967295ULL;

bool isDigit(char c) { return c >= '0' && c <= '9'; }

bool isNumber(std::string_view text) { return std::all_of(text.begin(), text.end(), isDigit); }

// Reads modulo 2^64 first and caps then, so that any number of digits has one defined outcome.
unsigned long long parseNumber(std::string_view digits)
{
    unsigned long long number = 0;
    for (const char digit : digits)
        number = number * 10 + static_cast<unsigned long long>(digit - '0');
    return std::min(number, MAX_PARSED_NUMBER);
}

std::string baseWord() { return mwTranslate("IDS_MW_BODY_DEFAULTNAME_VOICE"); }

bool wrapped(unsigned long long number) { return (number & MAX_PARSED_NUMBER) == 0; }

std::string plainName(const std::string& base, unsigned long long number)
{
    return mwFormat("%s %03llu", base.c_str(), number);
}

// The number that follows the base word in a display name, without blanks and extension; nothing when the name takes no
// part in the numbering.
std::optional<std::string_view> numberTail(std::string_view name, std::string_view base)
{
    const size_t place = name.find(base);
    if (place == std::string_view::npos)
        return std::nullopt;
    std::string_view tail = name.substr(place + base.size());
    if (name.size() > base.size()) {
        tail.remove_prefix(std::min(tail.find_first_not_of(' '), tail.size()));
        if (!tail.empty() && !isDigit(tail.front()))
            return std::nullopt;
    }
    return tail.substr(0, tail.rfind('.'));
}

}

void MwModel::_getFileNumberFromFileName(
    const char* fileName, unsigned long long& last, unsigned long long& prefix, unsigned long long& postfix)
{
    if (fileName == nullptr) {
        MW_LOGE("fileName is nullptr");
        return;
    }
    const std::string base = baseWord();
    const auto tail = numberTail(fileName, base);
    if (!tail)
        return;
    last = prefix = postfix = 0;
    const size_t digits = std::find_if_not(tail->begin(), tail->end(), isDigit) - tail->begin();
    const unsigned long long number = parseNumber(tail->substr(0, digits));
    std::string_view rest = tail->substr(digits);
    if (rest.empty()) {
        last = number;
        return;
    }
    if (rest.size() < 2 || rest.front() != '(' || rest.back() != ')')
        return;
    rest = rest.substr(1, rest.size() - 2);
    if (!isNumber(rest))
        return;
    last = prefix = number;
    postfix = parseNumber(rest);
}

bool MwModel::_collectNumbersCb(media_info_h media, void* userData)
{
    if (media == nullptr) {
        MW_LOGE("mediaInfoHandle is nullptr");
        return true;
    }
    char* text = nullptr;
    if (!MW_CALL(media_info_get_display_name, media, &text))
        return true;
    const std::string name = mwAdopt(text);
    FileNumbers numbers;
    _getFileNumberFromFileName(name.c_str(), numbers.last, numbers.prefix, numbers.postfix);
    auto* highest = static_cast<FileNumbers*>(userData);
    highest->last = std::max(highest->last, numbers.last);
    highest->prefix = std::max(highest->prefix, numbers.prefix);
    highest->postfix = std::max(highest->postfix, numbers.postfix);
    return true;
}

bool MwModel::updateLastRecordedFileNumber()
{
    FileNumbers highest;
    foreachRecordedFiles(_collectNumbersCb, &highest);
    {
        const platform::Lock lock(_mutex);
        _numbers = highest;
    }
    MW_LOGI("last number: [%llu]", highest.last);
    MW_LOGI("last sub number prefix: [%llu]", highest.prefix);
    MW_LOGI("last sub number postfix: [%llu]", highest.postfix);
    return true;
}

std::string MwModel::_advanceToFreeName(FileNumbers& numbers) const
{
    const std::string base = baseWord();
    std::string candidate;
    do {
        ++numbers.last;
        if (!wrapped(numbers.last)) {
            candidate = plainName(base, numbers.last);
            continue;
        }
        if (wrapped(numbers.postfix)) {
            numbers.postfix = 1;
            ++numbers.prefix;
        } else {
            ++numbers.postfix;
        }
        candidate = mwFormat("%s %03llu(%llu)", base.c_str(), numbers.prefix, numbers.postfix);
    } while (checkRecordFileNameExist(candidate));
    return candidate;
}

void MwModel::chooseCurrentRecordingFileName(const std::string& name)
{
    const platform::Lock lock(_mutex);
    _texts.currentName = name;
    _nameIsChosen = true;
}

bool MwModel::updateNextRecordingFileName()
{
    const platform::Lock lock(_mutex);
    // The screen asks again whenever it comes back; a running recording keeps the name that the screen shows.
    if (mwIsRecordingOrPaused(_recorderState))
        return true;
    _nameIsChosen = false;
    _texts.currentName = _advanceToFreeName(_numbers);
    return true;
}

std::string MwModel::getDefaultRecordingFileName() const
{
    FileNumbers numbers;
    {
        const platform::Lock lock(_mutex);
        numbers = _numbers;
    }
    return _advanceToFreeName(numbers);
}

bool MwModel::checkRecordFileNameExist(const std::string& name) const
{
    return ecore_file_exists(getRecordingPath(name).c_str()) != EINA_FALSE;
}

// The number itself is released and the name made one that no file has. Walking down to the name before, past every
// file there is, would only end at the same: the next start probes upward again.
void MwModel::windBackRecordingFileName()
{
    const platform::Lock lock(_mutex);
    if (_numbers.last > 0 && !_nameIsChosen)
        --_numbers.last;
    FileNumbers numbers = _numbers;
    _texts.currentName = _advanceToFreeName(numbers);
}
