// An ordered map of names to texts, as it travels on the wire (a{sas}).
#pragma once

#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include <systemd/sd-bus.h>

struct bundle_s {
    std::vector<std::pair<std::string, std::vector<std::string>>> entries; // changed by set() alone
    std::unordered_map<std::string, size_t> places; // of the names among the entries

    void set(const std::string& key, std::vector<std::string> values);
    [[nodiscard]] const std::vector<std::string>* find(const std::string& key) const;
    // The first value; empty when absent.
    [[nodiscard]] std::string text(const std::string& key) const;

    // False when a text is not UTF-8 or the message is not of this shape.
    bool appendTo(sd_bus_message* message) const;
    bool readFrom(sd_bus_message* message);
};
