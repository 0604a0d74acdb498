#pragma once

#include <cstdint>
#include <optional>
#include <string>

// Writes dates for the user: in the format of the region, the chosen 12 or 24 hours and the time zone. Keeps one
// formatter and makes it anew when the other kind is asked for; settings are read when a formatter is made, so whoever
// holds an object replaces it when they change. Main loop only.
class MwICU {
public:
    enum Kind : uint8_t { DATE, DATE_AND_TIME };

    MwICU() = default;
    ~MwICU();
    MwICU(const MwICU&) = delete;
    MwICU& operator=(const MwICU&) = delete;

    // seconds: since the epoch, negative before 1970. Nothing when it cannot be written (logged).
    [[nodiscard]] std::optional<std::string> getICUstring(int64_t seconds, Kind kind);

private:
    void* _getFormat(Kind kind);
    void _clearFormat();

    void* _format = nullptr; // an i18n_udate_h
    Kind _kind = DATE;
};
