#pragma once

#include <string>

// Finds layouts and images by name, such as "edje/MwGenlist.edj". One instance for the process. Main loop only.
class MwResourceMgr {
public:
    static MwResourceMgr* getInstance();
    static void destroyInstance();

    MwResourceMgr() = default;
    ~MwResourceMgr();
    MwResourceMgr(const MwResourceMgr&) = delete;
    MwResourceMgr& operator=(const MwResourceMgr&) = delete;

    bool initialize();
    // Layouts and images alike.
    bool getEdjPath(const char* name, std::string& path);
};
