#pragma once

#include <panekit/WApp.h>

#include <string>

// A companion with one small window in the look of the recorder. Main loop only.
class CompanionWindow : public panekit::WApp {
public:
    // Width and height: design units.
    CompanionWindow(const char* id, const char* titleId, int width, int height);

protected:
    bool onCreate() override;
    // Ends in a slash.
    [[nodiscard]] const std::string& resources() const { return _resources; }

private:
    const char* _id;
    const char* _titleId;
    int _width;
    int _height;
    std::string _resources;
};
