#include "launch/Bundle.h"

#include "app_control.h"

#include <algorithm>

namespace {

bool readTexts(sd_bus_message* message, std::vector<std::string>& texts)
{
    if (sd_bus_message_enter_container(message, SD_BUS_TYPE_ARRAY, "s") < 0)
        return false;
    const char* text = nullptr;
    int result = 0;
    while ((result = sd_bus_message_read_basic(message, SD_BUS_TYPE_STRING, &text)) > 0)
        texts.emplace_back(text);
    return result >= 0 && sd_bus_message_exit_container(message) >= 0;
}

bool appendEntry(sd_bus_message* message, const std::string& key, const std::vector<std::string>& texts)
{
    bool good = sd_bus_message_open_container(message, SD_BUS_TYPE_DICT_ENTRY, "sas") >= 0
        && sd_bus_message_append_basic(message, SD_BUS_TYPE_STRING, key.c_str()) >= 0
        && sd_bus_message_open_container(message, SD_BUS_TYPE_ARRAY, "s") >= 0;
    for (const std::string& text : texts)
        good = good && sd_bus_message_append_basic(message, SD_BUS_TYPE_STRING, text.c_str()) >= 0;
    return good && sd_bus_message_close_container(message) >= 0 && sd_bus_message_close_container(message) >= 0;
}

}

void bundle_s::set(const std::string& key, std::vector<std::string> values)
{
    const auto [place, isNew] = places.try_emplace(key, entries.size());
    if (isNew)
        entries.emplace_back(key, std::move(values));
    else
        entries[place->second].second = std::move(values);
}

const std::vector<std::string>* bundle_s::find(const std::string& key) const
{
    const auto found = places.find(key);
    return found != places.end() ? &entries[found->second].second : nullptr;
}

std::string bundle_s::text(const std::string& key) const
{
    const auto* values = find(key);
    return values != nullptr && !values->empty() ? values->front() : std::string();
}

bool bundle_s::appendTo(sd_bus_message* message) const
{
    return sd_bus_message_open_container(message, SD_BUS_TYPE_ARRAY, "{sas}") >= 0
        && std::all_of(entries.begin(), entries.end(),
            [&](const auto& entry) { return appendEntry(message, entry.first, entry.second); })
        && sd_bus_message_close_container(message) >= 0;
}

bool bundle_s::readFrom(sd_bus_message* message)
{
    entries.clear();
    places.clear();
    if (sd_bus_message_enter_container(message, SD_BUS_TYPE_ARRAY, "{sas}") < 0)
        return false;
    int result = 0;
    while ((result = sd_bus_message_enter_container(message, SD_BUS_TYPE_DICT_ENTRY, "sas")) > 0) {
        const char* key = nullptr;
        std::vector<std::string> values;
        if (sd_bus_message_read_basic(message, SD_BUS_TYPE_STRING, &key) < 0 || !readTexts(message, values)
            || sd_bus_message_exit_container(message) < 0)
            return false;
        set(key, std::move(values));
    }
    return result >= 0 && sd_bus_message_exit_container(message) >= 0;
}

bundle* bundle_create(void) { return new bundle_s; }

int bundle_add_str(bundle* self, const char* key, const char* value)
{
    if (self == nullptr || key == nullptr || *key == '\0' || value == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    self->set(key, {value});
    return APP_CONTROL_ERROR_NONE;
}

const char* bundle_get_str(const bundle* self, const char* key)
{
    const auto* values = self != nullptr && key != nullptr ? self->find(key) : nullptr;
    return values != nullptr && !values->empty() ? values->front().c_str() : nullptr;
}

int bundle_free(bundle* self)
{
    delete self;
    return APP_CONTROL_ERROR_NONE;
}
